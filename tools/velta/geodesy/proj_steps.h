#pragma once

#include <array>
#include <stdexcept>
#include <string>

#include "geodesy/definition.h"

/// The steps of a transformation in the words of PROJ. Angles are in radians between steps,
/// longitude in front of latitude.
namespace velta_tool {

/// What cannot be transformed, with the reason.
struct NotTransformable : std::runtime_error {
  using std::runtime_error::runtime_error;
};

/// A double as PROJ reads it, without the rounding of its own computation behind the 15th digit.
std::string ProjNumber(double number);

/// \param axes semi-major and semi-minor axis of an ellipsoid
double Flattening(const std::array<double, 2>& axes);

/// From the source system to the target system.
/// \throws NotTransformable for indicators that are reserved
std::string DatumSteps(const DatumShift& shift);

/// From the target system to the plane: easting and northing, or westing and southing where the
/// projection is orientated so.
/// \param axes of the target's ellipsoid, metres
/// \throws NotTransformable for a projection that cannot be used
std::string ProjectionSteps(const Projection& projection, const std::array<double, 2>& axes);

/// True when an origin is the pole, but for the step of the messages.
bool IsPolar(const Projection& projection);

/// The northing of a parallel in Mercator's projection, without false northing: EPSG Guidance Note
/// 7-2, method 9804.
/// \param latitude degrees
/// \param axes of the ellipsoid, metres
/// \return metres
double MercatorNorthing(double latitude, double scale, const std::array<double, 2>& axes);

}  // namespace velta_tool
