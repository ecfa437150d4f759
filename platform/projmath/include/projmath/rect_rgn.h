#pragma once

#include "projmath/export.h"

namespace orx::cs::projmath {

/// A region between two parallels and two meridians, or a rectangle in the plane.
struct TRectRgn {
  double south;        ///< south edge: radians or metres
  double northExtent;  ///< extent to the north
  double west;         ///< west edge
  double eastExtent;   ///< extent to the east

  /// Tells whether a position is in the region; the edges belong to it, a NaN never does.
  /// \param first latitude (radians) or northing
  /// \param second longitude (radians) or easting
  /// \param plane true: a plain rectangle. false: longitudes are compared modulo 2 pi; a latitude
  ///     extent of pi or more holds every latitude, a longitude extent of 2 pi or more every
  ///     longitude
  PROJMATH_EXPORT bool Inside(double first, double second, bool plane) const;
};

}  // namespace orx::cs::projmath
