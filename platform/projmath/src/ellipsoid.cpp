#include "projmath/ellipsoid.h"

namespace orx::cs::projmath {

Ellipsoid Ellipsoid::Wgs84() { return FromInverseFlattening(6378137.0, 298.257223563); }

Ellipsoid Ellipsoid::FromAxes(double a, double b) {
  Ellipsoid ellipsoid;
  ellipsoid.a = a;
  ellipsoid.second = b;
  ellipsoid.kind = kSemiMinorAxis;
  ellipsoid.SetEllipsoid(true);
  return ellipsoid;
}

Ellipsoid Ellipsoid::FromInverseFlattening(double a, double inverseFlattening) {
  Ellipsoid ellipsoid;
  ellipsoid.a = a;
  ellipsoid.second = inverseFlattening;
  ellipsoid.kind = kInverseFlattening;
  ellipsoid.SetEllipsoid(false);
  return ellipsoid;
}

void Ellipsoid::SetEllipsoid(bool byAxes) {
  semiMinorAxis = byAxes ? second : a - a / second;
  flattening = (a - semiMinorAxis) / a;
  eccentricitySquared = flattening * (2.0 - flattening);
}

}  // namespace orx::cs::projmath
