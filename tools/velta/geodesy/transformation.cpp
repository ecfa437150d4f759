#include "geodesy/transformation.h"

#include <algorithm>
#include <cmath>
#include <utility>

#include "description.h"
#include "geodesy/proj_steps.h"
#include "terminal.h"
#include "velta/message_units.h"

namespace velta_tool {
namespace {

/// Metres by which a position may lie outside an area that its own reverse is looked for in: more
/// than the iteration leaves, less than anybody would notice.
constexpr double kEdge = 0.005;
/// The same for a position that is still to be moved by the datum shift.
constexpr double kWholeShift = 5000;

constexpr const char* kOutside = "no area holds the position";

template <class Held>
AreaIndex IndexOf(const std::vector<Held>& held, bool isPlane) {
  std::vector<TRectRgn> areas;
  areas.reserve(held.size());
  for (const Held& one : held) areas.push_back(one.area);
  return {std::move(areas), isPlane};
}

std::optional<std::size_t> Find(const AreaIndex& index, const Coordinates& position,
                                double margin) {
  const auto found = index.First(position.north, position.east);
  if (found || margin == 0) return found;
  return index.First(position.north, position.east, margin);
}

/// The grid for a position; null when there is none.
/// \throws NotTransformable when it cannot be used
const ResidualGrid* GridAt(const AreaIndex& index, const std::vector<ResidualGrid>& grids,
                           const Coordinates& position, double margin) {
  const auto found = Find(index, position, margin);
  if (!found) return nullptr;
  const ResidualGrid& grid = grids[*found];
  if (!grid.problem.empty()) {
    throw NotTransformable("the residual grid of " + Printable(grid.entry) +
                           " cannot be used: " + grid.problem);
  }
  return &grid;
}

/// Longitudes by the shorter way.
double TurnedEast(double east, bool isPlane) {
  return isPlane ? east : std::remainder(east, 2 * kPi);
}

}  // namespace

Transformation::Transformation(Definition definition)
    : definition_(std::move(definition)),
      areas_(IndexOf(definition_.areas, false)),
      grids_(IndexOf(definition_.grids, false)),
      planeGrids_(IndexOf(definition_.planeGrids, true)),
      prepared_(definition_.shifts.size()) {}

Transformed Transformation::Forward(const Coordinates& source) {
  const DatumArea* const area = FindArea(source, 0);
  if (!area) throw NotTransformable(kOutside);
  const Transformed position = Apply(source, *area, 0);
  Note(position);
  return position;
}

Transformed Transformation::Inverse(const Coordinates& target) {
  std::optional<Transformed> found = Reverse(target, 0);
  // On an edge, where rounding takes a position in and out again.
  if (!found) found = Reverse(target, kEdge);
  if (!found) throw NotTransformable("its reverse is not found by iteration");
  Note(*found);
  return *found;
}

std::optional<Transformed> Transformation::Reverse(const Coordinates& target, double margin) {
  constexpr int kMostSteps = 10;
  constexpr double kSameAngle = 1e-12;  // radians
  constexpr double kSameLength = 1e-5;  // metres
  const bool isPlane = definition_.projection.has_value();
  const double same = isPlane ? kSameLength : kSameAngle;
  Coordinates aim = target;
  const DatumArea* area = &AreaNear(target);
  for (int step = 0; step < kMostSteps; ++step) {
    const Coordinates source = Back(aim, *area);
    area = FindArea(source, margin);
    if (!area) break;
    const Transformed reached = Apply(source, *area, margin);
    const Coordinates& at = isPlane ? *reached.plane : reached.target;
    const Coordinates missed = {target.north - at.north, TurnedEast(target.east - at.east, isPlane),
                                target.height - at.height};
    if (std::abs(missed.north) < same && std::abs(missed.east) < same &&
        std::abs(missed.height) < kSameLength) {
      return reached;
    }
    aim.north += missed.north;
    aim.east += missed.east;
    aim.height += missed.height;
  }
  if (!area && margin > 0) throw NotTransformable(kOutside);
  return std::nullopt;
}

const Transformation::Operations& Transformation::OperationsOf(const DatumArea& area) {
  if (!area.shift) {
    throw NotTransformable(Printable(area.entry) +
                           " cannot be used: a value is missing or of another kind");
  }
  Prepared& prepared = prepared_[*area.shift];
  if (!prepared.operations && prepared.refused.empty()) {
    const DatumShift& shift = definition_.shifts[*area.shift];
    std::string entry = area.entry;
    try {
      Operations operations{ProjOperation(context_, DatumSteps(shift)), std::nullopt};
      if (definition_.projection) {
        entry = definition_.projection->entry;
        operations.projection.emplace(context_,
                                      ProjectionSteps(*definition_.projection, shift.targetAxes));
      }
      prepared.operations = std::move(operations);
    } catch (const NotTransformable& refused) {
      prepared.refused = Printable(entry) + " cannot be used: " + refused.what();
    }
  }
  if (!prepared.operations) throw NotTransformable(prepared.refused);
  return *prepared.operations;
}

const DatumArea* Transformation::FindArea(const Coordinates& source, double margin) const {
  const auto found = Find(areas_, source, margin);
  return found ? &definition_.areas[*found] : nullptr;
}

const DatumArea& Transformation::AreaNear(const Coordinates& target) {
  Coordinates near = target;
  if (definition_.projection) {
    const auto usable = std::find_if(definition_.areas.begin(), definition_.areas.end(),
                                     [](const DatumArea& area) { return area.shift.has_value(); });
    if (usable == definition_.areas.end()) throw NotTransformable("no entry can be used");
    near = OperationsOf(*usable).projection->Inverse(target);
  }
  const DatumArea* const area = FindArea(near, kWholeShift);
  if (!area) throw NotTransformable(kOutside);
  return *area;
}

Transformed Transformation::Apply(const Coordinates& source, const DatumArea& area, double margin) {
  Transformed to{source, {}, std::nullopt};
  to.area = &area;
  const Operations& operations = OperationsOf(area);
  to.target = operations.datum.Forward(source);
  to.grid = GridAt(grids_, definition_.grids, source, margin);
  double heightResidual = 0;
  bool hasHeightResidual = false;
  const auto add = [&](const ResidualGrid* grid, const Coordinates& at, Coordinates& moved) {
    if (!grid) return;
    const Residuals residuals = Interpolate(*grid, at.north, at.east, grid == to.planeGrid);
    moved.north += residuals.north;
    moved.east += residuals.east;
    heightResidual += residuals.height;
    hasHeightResidual = hasHeightResidual || grid->vertShift;
  };
  add(to.grid, source, to.target);
  if (operations.projection) {
    to.plane = operations.projection->Forward(to.target);
    to.planeGrid = GridAt(planeGrids_, definition_.planeGrids, *to.plane, margin);
    add(to.planeGrid, Coordinates(*to.plane), *to.plane);
  }
  const std::uint32_t heightIndicator = definition_.shifts[*area.shift].heightIndicator;
  if (hasHeightResidual) {
    if (heightIndicator == kPhysicalOfSource) to.target.height = source.height;
    to.target.height += heightIndicator == kGeometricHeight ? heightResidual : -heightResidual;
  }
  to.lacksHeightResidual = !hasHeightResidual && heightIndicator != kGeometricHeight;
  if (to.plane) to.plane->height = to.target.height;
  return to;
}

Coordinates Transformation::Back(const Coordinates& aim, const DatumArea& area) {
  const Operations& operations = OperationsOf(area);
  const Coordinates target = operations.projection ? operations.projection->Inverse(aim) : aim;
  return operations.datum.Inverse(target);
}

void Transformation::Note(const Transformed& position) {
  const auto use = [this](Reading reading) { readings_.set(static_cast<std::size_t>(reading)); };
  const DatumShift& shift = definition_.shifts[*position.area->shift];
  if (shift.computationIndicator == kStrictHelmert) use(Reading::kStrictRotation);
  if (shift.computationIndicator == orx::cs::velta::kMolodenskiBadekas) {
    use(Reading::kRotationPoint);
  }
  const TRectRgn& area = position.area->area;
  const bool isWhole = area.northExtent >= kPi && area.eastExtent >= 2 * kPi;
  if (!isWhole) use(Reading::kWholeExtents);
  if (position.grid) use(Reading::kGridAtSource);
  if (position.planeGrid) use(Reading::kPlaneGrid);
  bool hasHeightResidual = false;
  for (const ResidualGrid* grid : {position.grid, position.planeGrid}) {
    if (!grid) continue;
    NoteGrid(*grid);
    hasHeightResidual = hasHeightResidual || grid->vertShift;
  }
  if (hasHeightResidual) {
    if (shift.heightIndicator == kGeometricHeight) use(Reading::kHeightCorrection);
    if (shift.heightIndicator == kPhysicalOfSource) use(Reading::kHeightOfSource);
  }
  if (position.plane && definition_.projection->type == ProjectionType::OS &&
      !IsPolar(*definition_.projection)) {
    use(Reading::kObliqueStereographic);
  }
}

void Transformation::NoteGrid(const ResidualGrid& grid) {
  const auto uses = [&grid](int method) {
    return (grid.horShift && grid.horInterpolation == method) ||
           (grid.vertShift && grid.vertInterpolation == method);
  };
  if (uses(kBiquadratic)) readings_.set(static_cast<std::size_t>(Reading::kParabolas));
  if (uses(kSpline)) readings_.set(static_cast<std::size_t>(Reading::kNaturalSpline));
}

}  // namespace velta_tool
