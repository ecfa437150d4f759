#include <gtest/gtest.h>
#include <proj.h>

#include <cmath>
#include <cstdio>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include "description.h"
#include "geodesy/proj_steps.h"
#include "geodesy/received_definition.h"
#include "geodesy/stored_definition.h"
#include "geodesy/transformation.h"
#include "rtcm3/message_sets.h"
#include "support/gff_tree.h"
#include "support/numbered_set.h"
#include "support/temporary_directory.h"
#include "velta/rtcm_data_support.h"
#include "velta/rtcm_generator.h"

namespace velta_test {
namespace {

namespace velta = orx::cs::velta;
namespace rtcm3 = orx::cs::velta::rtcm3;
using namespace velta_tool;

constexpr double kTenthOfMillimetre = 1e-4;

double Radians(double degrees, double minutes = 0, double seconds = 0) {
  return (degrees + minutes / 60 + seconds / 3600) / kDegreesPerRadian;
}

double Degrees(double degrees, double minutes, double seconds) {
  return degrees + minutes / 60 + seconds / 3600;
}

std::array<double, 2> Axes(double a, double inverseFlattening) {
  return {a, a - a / inverseFlattening};
}

/// A definition with one area, the whole globe.
Definition Everywhere(const DatumShift& shift) {
  Definition definition;
  definition.shifts = {shift};
  definition.areas = {{"area", {-kPi / 2, kPi, -kPi, 2 * kPi}, 0}};
  return definition;
}

/// A grid about the middle of the field, row by row.
ResidualGrid GridOf(int method, double (*field)(double row, double column)) {
  ResidualGrid grid{"grid", "", {0, 3, 0, 3}, true, true, method, method, {}, {}, {}};
  for (std::size_t i = 0; i < grid.north.size(); ++i) {
    const std::size_t row = i / 4;
    const std::size_t column = i % 4;
    const double value = field(static_cast<double>(row), static_cast<double>(column));
    grid.north[i] = value;
    grid.east[i] = -value;
    grid.height[i] = 2 * value;
  }
  return grid;
}

/// The field at a place, counted from the north-west point.
Residuals At(const ResidualGrid& grid, double row, double column) {
  return Interpolate(grid, 3 - row, column, true);
}

TEST(Interpolation, TakesTheFieldThatEachMethodCanFollow) {
  const auto plane = [](double row, double column) { return 5 + 2 * row - 3 * column; };
  const auto curved = [](double row, double column) { return row * row - row * column * column; };
  for (const int method : {kBilinear, kBiquadratic, kSpline}) {
    SCOPED_TRACE(method);
    const ResidualGrid flat = GridOf(method, plane);
    const ResidualGrid bent = GridOf(method, curved);
    for (int i = 0; i <= 12; ++i) {
      for (int j = 0; j <= 12; ++j) {
        const double row = i / 4.0;
        const double column = j / 4.0;
        EXPECT_NEAR(At(flat, row, column).north, plane(row, column), 1e-12);
        EXPECT_NEAR(At(flat, row, column).east, -plane(row, column), 1e-12);
        EXPECT_NEAR(At(flat, row, column).height, 2 * plane(row, column), 1e-12);
        const bool isPoint = row == std::floor(row) && column == std::floor(column);
        if (!isPoint && method != kBiquadratic) continue;
        EXPECT_NEAR(At(bent, row, column).north, curved(row, column), 1e-12);
      }
    }
  }
}

TEST(Interpolation, SplinesAreNatural) {
  const auto peak = [](double row, double) { return row == 1 ? 1.0 : 0.0; };
  const ResidualGrid grid = GridOf(kSpline, peak);
  EXPECT_NEAR(At(grid, 0.5, 2).north, 0.725, 1e-12);
  EXPECT_NEAR(At(grid, 1.5, 0.3).north, 0.575, 1e-12);
  EXPECT_NEAR(At(grid, 2.5, 1).north, -0.15, 1e-12);
}

TEST(Interpolation, LeavesOutWhatDoesNotApply) {
  ResidualGrid grid = GridOf(kBilinear, [](double row, double) { return row + 1; });
  grid.vertShift = false;
  EXPECT_EQ(At(grid, 1, 1).height, 0);
  EXPECT_EQ(At(grid, 1, 1).north, 2);
  grid.horShift = false;
  EXPECT_EQ(At(grid, 1, 1).north, 0);
}

TEST(AreaIndex, FindsTheFirstAreaThatHoldsAPosition) {
  std::mt19937 random(3);
  const auto number = [&random](double from, double to) {
    return std::uniform_real_distribution<>(from, to)(random);
  };
  for (const bool isPlane : {false, true}) {
    std::vector<TRectRgn> areas = {{0, 0, 0, 0}, {1, -1, 1, 1}, {NAN, 1, 0, 1}};
    for (int i = 0; i < 300; ++i) {
      areas.push_back({number(-1.6, 1.5), number(0, 0.2), number(-7, 7), number(0, 0.4)});
    }
    areas.push_back({-1.5, 0.3, -kPi, 2 * kPi});
    const AreaIndex index(areas, isPlane);
    for (int i = 0; i < 2000; ++i) {
      const TRectRgn& near = areas[static_cast<std::size_t>(number(3, 303))];
      // On an edge, too, and a turn away.
      const double north = near.south + near.northExtent * std::round(number(0, 3)) / 2;
      const double east = near.west + near.eastExtent * number(-0.2, 1.2) + (i % 2) * 2 * kPi;
      std::optional<std::size_t> first;
      for (std::size_t a = areas.size(); a-- > 0;) {
        if (areas[a].Inside(north, east, isPlane)) first = a;
      }
      EXPECT_EQ(index.First(north, east), first) << north << ' ' << east;
    }
  }
}

/// Files of which values are lost.
class StoredDefinition : public testing::Test {
 protected:
  static constexpr std::uint32_t kEntries = 20;

