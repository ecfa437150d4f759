#include "velta/rtcm_generator.h"

#include <utility>

#include "conversion/projection_types.h"
#include "store/gff_layout.h"
#include "store/stored_entries.h"

namespace orx::cs::velta {
namespace {

/// How many of the keys may be datum entries: those with the largest value that all have, so that
/// no small file makes room for many.
std::size_t CountEntries(const TGenericRegistryKey& container) {
  std::size_t count = 0;
  ShapeMemory memory;
  for (TGenRegKeyIterator walk(container); walk;) {
    memory.GoTo(TGenericRegistryKey(walk++));
    const StoredKey standard(memory, layout::kStandardDatum);
    const StoredValue parameters = standard.Find(layout::kDatumParameters.name);
    if (parameters.bytes == layout::kDatumParameters.kBytes) ++count;
  }
  return count;
}

}  // namespace

RTCMGenerator::RTCMGenerator(std::int32_t id, const COrxStringT<wchar_t>& datumFileName,
                             const COrxStringT<wchar_t>& projFileName)
    : systemId_(id), datumFile_(datumFileName), projFile_(projFileName) {}

RTCMGenerator::RTCMGenerator(const RTCMGenerator& other) = default;

RTCMGenerator& RTCMGenerator::operator=(const RTCMGenerator& other) = default;

RTCMGenerator::~RTCMGenerator() = default;

std::vector<DatumData, orx_dl_allocator<DatumData>> RTCMGenerator::getAllDatums() const {
  std::vector<DatumData, orx_dl_allocator<DatumData>> datums;
  const TGenericRegistryKey container = OpenContainer(datumFile_);
  datums.reserve(CountEntries(container));
  ShapeMemory memory;
  for (TGenRegKeyIterator walk(container); walk;) {
    memory.GoTo(TGenericRegistryKey(walk++));
    DatumData datum;
    if (ReadDatum(container, StoredKey(memory), datum)) datums.push_back(std::move(datum));
  }
  return datums;
}

ProjectionData::projList RTCMGenerator::getRtcmPrjTypeFromString(const COrxStringT<wchar_t>& type) {
  return FirstCodeOf(type);
}

COrxStringT<wchar_t> RTCMGenerator::datumFileName() const { return datumFile_; }

COrxStringT<wchar_t> RTCMGenerator::projFileName() const { return projFile_; }

void RTCMGenerator::setDatumFileName(const COrxStringT<wchar_t>& name) { datumFile_ = name; }

void RTCMGenerator::setProjFileName(const COrxStringT<wchar_t>& name) { projFile_ = name; }

}  // namespace orx::cs::velta
