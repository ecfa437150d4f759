#include "description.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <iterator>
#include <map>
#include <span>
#include <string_view>
#include <utility>

#include "angle.h"
#include "conversion/message_fields.h"
#include "conversion/projection_types.h"
#include "decimal.h"
#include "orxutils/orx_string.h"
#include "terminal.h"
#include "velta/projection_data.h"

namespace velta_tool {
namespace {

using nlohmann::ordered_json;
using orx::cs::velta::DatumData;
using orx::cs::velta::ProjectionData;
using orx::cs::velta::TableData;

// Steps of the fields of areas and grids, degrees; an edge may lie between two.
constexpr double kAreaStep = orx::cs::velta::kTwoArcSeconds * kDegreesPerRadian;
constexpr double kGridStep = orx::cs::velta::kHalfArcSecond * kDegreesPerRadian;

constexpr std::size_t kLabelWidth = 26;
constexpr std::size_t kValuesPerLine = 4;  // a row of a residual grid
const std::string kNextLine = "\n" + std::string(kLabelWidth, ' ');

constexpr const char* kMethods[] = {"Helmert, approximate", "Helmert, strict",
                                    "abridged Molodenski", "Molodenski-Badekas"};

struct ProjectionName {
  int code;
  const char* name;
};
constexpr ProjectionName kProjections[] = {
    {ProjectionData::TM, "Transverse Mercator"},
    {ProjectionData::TMS, "Transverse Mercator, south orientated"},
    {ProjectionData::LCC1SP, "Lambert conic conformal, one standard parallel"},
    {ProjectionData::LCC2SP, "Lambert conic conformal, two standard parallels"},
    {ProjectionData::LCCW, "Lambert conic conformal, west orientated"},
    {ProjectionData::CS, "Cassini-Soldner"},
    {ProjectionData::OM, "Oblique Mercator"},
    {ProjectionData::OS, "Stereographic"},
    {ProjectionData::MC, "Mercator"},
    {ProjectionData::PS, "Polar stereographic"},
    {ProjectionData::DS, "Double stereographic"},
    {ProjectionData::ROM, "Rectified oblique Mercator"},
};

std::string MethodName(std::uint32_t method) {
  return method < std::size(kMethods) ? kMethods[method] : "unknown";
}

std::string NameOfProjection(int code) {
  for (const auto& [known, name] : kProjections) {
    if (known == code) return name;
  }
  return "unknown";
}

ordered_json EdgesJson(std::span<const double> area) {
  const Edges edges(area);
  return {
      {"south", edges.south}, {"north", edges.north}, {"west", edges.west}, {"east", edges.east}};
}

ordered_json Scaled(std::span<const double> values, double factor) {
  ordered_json scaled = ordered_json::array();
  for (const double value : values) scaled.push_back(value * factor);
  return scaled;
}

/// How the grid of a datum and that of a projection are labelled.
struct GridTerms {
  std::string_view areaUnit;
  double areaStep;        ///< of the fields that it is made of
  std::string_view unit;  ///< of spacing and residuals
  double factor;          ///< from what is stored to that unit
  const char* north;
  const char* northKey;
  const char* east;
  const char* eastKey;
};
constexpr GridTerms kEllipsoidalGrid{kDegrees,
                                     kGridStep,
                                     "arc-seconds",
                                     kArcSecondsPerRadian,
                                     "latitude residuals",
                                     "latitudeResiduals",
                                     "longitude residuals",
                                     "longitudeResiduals"};
constexpr GridTerms kPlaneGrid{"m",
                               0,
                               "m",
                               1,
                               "northing residuals",
                               "northingResiduals",
                               "easting residuals",
                               "eastingResiduals"};

void AddGrid(const TableData& grid, const ordered_json& area, const GridTerms& terms,
             Description& description) {
  // An entry without a grid has one of no extent.
  if (grid.bounds[1] == 0 && grid.bounds[3] == 0) {
    description.push_back({"grid", "gridArea", nullptr});
    return;
  }
  const std::span<const double> mean(grid.meanValue);
  const Description properties = {
      {"grid area", "gridArea", area, terms.areaUnit, terms.areaStep},
      {"grid spacing", "gridSpacing", Scaled(std::span(grid.bounds).subspan(4), terms.factor),
       terms.unit},
      {"horizontal shifts", "horShift", grid.horShift},
      {"vertical shifts", "vertShift", grid.vertShift},
      {"horizontal interpolation", "horInterpolation", grid.horInterpolation},
      {"vertical interpolation", "vertInterpolation", grid.vertInterpolation},
      {"mean residuals", "meanResiduals", Scaled(mean.first(2), terms.factor), terms.unit},
      {"mean height residual", "meanHeightResidual", mean[2], "m"},
      {terms.north, terms.northKey, Scaled(grid.dNdLatData, terms.factor), terms.unit},
      {terms.east, terms.eastKey, Scaled(grid.dEdLonData, terms.factor), terms.unit},
      {"height residuals", "heightResiduals", Scaled(grid.dHData, 1), "m"},
  };
  description.insert(description.end(), properties.begin(), properties.end());
}

/// How the parameters of projections are labelled, by the fields of their messages.
struct ParameterTerms {
  std::string_view field;
  const char* label;
  const char* key;
  std::string_view unit;
};
constexpr ParameterTerms kParameters[] = {
    {"loNO", "longitude of origin", "longitudeOfOrigin", kDegrees},
    {"addSNO", "scale", "scale", ""},
    {"laNO", "latitude of origin", "latitudeOfOrigin", kDegrees},
    {"fe", "false easting", "falseEasting", "m"},
    {"fn", "false northing", "falseNorthing", "m"},
    {"azIL", "azimuth of the line", "azimuthOfLine", kDegrees},
    {"addSIL", "scale", "scale", ""},
    {"loPC", "longitude of centre", "longitudeOfCentre", kDegrees},
    {"laPC", "latitude of centre", "latitudeOfCentre", kDegrees},
    {"epc", "easting at the centre", "eastingAtCentre", "m"},
    {"npc", "northing at the centre", "northingAtCentre", "m"},
};

void AddParameters(int code, const double (&parameters)[16], Description& description) {
  const auto add = [&](std::string_view field, auto, double value, const auto&) {
    for (const auto& [known, label, key, unit] : kParameters) {
      if (known == field) description.push_back({label, key, value, unit});
    }
  };
  if (code != ProjectionData::OM && code != ProjectionData::ROM) {
    orx::cs::velta::Rtcm1025 message;
    message.projectionType = static_cast<std::uint32_t>(code);
    VisitProjection(message, parameters, add);
    return;
  }
  const orx::cs::velta::Rtcm1027 message;
  const double* const end = VisitProjection(message, parameters, add);
  if (code == ProjectionData::ROM) {
    description.push_back({"rectified to skew grid", "rectifiedToSkew", *end, kDegrees});
  }
}

ordered_json EllipsoidJson(double a, double b) {
  ordered_json ellipsoid = ordered_json::object();
  if (a != b) ellipsoid["1/f"] = a / (a - b);  // in front, as the unit at the end is the lengths'
  ellipsoid["a"] = a;
  ellipsoid["b"] = b;
  return ellipsoid;
}

bool IsSame(const ordered_json& a, const ordered_json& b) {
  if (a.is_number_float() && b.is_number_float()) {
    return IsSameNumber(a.get<double>(), b.get<double>());
  }
  if (!a.is_structured() || a.type() != b.type() || a.size() != b.size()) return a == b;
  return std::equal(a.begin(), a.end(), b.begin(), IsSame);
}

ordered_json WithShortNumbers(ordered_json value, double step) {
  if (value.is_number_float()) return Shortest(value.get<double>(), step);
  if (value.is_structured()) {
    for (ordered_json& element : value) element = WithShortNumbers(std::move(element), step);
  }
  return value;
}

ordered_json WithDegreesMinutesSeconds(ordered_json value) {
  if (value.is_number()) return DegreesMinutesSeconds(value.get<double>());
  if (value.is_structured()) {
    for (ordered_json& element : value) element = WithDegreesMinutesSeconds(std::move(element));
  }
  return value;
}

std::string NumberText(const ordered_json& number, double step) {
  return number.is_number_float() ? ShortestText(number.get<double>(), step) : number.dump();
}

std::string ValueText(const ordered_json& value, double step) {
  if (value.is_string()) return Printable(value.get<std::string>());
  if (value.is_boolean()) return value.get<bool>() ? "yes" : "no";
  if (!value.is_structured()) return NumberText(value, step);
  std::string text;
  std::size_t count = 0;
  for (const auto& [key, element] : value.items()) {
    const bool fullLine = count > 0 && count % kValuesPerLine == 0;
    if (count > 0) text += value.is_object() ? ", " : fullLine ? kNextLine : " ";
    if (value.is_object()) text += key + " ";
    text += ValueText(element, step);
    ++count;
  }
  return text;
}

std::string ValueText(const Property& property) {
  if (property.value.is_null()) return "none";
  const std::string text = ValueText(property.value, property.step);
  return property.unit.empty() ? text : text + " " + std::string(property.unit);
}

bool IsOfEachPoint(const Property& property) {
  constexpr std::string_view kKeys[] = {"latitudeResiduals", "longitudeResiduals",
                                        "northingResiduals", "eastingResiduals", "heightResiduals"};
  return std::find(std::begin(kKeys), std::end(kKeys), property.key) != std::end(kKeys);
}

bool IsIn(const Description& description, const Property& property) {
  return std::any_of(description.begin(), description.end(), [&](const Property& other) {
    return std::string_view(other.key) == property.key && other.value == property.value;
  });
}

/// Those that more than half of the descriptions have, in the order in which they come up.
Description CommonProperties(const std::vector<Description>& descriptions) {
  std::map<std::pair<std::string_view, std::string>, std::size_t> counts;
  Description common;
  for (const Description& description : descriptions) {
    for (const Property& property : description) {
      if (IsOfEachPoint(property)) continue;
      const std::size_t count = ++counts[{property.key, property.value.dump()}];
      if (count == descriptions.size() / 2 + 1) common.push_back(property);
    }
  }
  return common;
}

}  // namespace

Edges::Edges(std::span<const double> area)
    : south(area[0] * kDegreesPerRadian),
      north((area[0] + area[1]) * kDegreesPerRadian),
      west(area[2] * kDegreesPerRadian),
      east((area[2] + area[3]) * kDegreesPerRadian) {
  if (area[1] >= kPi) {
    south = -90;
    north = 90;
  }
  if (area[3] >= 2 * kPi) {
    west = -180;
    east = 180;
  }
}

Description Describe(const DatumData& datum) {
  const std::span<const double> parameters(datum.parameters);
  Description description = {
      {"source system", "sourceSystem", orx::ToUtf8(datum.sourceDatumName)},
      {"target system", "targetSystem", orx::ToUtf8(datum.targetDatumName)},
      {"computation indicator", "computationIndicator", datum.computationIndicator},
      {"method", "method", MethodName(datum.computationIndicator)},
      {"height indicator", "heightIndicator", static_cast<std::int32_t>(datum.heightIndicator)},
      {"area", "area", EdgesJson(datum.validityArea), kDegrees, kAreaStep},
      {"translations", "translations", Scaled(parameters.first(3), 1), "m"},
      {"rotations", "rotations", Scaled(parameters.subspan(3, 3), 1),
       "arc-seconds, coordinate frame"},
      {"scale correction", "scaleCorrection", parameters[6], "ppm"},
  };
  if (datum.computationIndicator == orx::cs::velta::kMolodenskiBadekas) {
    description.push_back(
        {"rotation point", "rotationPoint", Scaled(parameters.subspan(7, 3), 1), "m"});
  }
  const auto& source = datum.sourceEllipsoid;
  const auto& target = datum.targetEllipsoid;
  description.push_back(
      {"source ellipsoid", "sourceEllipsoid", EllipsoidJson(source.a, source.second), "m"});
  description.push_back(
      {"target ellipsoid", "targetEllipsoid", EllipsoidJson(target.a, target.second), "m"});
  AddGrid(datum.grid, EdgesJson(datum.grid.bounds), kEllipsoidalGrid, description);
  return description;
}

Description Describe(const StoredProjection& projection) {
  const auto code = orx::cs::velta::FirstCodeOf(projection.type);
  Description description = {
      {"datum", "datum", orx::ToUtf8(projection.datumName)},
      {"projection type", "projectionType", orx::ToUtf8(projection.type)},
      {"projection", "projection", NameOfProjection(code)},
      {"ellipsoid", "ellipsoid", EllipsoidJson(projection.axes[0], projection.axes[1]), "m"},
  };
  AddParameters(code, projection.parameters, description);
  const double* const bounds = projection.grid.bounds;
  const ordered_json area = {{"south", bounds[0]},
                             {"north", bounds[0] + bounds[1]},
                             {"west", bounds[2]},
                             {"east", bounds[2] + bounds[3]}};
  AddGrid(projection.grid, area, kPlaneGrid, description);
  return description;
}

std::vector<std::string> DifferingLabels(const Description& a, const Description& b) {
  std::vector<std::string> labels;
  const auto find = [](const Description& in, std::string_view key) {
    return std::find_if(in.begin(), in.end(), [key](const auto& own) { return own.key == key; });
  };
  for (const Property& property : a) {
    const auto other = find(b, property.key);
    if (other == b.end() || !IsSame(property.value, other->value)) {
      labels.emplace_back(property.label);
    }
  }
  for (const Property& property : b) {
    if (find(a, property.key) == a.end()) labels.emplace_back(property.label);
  }
  return labels;
}

Description WithDegreesMinutesSeconds(Description description) {
  for (Property& property : description) {
    if (property.unit != kDegrees) continue;
    property.value = WithDegreesMinutesSeconds(std::move(property.value));
    property.unit = "";
  }
  return description;
}

std::string ToText(const Description& description) {
  std::string text;
  for (const Property& property : description) {
    std::string line = property.label;
    line.resize(kLabelWidth, ' ');
    text += line + ValueText(property) + '\n';
  }
  return text;
}

std::string ToSummary(const std::vector<Description>& descriptions) {
  Description common = CommonProperties(descriptions);
  common.push_back({"entries", "entries", descriptions.size()});
  std::string text = ToText(common) + '\n';
  for (const Description& description : descriptions) {
    std::string separator;
    for (const Property& property : description) {
      if (IsOfEachPoint(property) || IsIn(common, property)) continue;
      const bool isName = separator.empty();
      text += std::exchange(separator, "; ");
      if (!isName) text += std::string(property.label) + " ";
      text += ValueText(property);
    }
    text += '\n';
  }
  return text;
}

ordered_json ToJson(const Description& description) {
  ordered_json json = ordered_json::object();
  for (const Property& property : description) {
    json[property.key] = WithShortNumbers(property.value, property.step);
  }
  return json;
}

}  // namespace velta_tool
