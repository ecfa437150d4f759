#include <proj.h>

#include <array>
#include <cmath>
#include <memory>
#include <nlohmann/json.hpp>
#include <string>
#include <utility>

#include "geodesy/exports.h"
#include "geodesy/proj_operation.h"
#include "geodesy/proj_steps.h"
#include "geodesy/reverse_shift.h"
#include "positions.h"
#include "terminal.h"
#include "velta/message_units.h"

namespace velta_tool {
namespace {

namespace velta = orx::cs::velta;
using nlohmann::ordered_json;

constexpr const char* kUnknown = "unknown";

/// An object with its code in the EPSG registry, by which readers know it.
ordered_json Identified(const char* name, int code) {
  return {{"name", name}, {"id", {{"authority", "EPSG"}, {"code", code}}}};
}

ordered_json Parameter(const char* name, int code, double value, ordered_json unit) {
  ordered_json parameter = Identified(name, code);
  parameter["value"] = value;
  parameter["unit"] = std::move(unit);
  return parameter;
}

ordered_json Angle(const char* name, int code, double degrees) {
  return Parameter(name, code, degrees, "degree");
}

ordered_json Length(const char* name, int code, double metres) {
  return Parameter(name, code, metres, "metre");
}

ordered_json Ratio(const char* name, int code, double ratio) {
  return Parameter(name, code, ratio, "unity");
}

ordered_json Rotation(const char* name, int code, double arcSeconds) {
  return Parameter(
      name, code, arcSeconds,
      {{"type", "AngularUnit"}, {"name", "arc-second"}, {"conversion_factor", velta::kArcSecond}});
}

ordered_json Ppm(const char* name, int code, double ppm) {
  return Parameter(
      name, code, ppm,
      {{"type", "ScaleUnit"}, {"name", "parts per million"}, {"conversion_factor", velta::kPpm}});
}

ordered_json Operation(const std::string& name, ordered_json method, ordered_json parameters) {
  return {{"name", name}, {"method", std::move(method)}, {"parameters", std::move(parameters)}};
}

ordered_json Axis(const char* name, const char* abbreviation, const char* direction,
                  const char* unit) {
  return {{"name", name}, {"abbreviation", abbreviation}, {"direction", direction}, {"unit", unit}};
}

/// An ellipsoid and the name that it is known by.
struct Ellipsoid {
  std::string name;
  std::array<double, 2> axes;  ///< metres
};

ordered_json GeographicSystem(const std::string& name, const std::string& datum,
                              const Ellipsoid& ellipsoid) {
  return {{"type", "GeographicCRS"},
          {"name", name},
          {"datum",
           {{"type", "GeodeticReferenceFrame"},
            {"name", datum},
            {"ellipsoid",
             {{"name", ellipsoid.name},
              {"semi_major_axis", ellipsoid.axes[0]},
              {"semi_minor_axis", ellipsoid.axes[1]}}}}},
          {"coordinate_system",
           {{"subtype", "ellipsoidal"},
            {"axis",
             {Axis("Geodetic latitude", "Lat", "north", "degree"),
              Axis("Geodetic longitude", "Lon", "east", "degree")}}}}};
}

/// The system of the satellites, that of WGS 84 where it has its ellipsoid: only to that one do
/// programs reach from others, for all others they leave out the datum shift without a word.
struct Hub {
  Ellipsoid ellipsoid;
  ordered_json system;
};

Hub HubOf(const std::string& name, const std::array<double, 2>& axes, const TellLeftOut& tell) {
  constexpr double kSame = velta::kAxisResolution;
  const Ellipsoid wgs84 = {"WGS 84", {6378137, 6378137 - 6378137 / 298.257223563}};
  const bool isWgs84 =
      std::abs(axes[0] - wgs84.axes[0]) < kSame && std::abs(axes[1] - wgs84.axes[1]) < kSame;
  if (!isWgs84) {
    const Ellipsoid own = {kUnknown, axes};
    return {own, GeographicSystem(name, name, own)};
  }
  tell("the name of the satellites' system, " + Printable(name) +
       ": it is bound to WGS 84, which other programs transform to");
  return {wgs84, GeographicSystem("WGS 84", "World Geodetic System 1984", wgs84)};
}

/// The conversion of a projection that ProjectionSteps() accepts. South and west orientation are
/// left to the axes: PROJ refuses the methods that have it in them.
ordered_json ConversionOf(const Projection& projection, const std::array<double, 2>& axes) {
  const double lat = projection.latitude;
  const double fe = projection.falseEasting;
  const double fn = projection.falseNorthing;
  const auto natural = [&](const char* method, int code, double latitude, double falseEasting,
                           double falseNorthing) {
    return Operation(method, Identified(method, code),
                     {Angle("Latitude of natural origin", 8801, latitude),
                      Angle("Longitude of natural origin", 8802, projection.longitude),
                      Ratio("Scale factor at natural origin", 8805, projection.scale),
                      Length("False easting", 8806, falseEasting),
                      Length("False northing", 8807, falseNorthing)});
  };
  switch (projection.type) {
    case ProjectionType::TM:
      return natural("Transverse Mercator", 9807, lat, fe, fn);
    case ProjectionType::TMS:
      return natural("Transverse Mercator", 9807, lat, -fe, -fn);
    case ProjectionType::LCC1SP:
      return natural("Lambert Conic Conformal (1SP)", 9801, lat, fe, fn);
    case ProjectionType::LCCW:
      return natural("Lambert Conic Conformal (1SP)", 9801, lat, -fe, fn);
    case ProjectionType::LCC2SP:
      return Operation("Lambert Conic Conformal (2SP)",
                       Identified("Lambert Conic Conformal (2SP)", 9802),
                       {Angle("Latitude of false origin", 8821, lat),
                        Angle("Longitude of false origin", 8822, projection.longitude),
                        Angle("Latitude of 1st standard parallel", 8823, projection.firstParallel),
                        Angle("Latitude of 2nd standard parallel", 8824, projection.secondParallel),
                        Length("Easting at false origin", 8826, fe),
                        Length("Northing at false origin", 8827, fn)});
    case ProjectionType::CS:
      return Operation("Cassini-Soldner", Identified("Cassini-Soldner", 9806),
                       {Angle("Latitude of natural origin", 8801, lat),
                        Angle("Longitude of natural origin", 8802, projection.longitude),
                        Length("False easting", 8806, fe), Length("False northing", 8807, fn)});
    case ProjectionType::MC:
      return natural("Mercator (variant A)", 9804, 0, fe,
                     fn - MercatorNorthing(lat, projection.scale, axes));
    case ProjectionType::ROM:
      return Operation("Hotine Oblique Mercator (variant B)",
                       Identified("Hotine Oblique Mercator (variant B)", 9815),
                       {Angle("Latitude of projection centre", 8811, lat),
                        Angle("Longitude of projection centre", 8812, projection.longitude),
                        Angle("Azimuth of initial line", 8813, projection.azimuth),
                        Angle("Angle from Rectified to Skew Grid", 8814, projection.skew),
                        Ratio("Scale factor on initial line", 8815, projection.scale),
                        Length("Easting at projection centre", 8816, fe),
                        Length("Northing at projection centre", 8817, fn)});
    default:  // the stereographic ones
      if (projection.type == ProjectionType::PS || IsPolar(projection)) {
        return natural("Polar Stereographic (variant A)", 9810, std::copysign(90.0, lat), fe, fn);
      }
      return natural("Oblique Stereographic", 9809, lat, fe, fn);
  }
}

/// Its axes are in the order of the columns of a transformation.
ordered_json ProjectedSystem(ordered_json base, const Projection& projection,
                             const std::array<double, 2>& axes) {
  const bool isSouth = projection.type == ProjectionType::TMS;
  const bool isWest = isSouth || projection.type == ProjectionType::LCCW;
  const ordered_json conversion = ConversionOf(projection, axes);
  const std::string name =
      base["name"].get<std::string>() + " / " + conversion["name"].get<std::string>();
  return {{"type", "ProjectedCRS"},
          {"name", name},
          {"base_crs", std::move(base)},
          {"conversion", conversion},
          {"coordinate_system",
           {{"subtype", "Cartesian"},
            {"axis",
             {isSouth ? Axis("Southing", "S", "south", "metre")
                      : Axis("Northing", "N", "north", "metre"),
              isWest ? Axis("Westing", "W", "west", "metre")
                     : Axis("Easting", "E", "east", "metre")}}}}};
}

ordered_json TransformationOf(const std::string& name, const DatumShift& shift) {
  const auto& p = shift.parameters;
  ordered_json parameters = {Length("X-axis translation", 8605, p[0]),
                             Length("Y-axis translation", 8606, p[1]),
                             Length("Z-axis translation", 8607, p[2])};
  if (shift.computationIndicator == kAbridgedMolodenski) {
    parameters.push_back(Length("Semi-major axis length difference", 8654,
                                shift.targetAxes[0] - shift.sourceAxes[0]));
    parameters.push_back(Ratio("Flattening difference", 8655,
                               Flattening(shift.targetAxes) - Flattening(shift.sourceAxes)));
    return Operation(name, Identified("Abridged Molodensky", 9605), std::move(parameters));
  }
  parameters.push_back(Rotation("X-axis rotation", 8608, p[3]));
  parameters.push_back(Rotation("Y-axis rotation", 8609, p[4]));
  parameters.push_back(Rotation("Z-axis rotation", 8610, p[5]));
  parameters.push_back(Ppm("Scale difference", 8611, p[6]));
  return Operation(name, Identified("Coordinate Frame rotation (geog2D domain)", 9607),
                   std::move(parameters));
}

/// \throws NotTransformable with PROJ's reason
std::string TextOf(const ordered_json& system) {
  ProjContext context;
  const std::unique_ptr<PJ, decltype(&proj_destroy)> made(
      proj_create(context.get(), system.dump().c_str()), proj_destroy);
  const char* const text =
      made ? proj_as_wkt(context.get(), made.get(), PJ_WKT2_2019, nullptr) : nullptr;
  if (text) return std::string(text) + '\n';
  throw NotTransformable("PROJ refuses it: " + context.Reason(proj_context_errno(context.get())));
}

TRectRgn AreaOf(const Definition& definition, std::size_t shift) {
  for (const DatumArea& area : definition.areas) {
    if (area.shift == shift) return area.area;
  }
  throw NotTransformable("no area has the datum shift");
}

void TellWhatIsMissing(const Definition& definition, const DatumShift& shift,
                       const TellLeftOut& tell) {
  const bool isPhysical = shift.heightIndicator != kGeometricHeight;
  if (shift.computationIndicator == kAbridgedMolodenski) {
    if (isPhysical) tell("physical heights: they are ellipsoidal ones of the local system");
  } else {
    tell("heights, which stay " + std::string(isPhysical ? "ellipsoidal, " : "") +
         "those of the satellites' system; a position without a height is taken for one of height "
         "0");
  }
  if (IsBounded(definition)) tell("the area of validity: it goes on outside");
  if (!definition.grids.empty()) tell("the residual grids");
  if (definition.projection && !definition.planeGrids.empty()) tell("the plane grids");
}

void TellError(const ReverseShift& reverse, const TellLeftOut& tell) {
  constexpr double kMillimetres = 1000;  // in a metre
  constexpr double kLeast = 0.1;
  const double forth = reverse.offForth * kMillimetres;
  const double back = reverse.offBack * kMillimetres;
  if (forth < kLeast && back < kLeast) return;
  std::string text = "the exact datum shift: its reverse is off by up to ";
  AppendFixed(forth, 1, text);
  text += " mm in the area to the local system, ";
  AppendFixed(back, 1, text);
  tell(text + " mm from it");
}

}  // namespace

const bool kHasProj = true;

std::string Wkt(const Definition& definition, std::size_t shiftIndex, const TellLeftOut& tell) {
  const auto nameOr = [](const std::string& name) { return name.empty() ? kUnknown : name; };
  const DatumShift& shift = definition.shifts[shiftIndex];
  const std::string local = nameOr(definition.targetName);
  ordered_json system = GeographicSystem(local, local, {kUnknown, shift.targetAxes});
  if (definition.projection) {
    ProjectionSteps(*definition.projection, shift.targetAxes);  // refuses what cannot be used
    system = ProjectedSystem(std::move(system), *definition.projection, shift.targetAxes);
  }
  Hub hub = HubOf(nameOr(definition.sourceName), shift.sourceAxes, tell);
  const ReverseShift reverse = ReverseOf(shift, hub.ellipsoid.axes, AreaOf(definition, shiftIndex));
  const std::string name = local + " to " + hub.system["name"].get<std::string>();
  std::string text = TextOf({{"type", "BoundCRS"},
                             {"source_crs", std::move(system)},
                             {"target_crs", std::move(hub.system)},
                             {"transformation", TransformationOf(name, reverse.shift)}});
  TellWhatIsMissing(definition, shift, tell);
  TellError(reverse, tell);
  return text;
}

}  // namespace velta_tool
