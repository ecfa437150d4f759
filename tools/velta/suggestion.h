#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace velta_tool {

/// The word that was probably meant: the one that takes the fewest changes of a character, in
/// whatever case. Empty when none is near.
std::string NearestWord(std::string_view typed, const std::vector<std::string>& words);

}  // namespace velta_tool
