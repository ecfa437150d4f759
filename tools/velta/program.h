#pragma once

#include <CLI/App.hpp>
#include <memory>

#include "command.h"

namespace velta_tool {

/// The commands of the program with their options and what is said of them.
/// \param action becomes the work of the command that a command line names; outlives the result
std::unique_ptr<CLI::App> MakeProgram(Action& action);

}  // namespace velta_tool
