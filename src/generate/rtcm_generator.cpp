#include "velta/rtcm_generator.h"

#include <utility>

#include "generate/stored_entries.h"
#include "records/projection_types.h"
#include "store/gff_layout.h"
#include "store/residual_grid.h"

namespace orx::cs::velta {
namespace {

bool ReadDatum(const TGenericRegistryKey& container, const TGenericRegistryKey& entry,
               DatumData& datum) {
  const TGenericRegistryKey standard = OpenExisting(entry, layout::kStandardDatum);
  projmath::TRectRgn area;
  if (!ReadValidityArea(standard, area)) return false;
  if (!ReadTransformation(container, standard, datum)) return false;
  const TGenericRegistryKey gridKey = OpenExisting(entry, layout::kDatumGrid.key);
  StoredGrid grid;
  if (!ReadGridArea(gridKey, layout::kDatumGrid, grid)) return false;
  if (!ReadGridValues(gridKey, grid)) return false;
  datum.validityArea[0] = area.south;
  datum.validityArea[1] = area.northExtent;
  datum.validityArea[2] = area.west;
  datum.validityArea[3] = area.eastExtent;
  datum.validityCentre[0] = area.south + area.northExtent * 0.5;
  datum.validityCentre[1] = area.west + area.eastExtent * 0.5;
  datum.grid = grid.table;
  return true;
}

/// Those of the keys that may be datum entries.
std::size_t CountEntries(const TGenericRegistryKey& container) {
  std::size_t count = 0;
  for (TGenRegKeyIterator walk(container); walk;) {
    const TGenericRegistryKey entry(walk++);
    if (entry.HasKey(layout::kStandardDatum) && entry.HasKey(layout::kDatumGrid.key)) ++count;
  }
  return count;
}

}  // namespace

RTCMGenerator::RTCMGenerator(std::int32_t id, const COrxStringT<wchar_t>& datumFileName,
                             const COrxStringT<wchar_t>& projFileName)
    : systemId(id), datumFile(datumFileName), projFile(projFileName) {}

RTCMGenerator::RTCMGenerator(const RTCMGenerator& other) = default;

RTCMGenerator& RTCMGenerator::operator=(const RTCMGenerator& other) = default;

RTCMGenerator::~RTCMGenerator() = default;

std::vector<DatumData, orx_dl_allocator<DatumData>> RTCMGenerator::getAllDatums() const {
  std::vector<DatumData, orx_dl_allocator<DatumData>> datums;
  const TGenericRegistryKey container = OpenContainer(datumFile);
  datums.reserve(CountEntries(container));
  for (TGenRegKeyIterator walk(container); walk;) {
    DatumData datum;
    if (ReadDatum(container, TGenericRegistryKey(walk++), datum)) {
      datums.push_back(std::move(datum));
    }
  }
  return datums;
}

ProjectionData::projList RTCMGenerator::getRtcmPrjTypeFromString(const COrxStringT<wchar_t>& type) {
  return FirstCodeOf(type);
}

COrxStringT<wchar_t> RTCMGenerator::datumFileName() const { return datumFile; }

COrxStringT<wchar_t> RTCMGenerator::projFileName() const { return projFile; }

void RTCMGenerator::setDatumFileName(const COrxStringT<wchar_t>& name) { datumFile = name; }

void RTCMGenerator::setProjFileName(const COrxStringT<wchar_t>& name) { projFile = name; }

}  // namespace orx::cs::velta
