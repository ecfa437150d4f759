#include "projmath/rect_rgn.h"

#include <cmath>
#include <numbers>

namespace orx::cs::projmath {
namespace {

constexpr double kHalfTurn = std::numbers::pi;
constexpr double kFullTurn = 2.0 * std::numbers::pi;

bool InRange(double value, double from, double extent) {
  return value >= from && value <= from + extent;
}

/// The rounding error of taking off whole turns, radians: far below a micrometre on the ground.
constexpr double kTurnRounding = 1e-14;

/// Looks for the longitude in the range as it is, then for the same meridian by another number.
bool InLongitudes(double longitude, double west, double extent) {
  if (InRange(longitude, west, extent)) return true;
  const double half = extent * 0.5;
  const double fromMiddle = std::remainder(longitude - (west + half), kFullTurn);
  const bool moved = std::abs(longitude - (west + half)) > kHalfTurn;
  return moved && std::abs(fromMiddle) <= half + kTurnRounding;
}

}  // namespace

bool TRectRgn::Inside(double first, double second, bool plane) const {
  if (plane) return InRange(first, south, northExtent) && InRange(second, west, eastExtent);
  if (!std::isfinite(first) || !std::isfinite(second)) return false;
  const bool inLatitudes = northExtent >= kHalfTurn || InRange(first, south, northExtent);
  return inLatitudes && (eastExtent >= kFullTurn || InLongitudes(second, west, eastExtent));
}

}  // namespace orx::cs::projmath
