#pragma once

#include <string>
#include <vector>

namespace velta_manual {

/// A stretch of a help text, which blank lines separate: lines to be filled, and what is indented
/// by two blanks. That is a command in an example, elsewhere an item: a term, two blanks or a
/// colon, and what is said of it, perhaps on more lines that are indented further.
struct Block {
  enum class Kind { kText, kExitStatus, kExample, kAboutExamples };

  struct Line {
    bool isIndented;
    std::string term;  ///< of an item
    std::string text;
  };

  Kind kind;
  std::vector<Line> lines;
};

/// Takes apart what stands behind the options.
/// \throws std::runtime_error when an indented line is no item
std::vector<Block> BlocksOf(const std::string& footer);

}  // namespace velta_manual
