#pragma once

#include <CLI/App.hpp>
#include <string>

/// What shells complete a call of the program by: commands, options, their values.
namespace velta_manual {

std::string BashCompletion(const CLI::App& program);
std::string ZshCompletion(const CLI::App& program);
std::string FishCompletion(const CLI::App& program);

/// Text as one word of a shell's script, on one line.
std::string Quoted(const std::string& text);

}  // namespace velta_manual
