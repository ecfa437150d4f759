// From a datum entry to the record of its 1021 or 1022.

#include "conversion/datum_conversion.h"
#include "generate/make_record.h"
#include "store/area_search.h"
#include "store/gff_layout.h"
#include "store/stored_entries.h"
#include "velta/message_units.h"
#include "velta/rtcm_generator.h"

namespace orx::cs::velta {
namespace {

constexpr std::uint32_t kMessage1021 = 21;
constexpr std::uint32_t kMessage1022 = 22;

void SetNames(const DatumData& datum, RtcmBasicTransformMessage& message) {
  message.sourceName = Narrow(datum.sourceDatumName);
  message.sourceNameCounter = static_cast<std::uint32_t>(message.sourceName.size());
  message.targetName = Narrow(datum.targetDatumName);
  message.targetNameCounter = static_cast<std::uint32_t>(message.targetName.size());
}

boost::shared_ptr<RtcmBasicTransformMessage> MakeMessage(const projmath::TRectRgn& area,
                                                         const DatumData& datum,
                                                         std::uint32_t systemId) {
  if (datum.computationIndicator > kMolodenskiBadekas) return nullptr;
  Rtcm1022 message;
  message.systemId = systemId;
  ConvertValidityArea(area, message);
  ConvertEllipsoids(datum, message);
  ConvertParameters(datum, message);
  message.computationIndicator = datum.computationIndicator;
  message.heightIndicator = datum.heightIndicator;
  SetNames(datum, message);
  if (datum.computationIndicator == kMolodenskiBadekas) {
    message.messageType = kMessage1022;
    ConvertRotationPoint(datum, message);
    return MakeRecord(message);
  }
  message.messageType = kMessage1021;
  return MakeRecord<RtcmBasicTransformMessage>(message);
}

}  // namespace

boost::shared_ptr<RtcmBasicTransformMessage> RTCMGenerator::getRtcmDatumMessage(
    double latitude, double longitude, double /*height*/) const {
  TAreaWalk walk = EntriesAround(datumFile_, kSearchedValidity, latitude, longitude);
  ShapeMemory memory;
  const StoredKey standard(memory, layout::kStandardDatum);  // of the entry that is looked at
  projmath::TRectRgn area;
  const auto areaOf = [&](const TGenericRegistryKey& entry, projmath::TRectRgn& its) {
    memory.GoTo(entry);
    if (!ReadValidityArea(standard, its)) return false;
    area = its;
    return true;
  };
  if (FirstHolding(walk, latitude, longitude, false, areaOf).IsNull()) return nullptr;
  DatumData datum;
  if (!ReadTransformation(walk.Container(), standard, datum)) return nullptr;
  return MakeMessage(area, datum, static_cast<std::uint32_t>(systemId_));
}

}  // namespace orx::cs::velta
