#include "text.h"

#include <boost/locale/encoding_utf.hpp>

namespace velta_tool {

namespace conv = boost::locale::conv;

std::string ToUtf8(std::wstring_view text) {
  return conv::utf_to_utf<char>(text.data(), text.data() + text.size(), conv::skip);
}

std::optional<std::wstring> FromUtf8(std::string_view text) {
  try {
    return conv::utf_to_utf<wchar_t>(text.data(), text.data() + text.size(), conv::stop);
  } catch (const conv::conversion_error&) {
    return std::nullopt;
  }
}

}  // namespace velta_tool