  StoredDefinition() {
    velta::RTCMDataSupport support((directory_ / "").wstring().c_str(), nullptr);
    for (std::uint32_t number = 0; number < kEntries; ++number) {
      const NumberedSet set(number);
      support.ParseDatumMessages(set.datum, &set.grid);
    }
    whole_ = ReadGff(file_);
  }

  /// Writes the file without one of the values of one of its entries.
  void WriteWithout(std::size_t entry, const char* key, std::size_t value) {
    Json changed = whole_;
    Json& values = std::next(changed.back().begin(), 1 + std::ptrdiff_t(entry)).value()[key];
    lost_ = std::next(values.begin(), std::ptrdiff_t(value % values.size())).key();
    values.erase(lost_);
    WriteGff(file_, changed);
  }

  /// Asks for a position in each of the sets.
  void ExpectWhatTheLibraryFinds() const {
    Transformation transformation(ReadDatumFile(file_.string()));
    const velta::RTCMGenerator generator(1, file_.wstring(), L"");
    for (std::uint32_t number = 0; number < kEntries; ++number) {
      SCOPED_TRACE("set " + std::to_string(number) + " without " + lost_);
      const NumberedSet set(number);
      const double latitude = set.grid.phi0 * velta::kHalfArcSecond;
      const double longitude = set.grid.lambda0 * velta::kHalfArcSecond;
      const bool hasDatum = generator.getRtcmDatumMessage(latitude, longitude, 0) != nullptr;
      const bool hasGrid = generator.get1023(latitude, longitude, 0) != nullptr;
      try {
        const Transformed there = transformation.Forward({latitude, longitude, 0});
        EXPECT_TRUE(hasDatum);
        EXPECT_EQ(there.area->entry, orx::ToUtf8(set.EntryName()));
        EXPECT_EQ(there.grid != nullptr, hasGrid);
      } catch (const NotTransformable&) {
        if (hasDatum) {
          EXPECT_FALSE(hasGrid);
        }
      }
    }
  }

