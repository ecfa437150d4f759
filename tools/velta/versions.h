#pragma once

#include <string>

namespace velta_tool {

/// The versions of the program and of what it consists of, as lines: what a report of a fault is to
/// name.
std::string Versions();

/// PROJ and the libraries that write grids for it, with their versions, or that this build is
/// without.
std::string ProjVersions();

/// A version with points between its numbers.
std::string Numbers(int major, int minor, int patch);

}  // namespace velta_tool
