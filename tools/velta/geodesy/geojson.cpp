#include <algorithm>
#include <array>
#include <cmath>
#include <map>
#include <nlohmann/json.hpp>

#include "description.h"
#include "geodesy/exports.h"
#include "terminal.h"

namespace velta_tool {
namespace {

using nlohmann::ordered_json;

constexpr double kDateLine = 180;  // degrees
/// Coordinates have so many decimals: a thousandth of the finest step of a grid.
constexpr double kCoordinateUnits = 1e9;
/// Residuals have those of their steps and two more: arc-seconds, metres.
constexpr double kResidualUnits = 1e7;

double Rounded(double number, double units) {
  const double rounded = std::round(number * units) / units;
  return rounded == 0 ? 0 : rounded;  // not -0
}

/// A longitude within half a turn of 0.
double Wrapped(double degrees) {
  return std::abs(degrees) <= kDateLine ? degrees : std::remainder(degrees, 2 * kDateLine);
}

ordered_json Point(double longitude, double latitude) {
  return {Rounded(longitude, kCoordinateUnits), Rounded(latitude, kCoordinateUnits)};
}

/// A ring against the clock, as the exterior one is to run.
ordered_json Ring(double south, double north, double west, double east) {
  return ordered_json::array(
      {ordered_json::array({Point(west, south), Point(east, south), Point(east, north),
                            Point(west, north), Point(west, south)})});
}

/// A rectangle of parallels and meridians, cut at the antimeridian.
ordered_json Geometry(const TRectRgn& area) {
  const double edges[] = {area.south, area.northExtent, area.west, area.eastExtent};
  Edges box{edges};
  if (box.east - box.west >= 2 * kDateLine) {
    box.west = -kDateLine;
    box.east = kDateLine;
  }
  const double turns = Wrapped(box.west) - box.west;
  const double west = box.west + turns;
  const double east = box.east + turns;
  const double south = std::max(box.south, -90.0);
  const double north = std::min(box.north, 90.0);
  if (east <= kDateLine) {
    return {{"type", "Polygon"}, {"coordinates", Ring(south, north, west, east)}};
  }
  const ordered_json parts = ordered_json::array(
      {Ring(south, north, west, kDateLine), Ring(south, north, -kDateLine, east - 2 * kDateLine)});
  return {{"type", "MultiPolygon"}, {"coordinates", parts}};
}

ordered_json Feature(ordered_json geometry, ordered_json properties) {
  return {{"type", "Feature"},
          {"geometry", std::move(geometry)},
          {"properties", std::move(properties)}};
}

ordered_json AreaFeature(const DatumArea& area, const std::string& system) {
  return Feature(Geometry(area.area),
                 {{"kind", "area of validity"}, {"entry", area.entry}, {"system", system}});
}

/// A method by its name.
const char* NameOfMethod(int method) {
  switch (method) {
    case kBilinear:
      return "bilinear";
    case kBiquadratic:
      return "biquadratic";
    case kSpline:
      return "spline";
    default:
      return "reserved";
  }
}

ordered_json GridFeature(const ResidualGrid& grid, const std::string& system) {
  ordered_json properties = {
      {"kind", "residual grid"},
      {"entry", grid.entry},
      {"system", system},
      {"latitudeStepArcSeconds", Rounded(grid.NorthStep() * kArcSecondsPerRadian, kResidualUnits)},
      {"longitudeStepArcSeconds", Rounded(grid.EastStep() * kArcSecondsPerRadian, kResidualUnits)},
      {"horizontalInterpolation", nullptr},
      {"heightInterpolation", nullptr}};
  if (grid.horShift) properties["horizontalInterpolation"] = NameOfMethod(grid.horInterpolation);
  if (grid.vertShift) properties["heightInterpolation"] = NameOfMethod(grid.vertInterpolation);
  return Feature(Geometry(grid.area), std::move(properties));
}

ordered_json PointFeature(const ResidualGrid& grid, std::size_t point, const std::string& system) {
  const std::size_t row = point / kGridPoints;
  const std::size_t column = point % kGridPoints;
  const double latitude =
      grid.area.south + grid.area.northExtent - static_cast<double>(row) * grid.NorthStep();
  const double longitude = grid.area.west + static_cast<double>(column) * grid.EastStep();
  ordered_json properties = {{"kind", "grid point"},
                             {"entry", grid.entry},
                             {"system", system},
                             {"latitudeResidualArcSeconds", nullptr},
                             {"longitudeResidualArcSeconds", nullptr},
                             {"heightResidualMetres", nullptr}};
  if (grid.horShift) {
    properties["latitudeResidualArcSeconds"] =
        Rounded(grid.north[point] * kArcSecondsPerRadian, kResidualUnits);
    properties["longitudeResidualArcSeconds"] =
        Rounded(grid.east[point] * kArcSecondsPerRadian, kResidualUnits);
  }
  if (grid.vertShift) {
    properties["heightResidualMetres"] = Rounded(grid.height[point], kResidualUnits);
  }
  return Feature({{"type", "Point"},
                  {"coordinates",
                   Point(Wrapped(longitude * kDegreesPerRadian), latitude * kDegreesPerRadian)}},
                 std::move(properties));
}

/// Areas with the same edges once, with the first entry that has them.
std::vector<const DatumArea*> DifferentAreas(const Definition& definition) {
  std::map<std::array<double, 4>, bool> known;
  std::vector<const DatumArea*> areas;
  for (const DatumArea& area : definition.areas) {
    const auto& [south, northExtent, west, eastExtent] = area.area;
    if (known.try_emplace({south, northExtent, west, eastExtent}).second) areas.push_back(&area);
  }
  return areas;
}

}  // namespace

std::string GeoJson(const Definition& definition, const TellLeftOut& tell) {
  // An empty name is one that the source did not give.
  const std::string system =
      definition.sourceName.empty() ? "source system" : definition.sourceName;
  std::string text = R"({"type": "FeatureCollection", "features": [)";
  const char* separator = "\n";
  const auto add = [&](const ordered_json& feature) {
    text += separator + feature.dump();
    separator = ",\n";
  };
  for (const DatumArea* const area : DifferentAreas(definition)) add(AreaFeature(*area, system));
  for (const ResidualGrid& grid : definition.grids) {
    if (!grid.problem.empty()) {
      tell("the grid of " + Printable(grid.entry) + ": " + grid.problem);
      continue;
    }
    add(GridFeature(grid, system));
    for (std::size_t point = 0; point < grid.north.size(); ++point) {
      add(PointFeature(grid, point, system));
    }
  }
  if (!definition.planeGrids.empty()) tell("plane grids, which have no longitudes and latitudes");
  if (definition.projection) tell("the projection");
  return text + "\n]}\n";
}

}  // namespace velta_tool