 private:
  TemporaryDirectory directory_;
  const std::filesystem::path file_ = directory_ / "ROVERS.dff";
  Json whole_;
  std::string lost_ = "nothing";
};

TEST_F(StoredDefinition, FindsWhatTheLibraryFinds) {
  ExpectWhatTheLibraryFinds();
  for (std::size_t value = 0; value < 12; ++value) {
    WriteWithout(value, "StandardDatum", value);
    ExpectWhatTheLibraryFinds();
    WriteWithout(value, "TargetDatum", value);
    ExpectWhatTheLibraryFinds();
  }
}

/// A position in degrees with what it becomes in the plane.
struct PublishedPoint {
  Projection projection;
  std::array<double, 2> axes;
  double latitude;
  double longitude;
  double northing;
  double easting;
};

Projection Named(ProjectionType type, double latitude, double longitude, double scale, double fe,
                 double fn) {
  Projection projection;
  projection.entry = "projection";
  projection.type = type;
  projection.latitude = latitude;
  projection.longitude = longitude;
  projection.scale = scale;
  projection.falseEasting = fe;
  projection.falseNorthing = fn;
  return projection;
}

/// The examples of EPSG Guidance Note 7-2.
std::vector<PublishedPoint> PublishedPoints() {
  Projection borneo = Named(ProjectionType::ROM, 4, 115, 0.99984, 590476.87, 442857.65);
  borneo.azimuth = Degrees(53, 18, 56.9537);
  borneo.skew = Degrees(53, 7, 48.3685);
  return {
      {Named(ProjectionType::TM, 49, -2, 0.9996012717, 400000, -100000),
       Axes(6377563.396, 299.32496), 50.5, 0.5, 69740.50, 577274.99},
      {Named(ProjectionType::TMS, 0, 29, 1, 0, 0), Axes(6378137, 298.25722356),
       -Degrees(25, 43, 55.302), Degrees(28, 16, 57.479), 2847342.74, 71984.49},
      {Named(ProjectionType::LCC1SP, 18, -77, 1, 250000, 150000), Axes(6378206.4, 294.97870),
       Degrees(17, 55, 55.80), -Degrees(76, 56, 37.26), 142493.51, 255966.58},
      {Named(ProjectionType::MC, 0, 110, 0.997, 3900000, 900000), Axes(6377397.155, 299.15281), -3,
       120, 569150.82, 5009726.58},
      {Named(ProjectionType::OS, Degrees(52, 9, 22.178), Degrees(5, 23, 15.5), 0.9999079, 155000,
             463000),
       Axes(6377397.155, 299.15281), 53, 6, 557057.739, 196105.283},
      {Named(ProjectionType::PS, 90, 0, 0.994, 2000000, 2000000), Axes(6378137, 298.25722356), 73,
       44, 632668.43, 3320416.75},
      {borneo, Axes(6377298.556, 300.8017), Degrees(5, 23, 14.1129), Degrees(115, 48, 19.8196),
       596562.78, 679245.73},
  };
}

TEST(Projections, GiveThePublishedCoordinates) {
  constexpr double kPrinted = 0.02;  // seconds and centimetres are rounded
  for (const PublishedPoint& point : PublishedPoints()) {
    SCOPED_TRACE(point.projection.type);
    Definition definition = Everywhere({point.axes, point.axes, {}, kLinearHelmert, 0});
    definition.projection = point.projection;
    Transformation transformation(definition);
    const Transformed there =
        transformation.Forward({Radians(point.latitude), Radians(point.longitude), 0});
    EXPECT_NEAR(there.plane->north, point.northing, kPrinted);
    EXPECT_NEAR(there.plane->east, point.easting, kPrinted);
  }
}

TEST(Projections, CountNorthingsOfMercatorFromTheOrigin) {
  Definition definition =
      Everywhere({Axes(6378137, 298.25722356), Axes(6378137, 298.25722356), {}, kLinearHelmert, 0});
  definition.projection = Named(ProjectionType::MC, 35, 10, 0.99, 1000, 2000);
  Transformation transformation(definition);
  const Transformed origin = transformation.Forward({Radians(35), Radians(10), 0});
  EXPECT_NEAR(origin.plane->north, 2000, kTenthOfMillimetre);
  EXPECT_NEAR(origin.plane->east, 1000, kTenthOfMillimetre);
}

/// What a service of 48° N, 16° E broadcasts, with the constants of its national system.
Definition AustrianDefinition() {
  Definition definition = Everywhere({{6378137, 6356752.314},
                                      {6377397.155, 6356078.963},
                                      {-577.326, -90.129, -463.919, 5.137, 1.474, 5.297, -2.4232},
                                      kStrictHelmert,
                                      kPhysicalOfTarget});
  definition.projection = Named(ProjectionType::TM, 0, Degrees(16, 20, 0), 1, 0, -5000000);
  return definition;
}

TEST(Transformation, GivesTheWorkedNumbersForwardAndBack) {
  constexpr double kSameAngle = 1e-9 / 180 * 3.141592653589793;
  constexpr double kSameLength = 1e-5;
  const double kPrintedAngle = Radians(0.5e-9);
  Definition definition = AustrianDefinition();
  // Its north is read off at row 1.1360, column 1.7486.
  const double second = Radians(0, 0, 1);
  ResidualGrid grid{"cell", "", {}, true, true, kBilinear, kBilinear, {}, {}, {}};
  grid.area = {(345605 * 0.5 - 7.5) * second, 15 * second, (115203 * 0.5 - 10.5) * second,
               21 * second};
  grid.north.fill(0.010 * second);
  grid.east.fill(0.008 * second);
  grid.height.fill(0.82);
  Transformation without(definition);
  definition.grids = {grid};
  Transformation with(definition);
  const Coordinates source = {Radians(48.0012), Radians(16.0009), 300};

  const Transformed plain = without.Forward(source);
  EXPECT_NEAR(plain.target.north, Radians(48.00168923275), kPrintedAngle);
  EXPECT_NEAR(plain.target.east, Radians(16.00203807966), kPrintedAngle);
  EXPECT_NEAR(plain.target.height, 255.02824, kTenthOfMillimetre);
  const Transformed moved = with.Forward(source);
  EXPECT_NEAR(moved.target.north - plain.target.north, 0.010 * second, kPrintedAngle);
  EXPECT_NEAR(moved.target.east - plain.target.east, 0.008 * second, kPrintedAngle);
  EXPECT_NEAR(moved.target.height, 255.02824 - 0.82, kTenthOfMillimetre);
  EXPECT_EQ(moved.grid->entry, "cell");
  const Transformed back = with.Inverse(*moved.plane);
  EXPECT_NEAR(back.source.north, source.north, kSameAngle);
  EXPECT_NEAR(back.source.east, source.east, kSameAngle);
  EXPECT_NEAR(back.source.height, source.height, kSameLength);
}

TEST(Transformation, TakesHeightsByTheirIndicator) {
  Definition definition = AustrianDefinition();
  definition.projection.reset();
  definition.grids = {{"cell", "", definition.areas[0].area, false, true, 0, 0, {}, {}, {}}};
  definition.grids[0].height.fill(45.5);
  const Coordinates source = {Radians(48.0012), Radians(16.0009), 300};
  const auto heightBy = [&](std::uint32_t indicator) {
    definition.shifts[0].heightIndicator = indicator;
    return Transformation(definition).Forward(source).target.height;
  };
  EXPECT_NEAR(heightBy(kGeometricHeight), 255.02824 + 45.5, kTenthOfMillimetre);
  EXPECT_NEAR(heightBy(kPhysicalOfTarget), 255.02824 - 45.5, kTenthOfMillimetre);
  EXPECT_NEAR(heightBy(kPhysicalOfSource), 300 - 45.5, kTenthOfMillimetre);
  EXPECT_THROW(heightBy(3), NotTransformable);
}

TEST(Transformation, FindsItsWayBackFromEveryEdge) {
  std::mt19937 random(7);
  const auto share = [&random](int parts) {
    return static_cast<double>(random() % static_cast<unsigned>(parts)) / (parts - 1);
  };
  constexpr double kRoundings[] = {-1e-6, -1e-9, -1e-14, 0, 1e-14, 1e-9, 1e-6};
  for (std::uint32_t method = kLinearHelmert; method <= velta::kMolodenskiBadekas; ++method) {
    SCOPED_TRACE(method);
    Definition definition = AustrianDefinition();
    if (method % 2 == 0) definition.projection.reset();
    DatumShift shift = definition.shifts[0];
    shift.computationIndicator = method;
    DatumShift other = shift;
    other.parameters[1] += 8;
    definition.shifts = {shift, other};
    definition.areas = {{"west", {0.8, 0.01, 0.27, 0.01}, 0}, {"east", {0.8, 0.01, 0.28, 0.01}, 1}};
    ResidualGrid grid{"grid", "", {0.804, 0.001, 0.2795, 0.001}, true, true, 0, 0, {}, {}, {}};
    grid.north.fill(5e-7);
    grid.east.fill(-5e-7);
    grid.height.fill(43);
    definition.grids = {grid};
    Transformation transformation(definition);
    for (std::size_t i = 0; i < 400; ++i) {
      const TRectRgn& area = i % 2 ? grid.area : definition.areas[i % 4 / 2].area;
      const Coordinates source = {
          area.south + area.northExtent * share(3) + kRoundings[random() % 7],
          area.west + area.eastExtent * share(3) + kRoundings[random() % 7], 100};
      Transformed there;
      try {
        there = transformation.Forward(source);
      } catch (const NotTransformable&) {
        continue;  // outside
      }
      const Coordinates& target = there.plane ? *there.plane : there.target;
      const double same = there.plane ? 1e-5 : 1e-11;
      const Transformed back = transformation.Inverse(target);
      const Coordinates& reached = back.plane ? *back.plane : back.target;
      ASSERT_NEAR(reached.north, target.north, same);
      ASSERT_NEAR(reached.east, target.east, same);
      ASSERT_NEAR(reached.height, target.height, 1e-5);
    }
  }
}

/// A message set of random numbers, and the pipeline that PROJ would have of it.
class RandomSet {
 public:
  explicit RandomSet(std::mt19937& random) : random_(random) {
    latitude_ = Real(6, 75) * (Integer(0, 1) ? 1 : -1);
    longitude_ = Real(-180, 180);
    MakeDatum();
    MakeProjection();
  }

