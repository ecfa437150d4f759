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

// Metres.
/// By which a position may lie outside the area or the grid that its reverse was found with: more
/// than what the iteration leaves, less than anybody would notice.
constexpr double kEdge = 1e-4;
/// More than the translations and the scale of a message together, and more than any horizontal
/// residual.
constexpr double kMostShift = 20000;
constexpr double kMostResidual = 6;

constexpr const char* kOutside = "no area holds the position";

/// \return null when there is none
template <class Held>
const Held* FirstOf(const AreaIndex& index, const std::vector<Held>& held,
                    const Coordinates& position) {
  const auto found = index.First(position.north, position.east);
  return found ? &held[*found] : nullptr;
}

/// The first of those that hold a position which a condition is true of; on an edge the position is
/// in all that meet there.
/// \return null when there is none
template <class Held, class Condition>
const Held* FirstAround(const AreaIndex& index, const std::vector<Held>& held,
                        const Coordinates& position, const Condition& condition) {
  const auto surely = index.First(position.north, position.east, -kEdge);
  for (const std::size_t number : index.All(position.north, position.east, kEdge)) {
    if (surely && number > *surely) break;
    if (condition(held[number])) return &held[number];
  }
  return nullptr;
}

/// \param grid may be null
/// \throws NotTransformable when it cannot be used
void RequireUsable(const ResidualGrid* grid) {
  if (!grid || grid->problem.empty()) return;
  throw NotTransformable("the residual grid of " + Printable(grid->entry) +
                         " cannot be used: " + grid->problem);
}

/// The grids that a position may be in once its residuals are known, in their order, and at last
/// none.
std::vector<const ResidualGrid*> GridsNear(const AreaIndex& index,
                                           const std::vector<ResidualGrid>& grids,
                                           const Coordinates& position) {
  std::vector<const ResidualGrid*> near;
  for (const std::size_t number : index.All(position.north, position.east, kMostResidual)) {
    near.push_back(&grids[number]);
  }
  near.push_back(nullptr);
  return near;
}

/// True when a position has the grid that was taken for it; null: none.
bool IsTaken(const AreaIndex& index, const std::vector<ResidualGrid>& grids,
             const ResidualGrid* grid, const Coordinates& position) {
  if (!grid) return !index.First(position.north, position.east, -kEdge);
  return FirstAround(index, grids, position,
                     [grid](const ResidualGrid& held) { return &held == grid; }) != nullptr;
}

}  // namespace

Transformation::Transformation(Definition definition)
    : definition_(std::move(definition)),
      areas_(IndexOf(definition_.areas, false)),
      grids_(IndexOf(definition_.grids, false)),
      planeGrids_(IndexOf(definition_.planeGrids, true)),
      prepared_(definition_.shifts.size()) {}

Transformed Transformation::Forward(const Coordinates& source) {
  const DatumArea* const area = FirstOf(areas_, definition_.areas, source);
  if (!area) throw NotTransformable(kOutside);
  const Transformed position = Apply(source, *area, FirstOf(grids_, definition_.grids, source));
  Note(position);
  return position;
}

