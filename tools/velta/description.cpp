#include "description.h"

#include <array>
#include <cstdio>
#include <span>
#include <string_view>

#include "orxutils/orx_string.h"
#include "velta/projection_data.h"

namespace velta_tool {
namespace {

using nlohmann::ordered_json;
using orx::cs::velta::DatumData;
using orx::cs::velta::ProjectionData;
using orx::cs::velta::Rtcm1025;
using orx::cs::velta::Rtcm1027;
using orx::cs::velta::TableData;

constexpr double kArcSecondsPerRadian = kDegreesPerRadian * 3600;
constexpr double kMessageAngle = 1.1e-8;      // degrees
constexpr double kMessageLength = 0.001;      // metres
constexpr double kMessageScale = 1e-5;        // ppm
constexpr double kMessageScaleBase = 993000;  // ppm
constexpr double kPpm = 1e-6;
constexpr std::uint32_t kMolodenskiBadekas = 3;

constexpr std::size_t kLabelWidth = 26;
constexpr std::size_t kValuesPerLine = 4;  // a row of a residual grid
const std::string kNextLine = "\n" + std::string(kLabelWidth, ' ');

constexpr const char* kMethods[] = {"Helmert, approximate", "Helmert, strict",
                                    "abridged Molodenski", "Molodenski-Badekas"};

struct ProjectionName {
  std::uint32_t code;
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
    {ProjectionData::OS, "Oblique stereographic"},
    {ProjectionData::MC, "Mercator"},
    {ProjectionData::PS, "Polar stereographic"},
    {ProjectionData::DS, "Double stereographic"},
};

std::string MethodName(std::uint32_t method) {
  return method < std::size(kMethods) ? kMethods[method] : "unknown";
}

std::string NameOfProjection(std::uint32_t code) {
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

void AddGrid(const TableData& grid, Description& description) {
  const std::span<const double> mean(grid.meanValue);
  const Description properties = {
      {"grid area", "gridArea", EdgesJson(grid.bounds), "degrees"},
      {"grid spacing", "gridSpacing",
       Scaled(std::span(grid.bounds).subspan(4), kArcSecondsPerRadian), "arc-seconds"},
      {"horizontal shifts", "horShift", grid.horShift},
      {"vertical shifts", "vertShift", grid.vertShift},
      {"horizontal interpolation", "horInterpolation", grid.horInterpolation},
      {"vertical interpolation", "vertInterpolation", grid.vertInterpolation},
      {"mean residuals", "meanResiduals", Scaled(mean.first(2), kArcSecondsPerRadian),
       "arc-seconds"},
      {"mean height residual", "meanHeightResidual", mean[2], "m"},
      {"latitude residuals", "latitudeResiduals", Scaled(grid.dNdLatData, kArcSecondsPerRadian),
       "arc-seconds"},
      {"longitude residuals", "longitudeResiduals", Scaled(grid.dEdLonData, kArcSecondsPerRadian),
       "arc-seconds"},
      {"height residuals", "heightResiduals", Scaled(grid.dHData, 1), "m"},
  };
  description.insert(description.end(), properties.begin(), properties.end());
}

double Degrees(auto angle) { return static_cast<double>(angle) * kMessageAngle; }
double Metres(auto length) { return static_cast<double>(length) * kMessageLength; }
double Factor(auto scale) {
  return (static_cast<double>(scale) * kMessageScale + kMessageScaleBase) * kPpm;
}

/// Nine decimals at most: a tenth of a millimetre as an angle in degrees.
std::string NumberText(const ordered_json& number) {
  if (!number.is_number_float()) return number.dump();
  std::array<char, 512> digits;
  std::snprintf(digits.data(), digits.size(), "%.9f", number.get<double>());
  std::string text = digits.data();
  if (text.find('.') == std::string::npos) return text;  // infinite or not a number
  text.erase(text.find_last_not_of('0') + 1);
  if (text.back() == '.') text.pop_back();
  return text == "-0" ? "0" : text;
}

std::string ValueText(const ordered_json& value) {
  if (value.is_string()) return value.get<std::string>();
  if (value.is_boolean()) return value.get<bool>() ? "yes" : "no";
  if (!value.is_structured()) return NumberText(value);
  std::string text;
  std::size_t count = 0;
  for (const auto& [key, element] : value.items()) {
    const bool fullLine = count > 0 && count % kValuesPerLine == 0;
    if (count > 0) text += value.is_object() ? ", " : fullLine ? kNextLine : " ";
    if (value.is_object()) text += key + " ";
    text += ValueText(element);
    ++count;
  }
  return text;
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
      {"area", "area", EdgesJson(datum.validityArea), "degrees"},
      {"translations", "translations", Scaled(parameters.first(3), 1), "m"},
      {"rotations", "rotations", Scaled(parameters.subspan(3, 3), 1), "arc-seconds"},
      {"scale correction", "scaleCorrection", parameters[6], "ppm"},
  };
  if (datum.computationIndicator == kMolodenskiBadekas) {
    description.push_back(
        {"rotation point", "rotationPoint", Scaled(parameters.subspan(7, 3), 1), "m"});
  }
  const auto& source = datum.sourceEllipsoid;
  const auto& target = datum.targetEllipsoid;
  description.push_back(
      {"source ellipsoid", "sourceEllipsoid", {{"a", source.a}, {"b", source.semiMinorAxis}}, "m"});
  description.push_back(
      {"target ellipsoid", "targetEllipsoid", {{"a", target.a}, {"b", target.semiMinorAxis}}, "m"});
  // An entry without a grid has one of no extent.
  if (datum.grid.bounds[1] == 0 && datum.grid.bounds[3] == 0) {
    description.push_back({"grid", "gridArea", nullptr});
  } else {
    AddGrid(datum.grid, description);
  }
  return description;
}

Description Describe(const Rtcm1025& projection) {
  const std::uint32_t type = projection.projectionType;
  Description description = {
      {"message", "message", 1025},
      {"projection type", "projectionType", type},
      {"projection", "projection", NameOfProjection(type)},
      {"latitude of origin", "latitudeOfOrigin", Degrees(projection.laNO), "degrees"},
      {"longitude of origin", "longitudeOfOrigin", Degrees(projection.loNO), "degrees"},
      {"false easting", "falseEasting", Metres(projection.fe), "m"},
      {"false northing", "falseNorthing", Metres(projection.fn), "m"},
  };
  // Those without a scale factor come with a 0.
  if (orx::cs::velta::HasScaleFactor(type)) {
    description.push_back({"scale", "scale", Factor(projection.addSNO)});
  }
  return description;
}

Description Describe(const Rtcm1027& projection) {
  const double azimuth = Degrees(projection.azIL);
  Description description = {
      {"message", "message", 1027},
      {"projection type", "projectionType", projection.projectionType},
      {"projection", "projection", NameOfProjection(projection.projectionType)},
      {"rectified", "rectified", projection.rectificationFlag},
      {"latitude of centre", "latitudeOfCentre", Degrees(projection.laPC), "degrees"},
      {"longitude of centre", "longitudeOfCentre", Degrees(projection.loPC), "degrees"},
      {"azimuth of the line", "azimuthOfLine", azimuth, "degrees"},
      {"easting at the centre", "eastingAtCentre", Metres(projection.epc), "m"},
      {"northing at the centre", "northingAtCentre", Metres(projection.npc), "m"},
      {"scale", "scale", Factor(projection.addSIL)},
  };
  if (projection.rectificationFlag) {
    description.push_back({"rectified to skew grid", "rectifiedToSkew",
                           azimuth + Degrees(projection.diffARSG), "degrees"});
  }
  return description;
}

std::string ToText(const Description& description) {
  std::string text;
  for (const auto& [label, key, value, unit] : description) {
    std::string line = label;
    line.resize(kLabelWidth, ' ');
    line += value.is_null() ? "none" : ValueText(value);
    if (*unit != '\0') line += std::string(" ") + unit;
    text += line + '\n';
  }
  return text;
}

ordered_json ToJson(const Description& description) {
  ordered_json json = ordered_json::object();
  for (const Property& property : description) json[property.key] = property.value;
  return json;
}

}  // namespace velta_tool
