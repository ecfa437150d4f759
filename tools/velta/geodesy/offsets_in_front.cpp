#include "geodesy/offsets_in_front.h"

#include <cmath>

#include "description.h"
#include "geodesy/proj_steps.h"

namespace velta_tool {

OffsetsInFront::OffsetsInFront(const Definition& definition)
    : definition_(definition), areas_(IndexOf(definition.areas, false)) {
  for (const DatumShift& shift : definition.shifts) {
    try {
      operations_.emplace_back(ProjOperation(context_, DatumSteps(shift)));
    } catch (const NotTransformable&) {
      operations_.emplace_back();
    }
  }
}

Residuals OffsetsInFront::At(const Coordinates& at, const Residuals& residuals) const {
  constexpr int kMostSteps = 20;
  constexpr double kSame = 1e-13;  // radians
  const auto& operation = operations_[ShiftAt(at)];
  if (!operation) return residuals;
  const Coordinates target = operation->Forward(at);
  Residuals offset = {residuals.north, residuals.east, 0};
  // By the shift alone, as PROJ's inverse of one is not exact.
  for (int step = 0; step < kMostSteps; ++step) {
    const Coordinates moved =
        operation->Forward({at.north + offset.north, at.east + offset.east, at.height});
    const double north = target.north + residuals.north - moved.north;
    const double east = std::remainder(target.east + residuals.east - moved.east, 2 * kPi);
    offset.north += north;
    offset.east += east;
    if (std::abs(north) < kSame && std::abs(east) < kSame) break;
  }
  return offset;
}

/// A point outside all areas may belong to a cell that reaches into one: from the shift there that
/// of any other area hardly differs in this.
std::size_t OffsetsInFront::ShiftAt(const Coordinates& at) const {
  if (operations_.size() == 1) return 0;
  const auto area = areas_.First(at.north, at.east);
  return area ? definition_.areas[*area].shift.value_or(0) : 0;
}

}  // namespace velta_tool
