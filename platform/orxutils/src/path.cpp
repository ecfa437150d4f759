#include "orxutils/path.h"

#ifndef _WIN32
#include <boost/locale/encoding_utf.hpp>
#endif

namespace orx {

#ifdef _WIN32

std::optional<std::filesystem::path> ToPath(const COrxStringT<wchar_t>& name) { return name; }

COrxStringT<wchar_t> ToName(const std::filesystem::path& path) { return path.wstring(); }

#else

// The standard library's own conversion goes by the locale and refuses what is not ASCII.
namespace conv = boost::locale::conv;

std::optional<std::filesystem::path> ToPath(const COrxStringT<wchar_t>& name) {
  try {
    return conv::utf_to_utf<char>(name, conv::stop);
  } catch (const conv::conversion_error&) {
    return std::nullopt;
  }
}

COrxStringT<wchar_t> ToName(const std::filesystem::path& path) {
  return conv::utf_to_utf<wchar_t>(path.native(), conv::skip);
}

#endif

}  // namespace orx
