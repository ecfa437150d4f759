#include <algorithm>
#include <cmath>
#include <cstdint>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

#include "description.h"
#include "geodesy/exports.h"
#include "geodesy/geotiff_file.h"
#include "geodesy/joined_grids.h"
#include "geodesy/offsets_in_front.h"
#include "positions.h"
#include "terminal.h"
#include "velta/message_units.h"

namespace velta_tool {
namespace {

namespace velta = orx::cs::velta;

/// So many are named of what may be many; of the others the number is said.
constexpr std::size_t kMostNamed = 10;
constexpr double kMillimetres = 1000;  // in a metre

std::string Fixed(double number, int decimals) {
  std::string text;
  AppendFixed(number, decimals, text);
  return text;
}

std::string Names(const std::vector<ResidualGrid>& grids, const std::vector<std::uint32_t>& which) {
  std::string names;
  for (std::size_t i = 0; i < std::min(which.size(), kMostNamed); ++i) {
    names += (i > 0 ? ", " : "") + Printable(grids[which[i]].entry);
  }
  if (which.size() <= kMostNamed) return names;
  return names + " and " + std::to_string(which.size() - kMostNamed) + " more";
}

void TellWhatDiffers(const std::vector<ResidualGrid>& grids, const TellLeftOut& tell) {
  std::vector<std::uint32_t> curved;
  std::size_t problems = 0;
  for (std::size_t i = 0; i < grids.size(); ++i) {
    const ResidualGrid& grid = grids[i];
    if (!grid.problem.empty()) {
      if (++problems <= kMostNamed) {
        tell("the grid of " + Printable(grid.entry) + ": " + grid.problem);
      }
    } else if ((grid.horShift && grid.horInterpolation != kBilinear) ||
               (grid.vertShift && grid.vertInterpolation != kBilinear)) {
      curved.push_back(static_cast<std::uint32_t>(i));
    }
  }
  if (problems > kMostNamed) {
    tell(std::to_string(problems - kMostNamed) + " more grids that cannot be used");
  }
  if (!curved.empty()) {
    tell("the interpolation by parabolas or splines, where PROJ's is bilinear: " +
         Names(grids, curved));
  }
  const std::vector<std::uint32_t> across = GridsAcrossOthers(grids);
  if (!across.empty()) {
    tell("which grid comes first where some of different steps overlap: " + Names(grids, across));
  }
}

/// One of the two files.
struct Kind {
  GridPart part;
  const char* name;
  const char* unit;
  double unitsPerValue;
  int decimals;  ///< of a difference, in the unit
  double millimetresPerUnit;
  const char* metadata;  ///< as GDAL keeps it, behind the name of the grid
};

void TellDifferences(const std::vector<ResidualGrid>& grids, const Kind& kind,
                     const JoinedGrids& joined, const TellLeftOut& tell) {
  const std::vector<Difference>& differences = joined.differences;
  const auto amount = [&](double value) {
    return Fixed(value * kind.unitsPerValue, kind.decimals) + kind.unit;
  };
  for (std::size_t i = 0; i < std::min(differences.size(), kMostNamed); ++i) {
    const auto& [used, other, difference] = differences[i];
    const ResidualGrid& grid = grids[used.grid];
    const std::uint32_t row = used.point / kGridPoints;
    const std::uint32_t column = used.point % kGridPoints;
    const double north = grid.area.south + grid.area.northExtent - row * grid.NorthStep();
    const double east = grid.area.west + column * grid.EastStep();
    constexpr int kDecimals = 6;
    tell("the " + std::string(kind.name) + " residual of " + Printable(grids[other.grid].entry) +
         " at " + Fixed(north * kDegreesPerRadian, kDecimals) + " " +
         Fixed(east * kDegreesPerRadian, kDecimals) + ", " + amount(difference) + " from that of " +
         Printable(grid.entry));
  }
  if (differences.size() > kMostNamed) {
    tell(std::to_string(differences.size() - kMostNamed) + " more " + kind.name +
         " residuals that differ from those of an earlier grid");
  }
  if (joined.roundings > 0) {
    const double most = joined.largestRounding * kind.unitsPerValue * kind.millimetresPerUnit;
    tell("the rounding of " + std::to_string(joined.roundings) + " " + kind.name +
         " residuals that differ from those of an earlier grid by up to " +
         amount(joined.largestRounding) + ": as much as " + Fixed(most, 1) +
         " mm between \"velta transform\" and PROJ");
  }
}

std::string Metadata(const Kind& kind, std::size_t number) {
  // PROJ takes the first grid that holds a position if all have names, else the smallest.
  return "<GDALMetadata>\n  <Item name=\"grid_name\">" + std::to_string(number) + "</Item>\n" +
         kind.metadata + "</GDALMetadata>\n";
}

GeoTiffImage ImageOf(const JoinedGrid& grid, std::size_t samplesPerPoint, std::string metadata) {
  GeoTiffImage image{grid.north,      grid.west, grid.northStep,     grid.eastStep, grid.columns,
                     samplesPerPoint, {},        std::move(metadata)};
  image.samples.reserve(grid.points.size() * samplesPerPoint);
  return image;
}

/// \param add (point of the grid, its place in radians, samples) appends the samples of a point
template <class AddSamples>
std::string FileOf(const Definition& definition, const Kind& kind, const JoinedGrids& joined,
                   const AddSamples& add) {
  if (joined.grids.empty()) return "";
  const std::string& system = definition.sourceName;
  GeoTiffFile file(definition.shifts.front().sourceAxes,
                   system.empty() ? "source system" : Printable(system));
  for (std::size_t number = 0; number < joined.grids.size(); ++number) {
    const JoinedGrid& grid = joined.grids[number];
    GeoTiffImage image = ImageOf(grid, kind.part.values.size(), Metadata(kind, number + 1));
    for (std::size_t i = 0; i < grid.points.size(); ++i) {
      const std::size_t row = i / grid.columns;
      const std::size_t column = i % grid.columns;
      const double north = grid.north - static_cast<double>(row) * grid.northStep;
      const double east = grid.west + static_cast<double>(column) * grid.eastStep;
      add(grid.points[i], Coordinates{north / kDegreesPerRadian, east / kDegreesPerRadian, 0},
          image.samples);
    }
    file.Add(image);
  }
  return file.Finish();
}

std::string HorizontalFile(const Definition& definition, const TellLeftOut& tell) {
  constexpr double kMetresPerArcSecond = 31;
  const Kind kind = {.part = {&ResidualGrid::horShift,
                              {&ResidualGrid::north, &ResidualGrid::east},
                              velta::kResidualAngleResolution / kArcSecondsPerRadian},
                     .name = "horizontal",
                     .unit = "\"",
                     .unitsPerValue = kArcSecondsPerRadian,
                     .decimals = 6,
                     .millimetresPerUnit = kMetresPerArcSecond * kMillimetres,
                     .metadata =
                         R"(  <Item name="TYPE">HORIZONTAL_OFFSET</Item>
  <Item name="DESCRIPTION" sample="0" role="description">latitude_offset</Item>
  <Item name="UNITTYPE" sample="0" role="unittype">arc-second</Item>
  <Item name="DESCRIPTION" sample="1" role="description">longitude_offset</Item>
  <Item name="UNITTYPE" sample="1" role="unittype">arc-second</Item>
  <Item name="positive_value" sample="1">east</Item>
)"};
  const JoinedGrids joined = JoinGrids(definition.grids, kind.part);
  TellDifferences(definition.grids, kind, joined, tell);
  const OffsetsInFront offsets(definition);
  return FileOf(definition, kind, joined,
                [&](const GridPoint& point, const Coordinates& at, std::vector<float>& samples) {
                  const ResidualGrid& grid = definition.grids[point.grid];
                  const Residuals offset =
                      offsets.At(at, {grid.north[point.point], grid.east[point.point], 0});
                  samples.push_back(static_cast<float>(offset.north * kArcSecondsPerRadian));
                  samples.push_back(static_cast<float>(offset.east * kArcSecondsPerRadian));
                });
}

std::string HeightFile(const Definition& definition, const TellLeftOut& tell) {
  const Kind kind = {
      .part = {&ResidualGrid::vertShift, {&ResidualGrid::height}, velta::kResidualLengthResolution},
      .name = "height",
      .unit = " m",
      .unitsPerValue = 1,
      .decimals = 4,
      .millimetresPerUnit = kMillimetres,
      .metadata =
          R"(  <Item name="TYPE">VERTICAL_OFFSET_GEOGRAPHIC_TO_VERTICAL</Item>
  <Item name="DESCRIPTION" sample="0" role="description">geoid_undulation</Item>
  <Item name="UNITTYPE" sample="0" role="unittype">metre</Item>
)"};
  const JoinedGrids joined = JoinGrids(definition.grids, kind.part);
  TellDifferences(definition.grids, kind, joined, tell);
  return FileOf(definition, kind, joined,
                [&](const GridPoint& point, const Coordinates&, std::vector<float>& samples) {
                  const double height = definition.grids[point.grid].height[point.point];
                  samples.push_back(static_cast<float>(height));
                });
}

}  // namespace

GridTiffs MakeGridTiffs(const Definition& definition, const TellLeftOut& tell) {
  if (definition.shifts.empty()) throw std::runtime_error("no entry can be used");
  TellWhatDiffers(definition.grids, tell);
  return {HorizontalFile(definition, tell), HeightFile(definition, tell)};
}

}  // namespace velta_tool
