#include "completions.h"

namespace velta_manual {

std::string Quoted(const std::string& text) {
  std::string quoted = "'";
  for (const char c : text) {
    if (c == '\'') quoted += "'\\'";
    quoted += c == '\n' ? ' ' : c;
  }
  return quoted + '\'';
}

}  // namespace velta_manual
