#include "geodesy/reverse_shift.h"

#include <algorithm>
#include <array>
#include <cmath>

#include "description.h"
#include "geodesy/proj_operation.h"
#include "geodesy/proj_steps.h"
#include "velta/message_units.h"

namespace velta_tool {
namespace {

constexpr double kEarthRadius = 6.4e6;  // metres

/// The first guess. Molodenski-Badekas with the matrix of small angles is a Helmert transformation
/// with other translations.
DatumShift WithOppositeSigns(const DatumShift& shift, const std::array<double, 2>& axes) {
  constexpr double kPpm = orx::cs::velta::kPpm;
  constexpr std::size_t kScale = 6;
  DatumShift reverse = {shift.targetAxes, axes, {}, kLinearHelmert, kGeometricHeight};
  if (shift.computationIndicator == kAbridgedMolodenski) {
    reverse.computationIndicator = kAbridgedMolodenski;
  }
  for (std::size_t i = 0; i < kScale; ++i) reverse.parameters[i] = -shift.parameters[i];
  reverse.parameters[kScale] = (1 / (1 + shift.parameters[kScale] * kPpm) - 1) / kPpm;
  return reverse;
}

/// From the system of the satellites to the local one, as PROJ inverts a reverse: abridged
/// Molodenski by opposite signs.
Coordinates ByInverse(ProjContext& context, const DatumShift& reverse, const Coordinates& place) {
  if (reverse.computationIndicator == kAbridgedMolodenski) {
    const DatumShift forth = WithOppositeSigns(reverse, reverse.sourceAxes);
    return ProjOperation(context, DatumSteps(forth)).Forward(place);
  }
  return ProjOperation(context, DatumSteps(reverse)).Inverse(place);
}

std::array<double, 3> Geocentric(ProjContext& context, const std::array<double, 2>& axes,
                                 const Coordinates& place) {
  const ProjOperation cart(
      context, " +step +proj=cart +a=" + ProjNumber(axes[0]) + " +b=" + ProjNumber(axes[1]));
  const Coordinates xyz = cart.Forward(place);
  return {xyz.east, xyz.north, xyz.height};
}

/// Metres on the ground.
double Distance(const Coordinates& a, const Coordinates& b) {
  const double north = a.north - b.north;
  const double east = std::remainder(a.east - b.east, 2 * kPi) * std::cos(a.north);
  return std::hypot(north, east) * kEarthRadius;
}

/// The middle and the corners.
std::array<Coordinates, 5> PlacesIn(const TRectRgn& area) {
  constexpr double kMost = 89 / kDegreesPerRadian;  // at a pole there are no longitudes
  const auto& [southEdge, northExtent, west, eastExtent] = area;
  const double south = std::max(southEdge, -kMost);
  const double north = std::min(southEdge + northExtent, kMost);
  const double east = west + eastExtent;
  return {{{(south + north) / 2, west + eastExtent / 2, 0},
           {south, west, 0},
           {south, east, 0},
           {north, west, 0},
           {north, east, 0}}};
}

}  // namespace

ReverseShift ReverseOf(const DatumShift& shift, const std::array<double, 2>& axes,
                       const TRectRgn& area) {
  constexpr int kMostSteps = 20;
  constexpr double kSame = 1e-6;  // metres
  ProjContext context;
  const ProjOperation forth(context, DatumSteps(shift));
  const auto places = PlacesIn(area);
  const auto wanted = Geocentric(context, shift.targetAxes, forth.Forward(places[0]));
  ReverseShift reverse = {WithOppositeSigns(shift, axes), 0, 0};
  for (int step = 0; step < kMostSteps; ++step) {
    const auto reached =
        Geocentric(context, shift.targetAxes, ByInverse(context, reverse.shift, places[0]));
    double most = 0;
    for (std::size_t i = 0; i < wanted.size(); ++i) {
      reverse.shift.parameters[i] += reached[i] - wanted[i];
      most = std::max(most, std::abs(reached[i] - wanted[i]));
    }
    if (most < kSame) break;
  }
  const ProjOperation back(context, DatumSteps(reverse.shift));
  for (const Coordinates& place : places) {
    const Coordinates local = forth.Forward(place);
    const Coordinates inverse = ByInverse(context, reverse.shift, place);
    reverse.offForth = std::max(reverse.offForth, Distance(inverse, local));
    reverse.offBack = std::max(reverse.offBack, Distance(back.Forward(local), place));
  }
  return reverse;
}

}  // namespace velta_tool