  Definition Received() {
    Definition definition;
    rtcm3::MessageSets sets([&](const rtcm3::MessageSet& set) {
      ReceivedDefinition received;
      received.Add(set);
      definition = received.definition();
      return true;
    });
    for (const rtcm3::Message& message : messages_) sets.Put(message);
    return definition;
  }

  const std::string& pipeline() const { return pipeline_; }

  Coordinates RandomPosition() {
    return {Radians(latitude_ + Real(-0.9, 0.9)), Radians(longitude_ + Real(-0.9, 0.9)),
            Real(-100, 4000)};
  }

 private:
  double Real(double from, double to) {
    return std::uniform_real_distribution<>(from, to)(random_);
  }
  std::int64_t Integer(std::int64_t from, std::int64_t to) {
    return std::uniform_int_distribution<std::int64_t>(from, to)(random_);
  }
  void Append(const char* format, auto... numbers) {
    char text[300];
    std::snprintf(text, sizeof text, format, numbers...);
    pipeline_ += text;
  }
  static std::int64_t Steps(double degrees) { return std::llround(degrees / 1.1e-8); }

  void MakeDatum() {
    const auto method = static_cast<std::uint32_t>(Integer(0, 3));
    velta::Rtcm1022 datum;
    datum.messageType = 22;
    datum.systemId = 7;
    datum.computationIndicator = method;
    datum.phiV = static_cast<std::int32_t>(std::lround(latitude_ * 1800));
    datum.lambdaV = static_cast<std::int32_t>(std::lround(longitude_ * 1800));
    datum.dPhiV = datum.dLambdaV = 3600;
    for (auto* shift : {&datum.dX, &datum.dY, &datum.dZ}) {
      *shift = static_cast<std::int32_t>(Integer(-1000000, 1000000));
    }
    for (auto* rotation : {&datum.r1, &datum.r2, &datum.r3}) {
      *rotation = static_cast<std::int32_t>(Integer(-1000000, 1000000));
    }
    datum.dS = static_cast<std::int32_t>(Integer(-2000000, 2000000));
    for (auto* point : {&datum.xp, &datum.yp, &datum.zp}) *point = Integer(-6000000000, 6000000000);
    datum.addAs = 8137000;
    datum.addBs = 6752314;
    datum.addAt = static_cast<std::uint32_t>(Integer(7000000, 9000000));
    datum.addBt = static_cast<std::uint32_t>(Integer(5800000, 7000000));
    if (method == 3) {
      messages_.emplace_back(datum);
    } else {
      velta::Rtcm1021 plain;
      static_cast<velta::RtcmBasicTransformMessage&>(plain) = datum;
      plain.messageType = 21;
      messages_.emplace_back(plain);
    }
    a_ = 6370000 + datum.addAt * 0.001;
    b_ = 6350000 + datum.addBt * 0.001;
    pipeline_ = "+proj=pipeline";
    if (method == 2) {
      Append(
          " +step +proj=molodensky +abridged +a=6378137 +b=6356752.314 +dx=%.3f +dy=%.3f"
          " +dz=%.3f +da=%.3f +df=%.17g",
          datum.dX / 1000.0, datum.dY / 1000.0, datum.dZ / 1000.0, a_ - 6378137,
          (a_ - b_) / a_ - (6378137 - 6356752.314) / 6378137);
      return;
    }
    constexpr const char* kOperations[] = {"helmert", "helmert +exact", "", "molobadekas"};
    Append(
        " +step +proj=cart +a=6378137 +b=6356752.314 +step +proj=%s +x=%.3f +y=%.3f +z=%.3f"
        " +rx=%.5f +ry=%.5f +rz=%.5f +s=%.5f +convention=coordinate_frame",
        kOperations[method], datum.dX / 1000.0, datum.dY / 1000.0, datum.dZ / 1000.0,
        datum.r1 * 2e-5, datum.r2 * 2e-5, datum.r3 * 2e-5, datum.dS * 1e-5);
    if (method == 3) {
      Append(" +px=%.3f +py=%.3f +pz=%.3f", static_cast<double>(datum.xp) / 1000.0,
             static_cast<double>(datum.yp) / 1000.0, static_cast<double>(datum.zp) / 1000.0);
    }
    Append(" +step +proj=cart +inv +a=%.3f +b=%.3f", a_, b_);
  }

