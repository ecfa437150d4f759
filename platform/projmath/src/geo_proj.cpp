#include "projmath/geo_proj.h"

#include <algorithm>

namespace orx::cs::projmath {

TGeoProj::TGeoProj(double a, double second, std::initializer_list<double> parameters)
    : parameterCount(static_cast<int>(parameters.size())),
      semiMajorAxis(a),
      ellipsoidSecond(second) {
  std::copy(parameters.begin(), parameters.end(), parameters_.begin());
}

TGeoProj::~TGeoProj() = default;

void TGeoProj::SetParam(double value, int index, int /*unitSelector*/) {
  if (index < 0 || index >= parameterCount) return;
  parameters_[static_cast<std::size_t>(index)] = value;
}

double TGeoProj::GetParam(int index, int /*unitSelector*/) const {
  if (index < 0 || index >= parameterCount) return 0.0;
  return parameters_[static_cast<std::size_t>(index)];
}

void TGeoProj::CopyGeoProj(const TGeoProj& other) {
  parameterCount = other.parameterCount;
  semiMajorAxis = other.semiMajorAxis;
  ellipsoidSecond = other.ellipsoidSecond;
  parameters_ = other.parameters_;
}

TUTMProj::TUTMProj(double a, double second, double longitude, double scale, double latitude,
                   double falseEasting, double falseNorthing)
    : TGeoProj(a, second, {longitude, scale, latitude, falseEasting, falseNorthing}) {}

TSterProj::TSterProj(double a, double second, double longitude, double latitude, double scale,
                     double falseEasting, double falseNorthing)
    : TGeoProj(a, second, {longitude, scale, latitude, falseEasting, falseNorthing}) {}

TMercatorProj::TMercatorProj(double a, double second, double longitude, double latitude,
                             double falseEasting, double falseNorthing)
    : TGeoProj(a, second, {longitude, latitude, falseEasting, falseNorthing}) {}

TCassiniProj::TCassiniProj(double a, double second, double longitude, double latitude,
                           double falseEasting, double falseNorthing, double /*unused*/)
    : TGeoProj(a, second, {longitude, latitude, falseEasting, falseNorthing}) {}

TOMercatorProj::TOMercatorProj(double a, double second, double azimuth, double scale,
                               double longitude, double latitude, double easting, double northing,
                               double /*unused*/)
    : TGeoProj(a, second, {azimuth, scale, longitude, latitude, easting, northing}) {}

TROMercatorProj::TROMercatorProj(double a, double second, double azimuth, double scale,
                                 double longitude, double latitude, double easting, double northing,
                                 double rectifiedToSkew)
    : TGeoProj(a, second,
               {azimuth, scale, longitude, latitude, easting, northing, rectifiedToSkew}) {}

}  // namespace orx::cs::projmath
