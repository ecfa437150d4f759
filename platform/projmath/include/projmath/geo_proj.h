#pragma once

#include <array>
#include <initializer_list>

#include "projmath/export.h"

/// Ellipsoids, rectangles and projections with their parameters.
namespace orx::cs::projmath {

/// Unit selector of projection parameters: angles in degrees, lengths in metres, plain ratios.
inline constexpr int kDegreesMetresRatios = 3;

/// A map projection's ellipsoid and parameters. Holds them, computes nothing.
class PROJMATH_EXPORT TGeoProj {
 public:
  /// The most parameters that a projection can hold.
  static constexpr int kMaxParameters = 16;

  TGeoProj() = default;
  virtual ~TGeoProj();

  /// Sets a parameter; does nothing outside the projection's range of parameters.
  /// \param value in the unit that the selector says
  /// \param index of the parameter, from 0
  /// \param unitSelector kDegreesMetresRatios, the only one there is
  virtual void SetParam(double value, int index, int unitSelector);
  /// \return the parameter, 0 outside the projection's range of parameters
  virtual double GetParam(int index, int unitSelector) const;

  /// Takes over another projection's ellipsoid and parameters.
  void CopyGeoProj(const TGeoProj& other);

  int parameterCount = 0;        ///< number of parameters
  double semiMajorAxis = 0.0;    ///< metres
  double ellipsoidSecond = 0.0;  ///< the ellipsoid's second defining value

 protected:
  /// The parameters by index, behind the ellipsoid's two numbers.
  TGeoProj(double a, double second, std::initializer_list<double> parameters);

 private:
  std::array<double, kMaxParameters> parameters_ = {};
};

// Parameters by index: longitude of origin, scale factor, latitude of origin, false easting,
// false northing. The constructors take the ellipsoid's two numbers first.

/// Transverse Mercator.
class PROJMATH_EXPORT TUTMProj : public TGeoProj {
 public:
  /// Angles in degrees, lengths in metres.
  TUTMProj(double a, double second, double longitude, double scale, double latitude,
           double falseEasting, double falseNorthing);
};

/// Stereographic.
class PROJMATH_EXPORT TSterProj : public TGeoProj {
 public:
  /// Angles in degrees, lengths in metres.
  TSterProj(double a, double second, double longitude, double latitude, double scale,
            double falseEasting, double falseNorthing);
};

// Parameters by index: longitude of origin, latitude of origin, false easting, false northing.

/// Mercator.
class PROJMATH_EXPORT TMercatorProj : public TGeoProj {
 public:
  /// Angles in degrees, lengths in metres.
  TMercatorProj(double a, double second, double longitude, double latitude, double falseEasting,
                double falseNorthing);
};

/// Cassini-Soldner. The last constructor argument is kept for callers and has no parameter.
class PROJMATH_EXPORT TCassiniProj : public TGeoProj {
 public:
  /// Angles in degrees, lengths in metres.
  TCassiniProj(double a, double second, double longitude, double latitude, double falseEasting,
               double falseNorthing, double unused);
};

// Parameters by index: azimuth of the initial line, scale factor on it, longitude and latitude of
// the projection centre, easting and northing there, and, rectified, the angle from the rectified
// to the skew grid.

/// Oblique Mercator. The last constructor argument is kept for callers and has no parameter.
class PROJMATH_EXPORT TOMercatorProj : public TGeoProj {
 public:
  /// Angles in degrees, lengths in metres.
  TOMercatorProj(double a, double second, double azimuth, double scale, double longitude,
                 double latitude, double easting, double northing, double unused);
};

/// Rectified oblique Mercator.
class PROJMATH_EXPORT TROMercatorProj : public TGeoProj {
 public:
  /// Angles in degrees, lengths in metres.
  TROMercatorProj(double a, double second, double azimuth, double scale, double longitude,
                  double latitude, double easting, double northing, double rectifiedToSkew);
};

}  // namespace orx::cs::projmath