  void MakeProjection() {
    // By type: the name, with what is negated, and the axes' last step.
    struct Form {
      std::uint32_t type;
      const char* name;
      int signOfEasting;
      int signOfNorthing;
      const char* axes;
    };
    constexpr Form kForms[] = {
        {1, "tmerc", 1, 1, ""},
        {2, "tmerc", -1, -1, " +step +proj=axisswap +order=-1,-2"},
        {3, "lcc", 1, 1, ""},
        {4, "lcc", 1, 1, ""},
        {5, "lcc", -1, 1, " +step +proj=axisswap +order=-1,2"},
        {6, "cass", 1, 1, ""},
        {7, "omerc", 1, 1, ""},
        {8, "sterea", 1, 1, ""},
        {9, "merc", 1, 1, ""},
        {10, "stere", 1, 1, ""},
        {11, "sterea", 1, 1, ""},
    };
    const Form& form = kForms[Integer(0, 10)];
    const double latitude = form.type == 9    ? 0
                            : form.type == 10 ? std::copysign(90, latitude_)
                                              : latitude_ + Real(-0.5, 0.5);
    const std::int64_t la = Steps(latitude);
    const std::int64_t lo = Steps(longitude_ + Real(-1, 1));
    const auto scale = static_cast<std::uint32_t>(Integer(600000000, 800000000));
    const std::int64_t fe = Integer(0, 9000000000);
    const std::int64_t fn = Integer(-9000000000, 9000000000);
    const double k = (scale * 1e-5 + 993000) * 1e-6;
    Append(" +step +proj=%s +a=%.3f +b=%.3f +x_0=%.3f +y_0=%.3f", form.name, a_, b_,
           form.signOfEasting * static_cast<double>(fe) / 1000,
           form.signOfNorthing * static_cast<double>(fn) / 1000);
    const char* const meridian = form.type == 7 ? " +lonc=%.12f" : " +lon_0=%.12f";
    Append(meridian, static_cast<double>(lo) * 1.1e-8);
    if (form.type == 10) {
      Append(" +lat_0=%.0f", latitude);
    } else {
      Append(" +lat_0=%.12f", static_cast<double>(la) * 1.1e-8);
    }
    if (form.type == 3 || form.type == 5) Append(" +lat_1=%.12f", static_cast<double>(la) * 1.1e-8);
    if (form.type != 4 && form.type != 6) Append(" +k_0=%.13f", k);
    if (form.type == 4) {
      velta::Rtcm1026 message;
      message.messageType = 26;
      message.systemId = 7;
      message.projectionType = 4;
      message.laFO = la;
      message.loFO = lo;
      message.laSP1 = Steps(latitude_ + 0.8);
      message.laSP2 = Steps(latitude_ - 0.7);
      message.efo = static_cast<std::uint64_t>(fe);
      message.nfo = fn;
      messages_.emplace_back(message);
      Append(" +lat_1=%.12f +lat_2=%.12f", static_cast<double>(message.laSP1) * 1.1e-8,
             static_cast<double>(message.laSP2) * 1.1e-8);
    } else if (form.type == 7) {
      velta::Rtcm1027 message;
      message.messageType = 27;
      message.systemId = 7;
      message.projectionType = 7;
      message.rectificationFlag = true;
      message.laPC = la;
      message.loPC = lo;
      message.azIL = static_cast<std::uint64_t>(Steps(Real(10, 80)));
      message.diffARSG = static_cast<std::int32_t>(Integer(-30000000, 30000000));
      message.addSIL = scale;
      message.epc = static_cast<std::uint64_t>(fe);
      message.npc = fn;
      messages_.emplace_back(message);
      const double azimuth = static_cast<double>(message.azIL) * 1.1e-8;
      Append(" +alpha=%.12f +gamma=%.12f", azimuth, azimuth + message.diffARSG * 1.1e-8);
    } else {
      velta::Rtcm1025 message;
      message.messageType = 25;
      message.systemId = 7;
      message.projectionType = form.type;
      message.laNO = la;
      message.loNO = lo;
      message.addSNO = scale;
      message.fe = static_cast<std::uint64_t>(fe);
      message.fn = fn;
      messages_.emplace_back(message);
    }
    pipeline_ += form.axes;
  }