Transformed Transformation::Inverse(const Coordinates& target) {
  const Coordinates near = Unprojected(target);
  std::string refused = kOutside;
  std::vector<std::optional<std::size_t>> tried;
  for (const std::size_t number : areas_.All(near.north, near.east, kMostShift)) {
    const DatumArea& area = definition_.areas[number];
    if (std::find(tried.begin(), tried.end(), area.shift) != tried.end()) continue;
    tried.push_back(area.shift);
    try {
      const std::optional<Transformed> found = ReverseIn(target, area);
      if (!found) continue;
      Note(*found);
      return *found;
    } catch (const NotTransformable& reason) {
      refused = reason.what();
    }
  }
  throw NotTransformable(refused);
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

Transformed Transformation::Apply(const Coordinates& source, const DatumArea& area,
                                  const ResidualGrid* grid,
                                  std::optional<const ResidualGrid*> planeGrid) {
  Transformed to{source, {}, std::nullopt};
  to.area = &area;
  to.grid = grid;
  RequireUsable(grid);
  const Operations& operations = OperationsOf(area);
  to.target = operations.datum.Forward(source);
  double heightResidual = 0;
  bool hasHeightResidual = false;
  const auto add = [&](const ResidualGrid* read, const Coordinates& at, Coordinates& moved) {
    if (!read) return;
    const Residuals residuals = Interpolate(*read, at.north, at.east, read == to.planeGrid);
    moved.north += residuals.north;
    moved.east += residuals.east;
    heightResidual += residuals.height;
    hasHeightResidual = hasHeightResidual || read->vertShift;
  };
  add(to.grid, source, to.target);
  if (std::abs(to.target.north) > kPi / 2) throw NotTransformable("it comes to lie beyond a pole");
  if (std::abs(to.target.east) > kPi) to.target.east = std::remainder(to.target.east, 2 * kPi);
  if (operations.projection) {
    to.plane = operations.projection->Forward(to.target);
    to.planeGrid = planeGrid ? *planeGrid : FirstOf(planeGrids_, definition_.planeGrids, *to.plane);
    RequireUsable(to.planeGrid);
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

Coordinates Transformation::Unprojected(const Coordinates& target) {
  if (!definition_.projection) return target;
  std::string refused = kOutside;
  for (const DatumArea& area : definition_.areas) {
    try {
      return OperationsOf(area).projection->Inverse(target);
    } catch (const NotTransformable& reason) {
      refused = reason.what();
    }
  }
  throw NotTransformable(refused);
}

Coordinates Transformation::Back(const Coordinates& target, const DatumArea& area) {
  const Operations& operations = OperationsOf(area);
  return operations.datum.Inverse(operations.projection ? operations.projection->Inverse(target)
                                                        : target);
}

std::optional<Transformed> Transformation::ReverseIn(const Coordinates& target,
                                                     const DatumArea& area) {
  const Coordinates guess = Back(target, area);
  bool isInArea = false;
  std::string refused = "its reverse is not found by iteration";
  for (const ResidualGrid* const grid : GridsNear(grids_, definition_.grids, guess)) {
    for (const ResidualGrid* const planeGrid :
         GridsNear(planeGrids_, definition_.planeGrids, target)) {
      std::optional<Transformed> reached;
      try {
        reached = Iterate(target, area, grid, planeGrid);
      } catch (const NotTransformable& reason) {
        refused = reason.what();
      }
      if (!reached) continue;
      const DatumArea* const holder =
          FirstAround(areas_, definition_.areas, reached->source,
                      [&area](const DatumArea& held) { return held.shift == area.shift; });
      if (!holder) continue;
      isInArea = true;
      if (!IsWhereItIsTaken(*reached)) continue;
      Transformed found = *reached;
      found.area = holder;
      return found;
    }
  }
  if (isInArea) throw NotTransformable(refused);
  return std::nullopt;
}

std::optional<Transformed> Transformation::Iterate(const Coordinates& target, const DatumArea& area,
                                                   const ResidualGrid* grid,
                                                   const ResidualGrid* planeGrid) {
  constexpr int kMostSteps = 10;
  constexpr double kSameAngle = 1e-12;  // radians
  constexpr double kSameLength = 1e-5;  // metres
  const bool isPlane = definition_.projection.has_value();
  const double same = isPlane ? kSameLength : kSameAngle;
  Coordinates aim = target;
  for (int step = 0; step < kMostSteps; ++step) {
    const Transformed reached = Apply(Back(aim, area), area, grid, planeGrid);
    const Coordinates& at = isPlane ? *reached.plane : reached.target;
    Coordinates missed = {target.north - at.north, target.east - at.east,
                          target.height - at.height};
    double eastWay = missed.east;
    if (!isPlane) {
      missed.east = std::remainder(missed.east, 2 * kPi);
      eastWay = missed.east * std::cos(target.north);
    }
    if (std::abs(missed.north) < same && std::abs(eastWay) < same &&
        std::abs(missed.height) < kSameLength) {
      return reached;
    }
    aim.north += missed.north;
    aim.east += missed.east;
    aim.height += missed.height;
  }
  return std::nullopt;
}

bool Transformation::IsWhereItIsTaken(const Transformed& reached) {
  if (!IsTaken(grids_, definition_.grids, reached.grid, reached.source)) return false;
  if (!reached.plane || definition_.planeGrids.empty()) return true;
  const Coordinates projected = OperationsOf(*reached.area).projection->Forward(reached.target);
  return IsTaken(planeGrids_, definition_.planeGrids, reached.planeGrid, projected);
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
  const bool isGridRead = position.grid && (position.grid->horShift || position.grid->vertShift);
  if (isGridRead) use(Reading::kGridAtSource);
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
