#pragma once

#include <string>

#include "geodesy/definition.h"

namespace velta_tool {

/// Reads a datum file.
/// \throws std::runtime_error when it cannot be read at all, and when it has no entry
Definition ReadDatumFile(const std::string& file);

/// Adds what a projection file holds: the projection of its first entry, and the plane grids.
/// \throws std::runtime_error as above, and when the file is of another ellipsoid than the datum
void AddProjectionFile(const std::string& file, Definition& definition);

}  // namespace velta_tool
