#pragma once

#include <cstddef>
#include <streambuf>
#include <string>

namespace velta_tool {

/// Reads a line without its end, but no more of it than so many bytes and one.
/// \return false at the end of the input
bool ReadLine(std::streambuf& in, std::string& line, std::size_t most);

/// Passes over what is left of a line.
void SkipLine(std::streambuf& in);

}  // namespace velta_tool
