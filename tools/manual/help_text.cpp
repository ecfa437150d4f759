#include "help_text.h"

#include <algorithm>
#include <sstream>
#include <stdexcept>

namespace velta_manual {
namespace {

constexpr std::size_t kIndent = 2;

Block::Kind KindOf(const std::string& firstLine) {
  if (firstLine.starts_with("Exit status:")) return Block::Kind::kExitStatus;
  if (firstLine.starts_with("The examples")) return Block::Kind::kAboutExamples;
  return firstLine.starts_with("Example") ? Block::Kind::kExample : Block::Kind::kText;
}

/// Takes what stands behind the colon of a heading, if it has one; there may be nothing.
std::string Heading(const std::string& line) {
  const std::size_t colon = line.find(':');
  return line.substr(std::min(line.find_first_not_of(": ", colon), line.size()));
}

Block::Line ItemOf(const std::string& line) {
  const std::size_t colon = line.find(": ");
  const std::size_t gap = line.find("  ");
  const std::size_t end = std::min(gap, colon == line.npos ? line.npos : colon + 1);
  if (end == 0 || end == line.npos) throw std::runtime_error("a help text has no term in: " + line);
  return {true, line.substr(0, end), line.substr(line.find_first_not_of(' ', end))};
}

void AddIndented(const std::string& line, Block& block) {
  const bool isContinued = line.starts_with(' ') && !block.lines.empty();
  if (isContinued && block.lines.back().isIndented) {
    block.lines.back().text += '\n' + line.substr(line.find_first_not_of(' '));
    return;
  }
  block.lines.push_back(block.kind == Block::Kind::kExample ? Block::Line{true, "", line}
                                                            : ItemOf(line));
}

}  // namespace

std::vector<Block> BlocksOf(const std::string& footer) {
  std::vector<Block> blocks;
  bool isFirst = true;
  std::istringstream in(footer);
  for (std::string line; std::getline(in, line);) {
    if (line.empty()) {
      isFirst = true;
      continue;
    }
    if (isFirst) blocks.push_back({KindOf(line), {}});
    Block& block = blocks.back();
    const bool hasHeading =
        block.kind == Block::Kind::kExitStatus || block.kind == Block::Kind::kExample;
    if (line.starts_with("  ")) {
      AddIndented(line.substr(kIndent), block);
    } else if (!isFirst || !hasHeading) {
      block.lines.push_back({false, "", line});
    } else if (!Heading(line).empty()) {
      block.lines.push_back({false, "", Heading(line)});
    }
    isFirst = false;
  }
  return blocks;
}

}  // namespace velta_manual
