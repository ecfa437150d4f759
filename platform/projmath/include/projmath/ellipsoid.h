#pragma once

#include <cstdint>

#include "projmath/export.h"

namespace orx::cs::projmath {

/// An ellipsoid of revolution, defined by its semi-major axis and a second value.
struct Ellipsoid {
  /// What `second` means.
  enum Kind : std::uint8_t { kInverseFlattening = 0, kSemiMinorAxis = 2 };

  double a = 0.0;                          ///< semi-major axis, metres
  double second = 0.0;                     ///< second defining value, see `kind`
  std::uint8_t kind = kInverseFlattening;  ///< a Kind

  double semiMinorAxis = 0.0;        ///< b, metres; derived
  double flattening = 0.0;           ///< f = (a - b) / a; derived
  double eccentricitySquared = 0.0;  ///< e^2 = f (2 - f); derived

  /// WGS 84, by its inverse flattening. Source: NGA.STND.0036, table 3.1.
  PROJMATH_EXPORT static Ellipsoid Wgs84();
  /// An ellipsoid given by its two axes in metres, completed.
  PROJMATH_EXPORT static Ellipsoid FromAxes(double a, double b);
  /// An ellipsoid given by its semi-major axis in metres and its inverse flattening, completed.
  PROJMATH_EXPORT static Ellipsoid FromInverseFlattening(double a, double inverseFlattening);

  /// Completes the derived values from the defining ones, which stay as they are.
  /// \param byAxes true: `second` is the semi-minor axis; false: the inverse flattening
  PROJMATH_EXPORT void SetEllipsoid(bool byAxes);
};

}  // namespace orx::cs::projmath
