#pragma once

#include <array>

#include "geodesy/definition.h"

namespace velta_tool {

/// A datum shift in its reverse, as a system that is bound to another has it: by parameters from
/// the local system to that of the satellites.
struct ReverseShift {
  DatumShift shift;  ///< its source is the local system
  /// How far it leads from where the shift does, at most, on the ground in the middle and the
  /// corners of the area: metres.
  double offForth;  ///< by its inverse, to the local system
  double offBack;   ///< by itself
};

/// Reverses a datum shift so that a position in the middle of the area comes to the same place by
/// PROJ's inverse of the reverse. Opposite signs alone are centimetres off.
/// \param axes of the ellipsoid that latitudes and longitudes of the satellites' system are then
///     taken for, metres; may differ from the shift's as much as its rounding
/// \throws NotTransformable for a shift that cannot be applied
ReverseShift ReverseOf(const DatumShift& shift, const std::array<double, 2>& axes,
                       const TRectRgn& area);

}  // namespace velta_tool
