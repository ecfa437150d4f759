#pragma once

#include "geodesy/definition.h"

namespace velta_tool {

/// What is added to a position: radians, in the plane metres, and metres.
struct Residuals {
  double north = 0;
  double east = 0;
  double height = 0;
};

/// Interpolates a grid, each part by its method: bilinear in the cell of the position, biquadratic
/// through the nearest 3 by 3 points, or by a natural bicubic spline through all. A part that does
/// not apply is 0.
/// \param north, east position in the grid's area: latitude and longitude, radians, or northing and
///     easting, metres
/// \param isPlane otherwise longitudes are taken modulo a whole turn
Residuals Interpolate(const ResidualGrid& grid, double north, double east, bool isPlane);

}  // namespace velta_tool
