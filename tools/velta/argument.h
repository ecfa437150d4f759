#pragma once

#include <CLI/App.hpp>
#include <string>
#include <vector>

namespace velta_tool {

/// An option of a command or what is given by its place, as help, manual and completion tell it.
struct Argument {
  enum class Kind { kFlag, kFile, kDirectory, kChoice, kOther };

  std::vector<std::string> names;       ///< "-o", "--output"; of what has a place its name alone
  bool isOption;                        ///< false: it is given by its place
  Kind kind;                            ///< of its value
  std::string value;                    ///< what stands for it, "DIR"; of a flag empty
  std::vector<std::string> extensions;  ///< of a file that must have one: ".dff"
  std::vector<std::string> choices;
  bool isRequired;
  bool isRepeated;
  std::string text;
  std::vector<std::string> remarks;  ///< such as "needs --lat"
};

Argument Describe(const CLI::Option& option);

/// The arguments of a command in the order in which it has them.
std::vector<Argument> ArgumentsOf(const CLI::App& command);

/// Strings with a separator between them.
std::string Joined(const std::vector<std::string>& strings, const std::string& separator);

}  // namespace velta_tool
