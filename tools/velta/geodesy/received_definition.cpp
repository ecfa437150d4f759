#include "geodesy/received_definition.h"

#include <algorithm>
#include <optional>
#include <utility>

#include "conversion/datum_conversion.h"
#include "conversion/entry_name.h"
#include "conversion/grid_conversion.h"
#include "conversion/projection_conversion.h"
#include "entries.h"
#include "orxutils/orx_string.h"

namespace velta_tool {
namespace {

namespace velta = orx::cs::velta;
using orx::ToUtf8;

/// The first of the messages 1025, 1027 and 1026 that is there: the library takes them so.
std::optional<Projection> ProjectionIn(const velta::MsgUtilized& records) {
  const velta::Rtcm1024* const grid = records.msg1024;
  std::optional<Projection> projection;
  if (records.msg1025) {
    projection = ProjectionOf(*records.msg1025);
    projection->entry = ToUtf8(velta::ProjectionEntryName(*records.msg1025, grid));
  } else if (records.msg1027) {
    projection = ProjectionOf(*records.msg1027);
    projection->entry = ToUtf8(velta::ProjectionEntryName(*records.msg1027, grid));
  } else if (records.msg1026) {
    projection = ProjectionOf(*records.msg1026);
    const std::wstring name = velta::EntryName(records.msg1026->laFO, records.msg1026->loFO);
    projection->entry = ToUtf8(grid ? velta::WithGrid(name, grid->north0, grid->east0) : name);
  }
  return projection;
}

}  // namespace

void ReceivedDefinition::Add(const velta::rtcm3::MessageSet& set) {
  const velta::MsgUtilized records = set.Records();
  const velta::RtcmBasicTransformMessage& message = BasicMessage(records);
  const std::string entry = ToUtf8(velta::DatumEntryName(message, records.msg1023));
  const velta::DatumData datum = DatumOf(records);
  AddArea(message, datum, entry);
  if (std::find(targets_.begin(), targets_.end(), message.targetName) == targets_.end()) {
    targets_.push_back(message.targetName);
  }
  if (records.msg1023) AddGrid(MakeGrid(entry, datum.grid), grids_, definition_.grids);
  const std::optional<Projection> projection = ProjectionIn(records);
  if (!projection) return;
  AddProjection(*projection);
  if (records.msg1024) {
    velta::TableData table;
    velta::ConvertPlaneGrid(table, *records.msg1024);
    AddGrid(MakeGrid(projection->entry, table), planeGrids_, definition_.planeGrids);
  }
}

void ReceivedDefinition::AddArea(const velta::RtcmBasicTransformMessage& message,
                                 const velta::DatumData& datum, const std::string& entry) {
  definition_.sourceName = ToUtf8(datum.sourceDatumName);
  definition_.targetName = ToUtf8(datum.targetDatumName);
  const double(&area)[4] = datum.validityArea;
  const std::size_t shift = AddShift(datum, definition_.shifts);
  const DatumArea received{entry, {area[0], area[1], area[2], area[3]}, shift};
  const auto [known, isNew] =
      areas_.try_emplace(ToUtf8(velta::DatumEntryName(message, nullptr)), definition_.areas.size());
  if (isNew) {
    definition_.areas.push_back(received);
    return;
  }
  DatumArea& before = definition_.areas[known->second];
  const bool isSame = before.shift == shift &&
                      before.area.northExtent == received.area.northExtent &&
                      before.area.eastExtent == received.area.eastExtent;
  if (isSame) return;
  before = received;
  ++changes_;
}

void ReceivedDefinition::AddGrid(ResidualGrid grid, std::map<std::string, std::size_t>& known,
                                 std::vector<ResidualGrid>& grids) {
  const auto [place, isNew] = known.try_emplace(grid.entry, grids.size());
  if (isNew) {
    grids.push_back(std::move(grid));
    return;
  }
  ResidualGrid& before = grids[place->second];
  const bool isSame =
      before.north == grid.north && before.east == grid.east && before.height == grid.height;
  if (!isSame) ++changes_;
  before = std::move(grid);
}

void ReceivedDefinition::AddProjection(Projection projection) {
  std::optional<Projection>& held = definition_.projection;
  if (held) {
    projection.entry = held->entry;  // that of the first
    if (projection != *held) ++changes_;
  }
  held = std::move(projection);
}

}  // namespace velta_tool
