#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace velta_tool {

/// Wide text as UTF-8. What is no code point is left out.
std::string ToUtf8(std::wstring_view text);

/// UTF-8 as wide text; nothing when it is not valid UTF-8.
std::optional<std::wstring> FromUtf8(std::string_view text);

}  // namespace velta_tool
