#include "entries.h"

#include <algorithm>
#include <boost/thread/lock_types.hpp>

#include "conversion/datum_conversion.h"
#include "conversion/grid_conversion.h"
#include "conversion/projection_conversion.h"
#include "conversion/projection_types.h"
#include "files.h"
#include "orxutils/file_error.h"
#include "orxutils/orx_string.h"
#include "store/area_search.h"
#include "store/gff_layout.h"
#include "store/key_values.h"
#include "store/registry_tree.h"
#include "store/residual_grid.h"
#include "store/stored_entries.h"
#include "velta/rtcm_data_support.h"

namespace velta_tool {
namespace {

namespace velta = orx::cs::velta;
namespace layout = velta::layout;
using orx::TGenericRegistryKey;
using orx::cs::projmath::TRectRgn;
using velta::DatumData;
using velta::RTCMDataSupport;

std::optional<Description> DescribeDatum(const TGenericRegistryKey& container,
                                         const TGenericRegistryKey& entry) {
  DatumData datum;
  if (!velta::ReadDatum(container, entry, datum)) return std::nullopt;
  return Describe(datum);
}

std::optional<Description> DescribeProjection(const TGenericRegistryKey& entry) {
  const TGenericRegistryKey standard = velta::OpenExisting(entry, layout::kStandardProjection);
  const TGenericRegistryKey gridKey = velta::OpenExisting(entry, layout::kProjectionGrid.key);
  StoredProjection projection;
  velta::StoredGrid grid;
  const bool isComplete =
      velta::Read(standard, layout::kProjectionType, projection.type) &&
      velta::Read(standard, layout::kDatumName, projection.datumName) &&
      velta::Read(standard, layout::kEllipsoid, projection.axes) &&
      velta::Read(standard, layout::kProjectionParameters, projection.parameters) &&
      velta::ReadGridArea(gridKey, layout::kProjectionGrid, grid) &&
      velta::ReadGridValues(gridKey, grid);
  if (!isComplete) return std::nullopt;
  projection.grid = grid.table;
  return Describe(projection);
}

bool ReadArea(const TGenericRegistryKey& entry, TRectRgn& area) {
  return velta::ReadValidityArea(velta::OpenExisting(entry, layout::kStandardDatum), area);
}

bool ReadGridArea(const layout::ResidualGrid& layout, const TGenericRegistryKey& entry,
                  TRectRgn& area) {
  velta::StoredGrid grid;
  if (!velta::ReadGridArea(velta::OpenExisting(entry, layout.key), layout, grid)) return false;
  area = velta::AreaOf(grid);
  return true;
}

const layout::ResidualGrid& GridLayoutOf(FileKind kind) {
  return kind == FileKind::kDatum ? layout::kDatumGrid : layout::kProjectionGrid;
}

Entry ReadEntry(FileKind kind, const TGenericRegistryKey& container,
                const TGenericRegistryKey& key) {
  Entry entry;
  entry.name = orx::ToUtf8(key.GetName());
  entry.content =
      kind == FileKind::kDatum ? DescribeDatum(container, key) : DescribeProjection(key);
  TRectRgn area;
  if (ReadArea(key, area)) entry.area = area;
  if (ReadGridArea(GridLayoutOf(kind), key, area)) entry.gridArea = area;
  return entry;
}

/// \param projection has what does not depend on the message
template <class Message>
void AddProjection(const Message& message, const velta::Rtcm1024* grid, std::uint32_t typeCode,
                   StoredProjection projection, std::vector<ReceivedEntry>& entries) {
  const velta::ProjectionType* const type = velta::FindProjectionType(static_cast<int>(typeCode));
  if (!type) return;
  projection.type = type->name;
  const std::vector<double> parameters = velta::ParametersOf(message);
  std::copy(parameters.begin(), parameters.end(), projection.parameters);
  entries.push_back({message.messageType + 1000, velta::ProjectionEntryName(message, grid),
                     Describe(projection)});
}

/// Where the entry for a message is looked for.
const velta::SearchedArea& SearchedFor(unsigned message) {
  if (message == 1021) return velta::kSearchedValidity;
  return message == 1023 ? velta::kSearchedDatumGrid : velta::kSearchedProjectionGrid;
}

}  // namespace

Entries ReadEntries(const std::string& file) {
  const FileKind kind = KindOf(file);
  orx::ForgetFileError();
  const orx::TInFileKey tree(ToWide(file), nullptr, nullptr, true, orx::kRegistryFlags);
  const TGenericRegistryKey container = velta::ContainerOf(tree);
  Entries found;
  found.name = orx::ToUtf8(container.GetName());
  for (orx::TGenRegKeyIterator walk(container); walk;) {
    const TGenericRegistryKey entry(walk++);
    found.entries.push_back(ReadEntry(kind, container, entry));
  }
  // Damage inside a key shows when it is looked into.
  found.error = ErrorStateText(tree.GetErrorState(), orx::KeptFileError());
  return found;
}

std::string UsedFor(unsigned message, const std::string& file, const Position& position) {
  const auto areaOf = [&](const TGenericRegistryKey& entry, TRectRgn& area) {
    return message == 1021 ? ReadArea(entry, area)
                           : ReadGridArea(GridLayoutOf(KindOf(file)), entry, area);
  };
  const velta::SearchedArea& searched = SearchedFor(message);
  const auto& [north, east] = position;
  orx::TAreaWalk walk = message == 1025 ? velta::AllEntries(ToWide(file), searched)
                                        : velta::EntriesAround(ToWide(file), searched, north, east);
  const TGenericRegistryKey entry =
      message == 1025 ? walk.Next()
                      : velta::FirstHolding(walk, north, east, searched.isPlane, areaOf);
  return orx::ToUtf8(entry.GetName());
}

bool HoldsOtherKind(const std::string& file) {
  const bool isDatum = KindOf(file) == FileKind::kDatum;
  const orx::TInFileKey tree(ToWide(file), nullptr, nullptr, true, orx::kRegistryFlags);
  const TGenericRegistryKey container = velta::ContainerOf(tree);
  for (orx::TGenRegKeyIterator walk(container); walk;) {
    const TGenericRegistryKey entry(walk++);
    if (entry.HasKey(isDatum ? layout::kStandardProjection : layout::kStandardDatum)) return true;
  }
  return false;
}

const velta::RtcmBasicTransformMessage& BasicMessage(const velta::MsgUtilized& set) {
  if (set.msg1021) return *set.msg1021;
  return *set.msg1022;
}

velta::DatumData DatumOf(const velta::MsgUtilized& set) {
  const velta::RtcmBasicTransformMessage& message = BasicMessage(set);
  DatumData datum;
  datum.targetDatumName = velta::CleanDatumName(message.targetName);
  datum.sourceDatumName = velta::NormaliseSourceName(message.sourceName);
  velta::ConvertEllipsoids(message, datum);
  datum.computationIndicator = message.computationIndicator;
  datum.heightIndicator = message.heightIndicator;
  velta::ConvertParameters(message, datum);
  if (set.msg1022) velta::ConvertRotationPoint(*set.msg1022, datum);
  velta::ConvertValidityArea(message, datum);
  if (set.msg1023) velta::ConvertEllipsoidalGrid(*set.msg1023, datum.grid);
  return datum;
}

ReceivedEntry ReceivedDatum(const velta::MsgUtilized& set) {
  const velta::RtcmBasicTransformMessage& message = BasicMessage(set);
  return {message.messageType + 1000, velta::DatumEntryName(message, set.msg1023),
          Describe(DatumOf(set))};
}

std::vector<ReceivedEntry> ReceivedProjections(const velta::MsgUtilized& set) {
  const velta::RtcmBasicTransformMessage& message = BasicMessage(set);
  DatumData datum;
  velta::ConvertEllipsoids(message, datum);
  StoredProjection projection;
  projection.datumName = velta::CleanDatumName(message.targetName);
  projection.axes[0] = datum.targetEllipsoid.a;
  projection.axes[1] = datum.targetEllipsoid.second;
  if (set.msg1024) velta::ConvertPlaneGrid(projection.grid, *set.msg1024);
  std::vector<ReceivedEntry> entries;
  if (set.msg1025) {
    AddProjection(*set.msg1025, set.msg1024, set.msg1025->projectionType, projection, entries);
  }
  if (set.msg1027) {
    AddProjection(*set.msg1027, set.msg1024, velta::TypeCodeOf(*set.msg1027), projection, entries);
  }
  return entries;
}

std::optional<Entry> FindEntry(const std::wstring& file, const std::wstring& name) {
  const FileKind kind = KindOf(orx::ToUtf8(file));
  const bool isDatum = kind == FileKind::kDatum;
  const auto obtain = isDatum ? &RTCMDataSupport::GetUnlockedPtrDatumGFF
                              : &RTCMDataSupport::GetUnlockedPtrProjectionGFF;
  const auto giveBack =
      isDatum ? &RTCMDataSupport::ReleasePtrDatumGFF : &RTCMDataSupport::ReleasePtrProjectionGFF;
  orx::TCSInFileKey* tree = nullptr;
  const velta::ResultCode result = obtain(file, &tree);
  std::optional<Entry> found;
  if (result == velta::kSuccess && tree) {
    const boost::unique_lock<boost::recursive_mutex> lock(tree->GetMutex());
    const TGenericRegistryKey container = velta::ContainerOf(*tree);
    const TGenericRegistryKey entry = velta::OpenExisting(container, name);
    if (!entry.IsNull()) found = ReadEntry(kind, container, entry);
  }
  giveBack(file);
  return found;
}

}  // namespace velta_tool
