#pragma once

#include <string>

namespace velta_tool {

/// The versions of the program and of what it consists of, as lines: what a report of a fault is to
/// name.
std::string Versions();

/// "PROJ" with its version, or that this build is without.
std::string ProjVersion();

}  // namespace velta_tool
