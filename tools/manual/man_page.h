#pragma once

#include <CLI/App.hpp>
#include <string>

namespace velta_manual {

/// The name of the manual page of a command, or of the program that has the commands.
std::string PageName(const CLI::App& command);

/// That page as roff source, for section 1.
/// \param date of the page
/// \throws std::runtime_error when a help text has a line that fits nowhere
std::string ManPage(const CLI::App& command, const std::string& date);

}  // namespace velta_manual
