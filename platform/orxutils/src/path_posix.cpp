#include <boost/locale/encoding_utf.hpp>
#include <system_error>

#include "orxutils/path.h"

namespace orx {

std::filesystem::path ToSystemPath(const std::filesystem::path& path) { return path; }

// The standard library's own conversion goes by the locale and refuses what is not ASCII.
namespace conv = boost::locale::conv;

std::optional<std::filesystem::path> ToPath(const COrxStringT<wchar_t>& name) {
  try {
    return conv::utf_to_utf<char>(name, conv::stop);
  } catch (const conv::conversion_error&) {
    return std::nullopt;
  }
}

COrxStringT<wchar_t> AbsoluteName(const COrxStringT<wchar_t>& name) {
  const std::optional<std::filesystem::path> path = ToPath(name);
  if (!path) return name;
  std::error_code error;
  std::filesystem::path whole = std::filesystem::absolute(*path, error);
  // Behind a symbolic link ".." leads elsewhere than the text says.
  const bool goesUp = name.find(L"..") != name.npos;
  if (!error && goesUp) whole = std::filesystem::weakly_canonical(whole, error);
  return error ? name : ToName(whole.lexically_normal());
}

COrxStringT<wchar_t> ToName(const std::filesystem::path& path) {
  return conv::utf_to_utf<wchar_t>(path.native(), conv::skip);
}

bool NameOrder::operator()(std::wstring_view a, std::wstring_view b) const { return a < b; }

}  // namespace orx
