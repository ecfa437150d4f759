#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <numbers>

#include "projmath/ellipsoid.h"
#include "projmath/geo_proj.h"
#include "projmath/rect_rgn.h"

namespace orx::cs::projmath {
namespace {

constexpr double kPi = std::numbers::pi;
constexpr double kDegree = kPi / 180.0;

TEST(Ellipsoid, IsCompletedFromEitherDefinitionWhichStaysAsItIs) {
  const Ellipsoid axes = Ellipsoid::FromAxes(6377397.155, 6356078.963);
  EXPECT_EQ(axes.second, 6356078.963);
  EXPECT_NEAR(1.0 / axes.flattening, 299.1528, 1e-4);
  const Ellipsoid flattening = Ellipsoid::FromInverseFlattening(6378137.0, 298.257223563);
  EXPECT_EQ(flattening.second, 298.257223563);
  EXPECT_NEAR(flattening.semiMinorAxis, 6356752.314245, 1e-6);
  EXPECT_NEAR(flattening.eccentricitySquared, 0.00669437999014, 1e-14);
}

TEST(TGeoProj, HoldsItsParametersAndNoOthers) {
  TMercatorProj mercator(1.0, 2.0, 0, 0, 0, 0);
  for (int i = -1; i < 20; ++i) mercator.SetParam(i + 10.0, i, kDegreesMetresRatios);
  EXPECT_EQ(mercator.GetParam(3, kDegreesMetresRatios), 13.0);
  EXPECT_EQ(mercator.GetParam(4, kDegreesMetresRatios), 0.0);
  EXPECT_EQ(mercator.GetParam(-1, kDegreesMetresRatios), 0.0);
  TGeoProj copy;
  copy.CopyGeoProj(mercator);
  EXPECT_EQ(copy.parameterCount, 4);
  EXPECT_EQ(copy.ellipsoidSecond, 2.0);
  EXPECT_EQ(copy.GetParam(3, kDegreesMetresRatios), 13.0);
  EXPECT_EQ(TSterProj(1, 2, 0, 0, 0.9, 0, 0).GetParam(1, kDegreesMetresRatios), 0.9);
}

TEST(TRectRgn, HoldsItsEdgesAndEveryNumberOfAMeridian) {
  const struct {
    const char* what;
    TRectRgn region;  // degrees
    double latitude, longitude;
    bool inside;
  } cases[] = {
      {"north-east corner", {50, 2, 8, 3}, 52, 11, true},
      {"south-west corner", {50, 2, 8, 3}, 50, 8, true},
      {"north of it", {50, 2, 8, 3}, 52.0001, 9, false},
      {"west of it", {50, 2, 8, 3}, 51, 7.9999, false},
      {"east of it", {50, 2, 8, 3}, 51, 11.0001, false},
      {"a turn on", {50, 2, 8, 3}, 51, 369, true},
      {"two turns back", {50, 2, 8, 3}, 51, -711, true},
      {"359 is -1", {50, 2, -2, 3}, 51, 359, true},
      {"-1 is 359", {50, 2, 358, 3}, 51, -1, true},
      {"west edge by another number", {50, 2, -1, 3}, 51, 359, true},
      {"east edge by another number", {50, 2, -4, 3}, 51, 359, true},
      {"across the 180th meridian, west side", {50, 2, 179, 3}, 51, -179, true},
      {"across the 180th meridian, beyond", {50, 2, 179, 3}, 51, -177.9, false},
      {"the pole belongs to its edge", {80, 10, 0, 10}, 90, 5, true},
      {"every latitude", {10, 180, 0, 10}, -90, 5, true},
      {"every longitude", {10, 5, 100, 360}, 12, 99, true},
      {"not quite every longitude", {10, 5, 100, 359}, 12, 99.5, false},
      {"no extent", {10, 0, 20, 0}, 10, 20, true},
  };
  for (const auto& test : cases) {
    const TRectRgn region{test.region.south * kDegree, test.region.northExtent * kDegree,
                          test.region.west * kDegree, test.region.eastExtent * kDegree};
    EXPECT_EQ(region.Inside(test.latitude * kDegree, test.longitude * kDegree, false), test.inside)
        << test.what;
  }
}

TEST(TRectRgn, IsAPlainRectangleInThePlaneAndNeverHoldsNaN) {
  const TRectRgn region{5e6, 3000, 3.4e6, 2000};
  EXPECT_TRUE(region.Inside(5003000, 3402000, true));
  EXPECT_FALSE(region.Inside(5003000.01, 3402000, true));
  EXPECT_FALSE(region.Inside(5001000, 3399999.99, true));
  const double nan = std::numeric_limits<double>::quiet_NaN();
  const TRectRgn globe{0, kPi, 0, 2 * kPi};
  for (const bool plane : {false, true}) {
    EXPECT_FALSE(globe.Inside(nan, 1, plane));
    EXPECT_FALSE(globe.Inside(1, nan, plane));
    EXPECT_FALSE((TRectRgn{nan, nan, nan, nan}.Inside(1, 1, plane)));
  }
}

}  // namespace
}  // namespace orx::cs::projmath
