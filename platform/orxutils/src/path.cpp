#include "orxutils/path.h"

#ifdef _WIN32
#include <windows.h>
#else
#include <boost/locale/encoding_utf.hpp>
#include <system_error>
#endif

namespace orx {

#ifdef _WIN32

namespace {

/// The longest that a directory's name may be without its long form.
constexpr std::size_t kMaxPlainName = 247;

}  // namespace

std::optional<std::filesystem::path> ToPath(const COrxStringT<wchar_t>& name) {
  return ToSystemPath(name);
}

std::filesystem::path ToSystemPath(const std::filesystem::path& path) {
  const COrxStringT<wchar_t> name = ToWholeName(path.wstring());
  if (name.size() <= kMaxPlainName || name.starts_with(L"\\\\?\\")) return path;
  return name.starts_with(L"\\\\") ? L"\\\\?\\UNC" + name.substr(1) : L"\\\\?\\" + name;
}

COrxStringT<wchar_t> ToWholeName(const COrxStringT<wchar_t>& name) {
  // The standard library's own does not know the names of network shares.
  const DWORD size = GetFullPathNameW(name.c_str(), 0, nullptr, nullptr);
  COrxStringT<wchar_t> whole(size, L'\0');
  const DWORD length = GetFullPathNameW(name.c_str(), size, whole.data(), nullptr);
  if (length == 0 || length >= size) return name;
  whole.resize(length);
  return whole;
}

COrxStringT<wchar_t> ToName(const std::filesystem::path& path) { return path.wstring(); }

#else

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

COrxStringT<wchar_t> ToWholeName(const COrxStringT<wchar_t>& name) {
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

#endif

}  // namespace orx
