#include "geodesy/proj_steps.h"

#include <charconv>
#include <cmath>
#include <initializer_list>
#include <utility>

#include "description.h"
#include "velta/message_units.h"

namespace velta_tool {
namespace {

using Parameters = std::initializer_list<std::pair<const char*, double>>;

/// A step with parameters behind its name.
std::string Step(const std::string& operation, const Parameters& parameters) {
  std::string step = " +step +proj=" + operation;
  for (const auto& [name, value] : parameters) {
    step.append(" +").append(name).append("=").append(ProjNumber(value));
  }
  return step;
}

std::string Geocentric(const char* operation, const std::array<double, 2>& axes) {
  return Step(operation, {{"a", axes[0]}, {"b", axes[1]}});
}

}  // namespace

std::string ProjNumber(double number) {
  constexpr int kDigits = 15;
  std::array<char, 32> digits;
  const auto result =
      std::to_chars(digits.begin(), digits.end(), number, std::chars_format::general, kDigits);
  return {digits.data(), result.ptr};
}

double Flattening(const std::array<double, 2>& axes) { return (axes[0] - axes[1]) / axes[0]; }

std::string DatumSteps(const DatumShift& shift) {
  const auto& [source, target, parameters, method, height] = shift;
  if (height > kPhysicalOfSource) {
    throw NotTransformable("height indicator " + std::to_string(height) + " is reserved");
  }
  if (method == kAbridgedMolodenski) {
    return Step("molodensky +abridged", {{"a", source[0]},
                                         {"b", source[1]},
                                         {"dx", parameters[0]},
                                         {"dy", parameters[1]},
                                         {"dz", parameters[2]},
                                         {"da", target[0] - source[0]},
                                         {"df", Flattening(target) - Flattening(source)}});
  }
  const auto similarity = [&parameters = parameters](const char* operation) {
    return Step(operation, {{"x", parameters[0]},
                            {"y", parameters[1]},
                            {"z", parameters[2]},
                            {"rx", parameters[3]},
                            {"ry", parameters[4]},
                            {"rz", parameters[5]},
                            {"s", parameters[6]}}) +
           " +convention=coordinate_frame";
  };
  std::string middle;
  switch (method) {
    case kLinearHelmert:
      middle = similarity("helmert");
      break;
    case kStrictHelmert:
      middle = similarity("helmert +exact");
      break;
    case orx::cs::velta::kMolodenskiBadekas:
      middle = similarity("molobadekas") + " +px=" + ProjNumber(parameters[7]) +
               " +py=" + ProjNumber(parameters[8]) + " +pz=" + ProjNumber(parameters[9]);
      break;
    default:
      throw NotTransformable("computation indicator " + std::to_string(method) + " is reserved");
  }
  return Geocentric("cart", source) + middle + Geocentric("cart +inv", target);
}

bool IsPolar(const Projection& projection) {
  constexpr double kSteps = 2 * orx::cs::velta::kProjectionAngleResolution;
  return std::abs(projection.latitude) >= 90 - kSteps;
}

double MercatorNorthing(double latitude, double scale, const std::array<double, 2>& axes) {
  const double phi = latitude / kDegreesPerRadian;
  const double f = Flattening(axes);
  const double e = std::sqrt(f * (2 - f));
  return axes[0] * scale * (std::asinh(std::tan(phi)) - e * std::atanh(e * std::sin(phi)));
}

std::string ProjectionSteps(const Projection& projection, const std::array<double, 2>& axes) {
  if (!projection.problem.empty()) throw NotTransformable(projection.problem);
  const auto step = [&](const char* operation, const Parameters& own, double falseEasting,
                        double falseNorthing) {
    return Geocentric(operation, axes) + Step("", own).substr(Step("", {}).size()) +
           " +x_0=" + ProjNumber(falseEasting) + " +y_0=" + ProjNumber(falseNorthing);
  };
  const double lat = projection.latitude;
  const double lon = projection.longitude;
  const double k = projection.scale;
  const double fe = projection.falseEasting;
  const double fn = projection.falseNorthing;
  const double pole = std::copysign(90.0, lat);
  switch (projection.type) {
    case ProjectionType::TM:
      return step("tmerc", {{"lon_0", lon}, {"lat_0", lat}, {"k_0", k}}, fe, fn);
    case ProjectionType::TMS:
      return step("tmerc", {{"lon_0", lon}, {"lat_0", lat}, {"k_0", k}}, -fe, -fn) +
             " +step +proj=axisswap +order=-1,-2";
    case ProjectionType::LCC1SP:
      return step("lcc", {{"lat_1", lat}, {"lat_0", lat}, {"lon_0", lon}, {"k_0", k}}, fe, fn);
    case ProjectionType::LCCW:
      return step("lcc", {{"lat_1", lat}, {"lat_0", lat}, {"lon_0", lon}, {"k_0", k}}, -fe, fn) +
             " +step +proj=axisswap +order=-1,2";
    case ProjectionType::LCC2SP:
      return step("lcc",
                  {{"lat_1", projection.firstParallel},
                   {"lat_2", projection.secondParallel},
                   {"lat_0", lat},
                   {"lon_0", lon}},
                  fe, fn);
    case ProjectionType::CS:
      return step("cass", {{"lon_0", lon}, {"lat_0", lat}}, fe, fn);
    case ProjectionType::MC:
      return step("merc", {{"lon_0", lon}, {"k_0", k}}, fe, fn - MercatorNorthing(lat, k, axes));
    case ProjectionType::OS:
    case ProjectionType::DS:
      if (!IsPolar(projection)) {
        return step("sterea", {{"lon_0", lon}, {"lat_0", lat}, {"k_0", k}}, fe, fn);
      }
      [[fallthrough]];
    case ProjectionType::PS:
      if (!IsPolar(projection)) {
        throw NotTransformable("a polar stereographic projection whose origin is no pole");
      }
      return step("stere", {{"lon_0", lon}, {"lat_0", pole}, {"k_0", k}}, fe, fn);
    case ProjectionType::ROM:
      return step("omerc",
                  {{"lonc", lon},
                   {"lat_0", lat},
                   {"alpha", projection.azimuth},
                   {"gamma", projection.skew},
                   {"k_0", k}},
                  fe, fn);
    case ProjectionType::OM:
      throw NotTransformable(
          "an oblique Mercator that is not rectified: two readings of its axes are 1000 km apart, "
          "and no source settles it");
    default:
      throw NotTransformable("projection type " + std::to_string(projection.type) +
                             " is not known");
  }
}

}  // namespace velta_tool
