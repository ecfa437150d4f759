#include "store/residual_grid.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <iterator>

#include "velta/message_units.h"
#include "velta/rtcm_messages.h"

namespace orx::cs::velta {
namespace {

constexpr int kWrittenRows = 4;
constexpr int kWrittenColumns = 4;

/// A flag or a code; of a code the low byte is stored.
template <class Stored, class Held>
struct Setting {
  ValueOf<Stored> value;
  Held TableData::*member;
};
constexpr Setting<bool, bool> kShifts[] = {
    {layout::kHorShift, &TableData::horShift},
    {layout::kVertShift, &TableData::vertShift},
};
constexpr Setting<signed char, std::int32_t> kInterpolations[] = {
    {layout::kHorInterpolation, &TableData::horInterpolation},
    {layout::kVertInterpolation, &TableData::vertInterpolation},
};

struct Residuals {
  DoublesOf<kResidualGridPoints> value;
  double (TableData::*member)[kResidualGridPoints];
};
constexpr Residuals kResiduals[] = {
    {layout::kNorthResiduals, &TableData::dNdLatData},
    {layout::kEastResiduals, &TableData::dEdLonData},
    {layout::kHeightResiduals, &TableData::dHData},
};

template <class Stored, class Held, std::size_t count>
bool AddSettings(TGenericRegistryKey& key, const Setting<Stored, Held> (&settings)[count],
                 const TableData& table) {
  return std::all_of(std::begin(settings), std::end(settings), [&](const auto& setting) {
    return Add(key, setting.value, static_cast<Stored>(table.*setting.member));
  });
}

/// \return false when a setting is missing or of another kind
template <class Stored, class Held, std::size_t count>
bool ReadSettings(const StoredKey& key, const Setting<Stored, Held> (&settings)[count],
                  TableData& table) {
  return std::all_of(std::begin(settings), std::end(settings), [&](const auto& setting) {
    Stored stored = {};
    if (!Read(key, setting.value, stored)) return false;
    table.*setting.member = stored;
    return true;
  });
}

/// The stored boundaries of a grid around a centre.
void FillBoundaries(const TableData& table, double (&boundaries)[6]) {
  const double northStep = table.bounds[4];
  const double eastStep = table.bounds[5];
  boundaries[0] = table.centerN - northStep * kGridSteps * 0.5;
  boundaries[1] = northStep * kGridSteps;
  boundaries[2] = table.centerE - eastStep * kGridSteps * 0.5;
  boundaries[3] = eastStep * kGridSteps;
  boundaries[4] = northStep;
  boundaries[5] = eastStep;
}

double StepOf(double extent, int count) {
  return extent / (count == 0 ? 0.0 : static_cast<double>(count) - 1.0);
}

}  // namespace

ResultCode WriteResidualGrid(const TGenericRegistryKey& entry, const layout::ResidualGrid& grid,
                             const TableData& table) {
  TGenericRegistryKey key(entry, grid.key, 0, true);
  double boundaries[6];
  FillBoundaries(table, boundaries);
  Add(key, layout::kRows, kWrittenRows);
  Add(key, layout::kColumns, kWrittenColumns);
  Add(key, grid.boundaries, boundaries);
  if (!AddSettings(key, kShifts, table)) return kEntryNotWritten;
  if (!AddSettings(key, kInterpolations, table)) return kEntryNotWritten;
  Add(key, layout::kMeans, table.meanValue);
  for (const Residuals& residuals : kResiduals) Add(key, residuals.value, table.*residuals.member);
  return kSuccess;
}

bool ReadGridArea(const StoredKey& gridKey, const layout::ResidualGrid& grid, StoredGrid& stored) {
  if (!ReadAny(gridKey, layout::kRows, stored.rows)) return false;
  if (!ReadAny(gridKey, layout::kColumns, stored.columns)) return false;
  double(&bounds)[6] = stored.table.bounds;
  if (!Read(gridKey, grid.boundaries, bounds)) return false;
  bounds[4] = StepOf(bounds[1], stored.rows);
  bounds[5] = StepOf(bounds[3], stored.columns);
  return true;
}

bool ReadGridValues(const StoredKey& gridKey, StoredGrid& stored) {
  if (stored.rows < 1 || stored.columns < 1) return false;
  const std::int64_t points = std::int64_t{stored.rows} * stored.columns;
  if (points > kResidualGridPoints) return false;
  TableData& table = stored.table;
  if (!ReadSettings(gridKey, kShifts, table)) return false;
  if (!ReadSettings(gridKey, kInterpolations, table)) return false;
  if (!Read(gridKey, layout::kMeans, table.meanValue)) return false;
  return std::all_of(std::begin(kResiduals), std::end(kResiduals), [&](const auto& residuals) {
    return ReadDoubles(gridKey, residuals.value.name, table.*residuals.member,
                       static_cast<std::size_t>(points));
  });
}

}  // namespace orx::cs::velta