  std::mt19937& random_;
  double latitude_;   // degrees, of the middle of the area
  double longitude_;  // likewise
  double a_ = 0;      // of the target's ellipsoid
  double b_ = 0;
  std::vector<rtcm3::Message> messages_;
  std::string pipeline_;
};

TEST(Transformation, AgreesWithPipelinesOfPROJ) {
  std::mt19937 random(20);
  const std::unique_ptr<PJ_CONTEXT, decltype(&proj_context_destroy)> context(proj_context_create(),
                                                                             proj_context_destroy);
  for (int i = 0; i < 10000; ++i) {
    RandomSet set(random);
    SCOPED_TRACE(set.pipeline());
    const std::unique_ptr<PJ, decltype(&proj_destroy)> pipeline(
        proj_create(context.get(), set.pipeline().c_str()), proj_destroy);
    ASSERT_TRUE(pipeline);
    const Coordinates source = set.RandomPosition();
    const PJ_COORD expected =
        proj_trans(pipeline.get(), PJ_FWD, proj_coord(source.east, source.north, source.height, 0));
    Transformation transformation(set.Received());
    const Transformed there = transformation.Forward(source);
    ASSERT_NEAR(there.plane->east, expected.xyz.x, kTenthOfMillimetre);
    ASSERT_NEAR(there.plane->north, expected.xyz.y, kTenthOfMillimetre);
    ASSERT_NEAR(there.plane->height, expected.xyz.z, kTenthOfMillimetre);
    const Transformed back = transformation.Inverse(*there.plane);
    ASSERT_NEAR(back.source.north, source.north, Radians(1e-9));
    ASSERT_NEAR(std::remainder(back.source.east - source.east, 2 * kPi), 0, Radians(1e-9));
    ASSERT_NEAR(back.source.height, source.height, 1e-5);
  }
}

}  // namespace
}  // namespace velta_test
