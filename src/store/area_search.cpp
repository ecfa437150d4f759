#include "store/area_search.h"

#include <cmath>
#include <numbers>
#include <string>
#include <vector>

#include "store/gff_layout.h"

namespace orx::cs::velta {
namespace {

constexpr double kFullTurn = 2.0 * std::numbers::pi;
constexpr double kHalfTurn = std::numbers::pi;

EntryArea ValidityArea() {
  constexpr bool kZeroIsTheWholeRange = true;
  return {ToUtf16(layout::kStandardDatum),
          ToUtf16(layout::kValidityArea.name),
          layout::kValidityArea.kBytes,
          {},
          kZeroIsTheWholeRange};
}

EntryArea GridArea(const layout::ResidualGrid& grid) {
  return {ToUtf16(grid.key),
          ToUtf16(grid.boundaries.name),
          grid.boundaries.kBytes,
          {ToUtf16(layout::kRows.name), ToUtf16(layout::kColumns.name)},
          false};
}

/// More than all rounding errors, of TRectRgn::Inside() and of this, of numbers up to this sum.
double SlackOf(double magnitudes) {
  constexpr double kLeast = 1e-9;  // radians: millimetres on the ground
  constexpr double kRelative = 1e-15;
  return kLeast + kRelative * magnitudes;
}

/// True when TRectRgn::Inside() could hold a position for some area within the bounds: a little too
/// often rather than not.
bool MayHold(const AreaBounds& bounds, double latitude, double longitude) {
  const auto& [low, high] = bounds;
  const double latitudeSlack = SlackOf(std::abs(low[0]) + std::abs(high[0]));
  const bool isAnyLatitude = high[0] - low[0] >= kHalfTurn - latitudeSlack;
  if (!isAnyLatitude && !(latitude >= low[0] && latitude <= high[0])) return false;
  const double slack = SlackOf(std::abs(low[1]) + std::abs(high[1]) + std::abs(longitude));
  const double extent = high[1] - low[1];
  if (!(extent < kFullTurn - slack)) return true;
  const double half = extent * 0.5;
  double fromMiddle = longitude - (low[1] + half);
  if (std::abs(fromMiddle) > kHalfTurn) fromMiddle = std::remainder(fromMiddle, kFullTurn);
  return std::abs(fromMiddle) <= half + slack;
}

}  // namespace

const EntryAreas& DatumAreas() {
  static const EntryAreas areas{ValidityArea(), GridArea(layout::kDatumGrid)};
  return areas;
}

const EntryAreas& ProjectionAreas() {
  static const EntryAreas areas{GridArea(layout::kProjectionGrid)};
  return areas;
}

TAreaWalk EntriesAround(const COrxStringT<wchar_t>& fileName, const SearchedArea& area,
                        double north, double east) {
  const auto mayHold = [north, east, isPlane = area.isPlane](const AreaBounds& bounds) {
    if (!isPlane) return MayHold(bounds, north, east);
    return north >= bounds.low[0] && north <= bounds.high[0] && east >= bounds.low[1] &&
           east <= bounds.high[1];
  };
  return {fileName, area.ofFile(), area.place, mayHold};
}

TAreaWalk AllEntries(const COrxStringT<wchar_t>& fileName, const SearchedArea& area) {
  return {fileName, area.ofFile(), area.place, [](const AreaBounds&) { return true; }};
}

}  // namespace orx::cs::velta
