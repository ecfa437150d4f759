#include "lines.h"

namespace velta_tool {

using Traits = std::streambuf::traits_type;

bool ReadLine(std::streambuf& in, std::string& line, std::size_t most) {
  line.clear();
  while (line.size() <= most) {
    const Traits::int_type next = in.sbumpc();
    if (Traits::eq_int_type(next, Traits::eof())) return !line.empty();
    const char c = Traits::to_char_type(next);
    if (c == '\n') return true;
    line += c;
  }
  return true;
}

void SkipLine(std::streambuf& in) {
  const auto isEnd = [](Traits::int_type next) {
    return Traits::eq_int_type(next, Traits::eof()) || Traits::to_char_type(next) == '\n';
  };
  while (!isEnd(in.sbumpc())) {
  }
}

}  // namespace velta_tool
