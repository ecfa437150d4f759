// From a datum message to an entry of its datum's file.

#include "conversion/datum_conversion.h"
#include "conversion/grid_conversion.h"
#include "ingest/entry_file.h"
#include "velta/message_units.h"
#include "velta/rtcm_data_support.h"

namespace orx::cs::velta {

ResultCode RTCMDataSupport::ParseDatumMessages(const Rtcm1021& message, const Rtcm1023* grid) {
  return ParseDatum(message, nullptr, grid);
}

ResultCode RTCMDataSupport::ParseDatumMessages(const Rtcm1022& message, const Rtcm1023* grid) {
  if (message.computationIndicator != kMolodenskiBadekas) return kBadComputationIndicator;
  return ParseDatum(message, &message, grid);
}

ResultCode RTCMDataSupport::ParseDatum(const RtcmBasicTransformMessage& message,
                                       const Rtcm1022* rotationPoint, const Rtcm1023* grid) {
  datumEntryName.clear();
  if (grid) {
    ConvertEllipsoidalGrid(*grid, datum.grid);
  } else if (message.utilizedMsgIndicator & AnnouncementBit(1023)) {
    return kMissing1023;
  }
  datum.targetDatumName = CleanDatumName(message.targetName);
  datum.sourceDatumName = NormaliseSourceName(message.sourceName);
  SetRegionNameByPlateNumber(message.plateNumber);
  ConvertEllipsoids(message, datum);
  datum.computationIndicator = message.computationIndicator;
  ConvertParameters(message, datum);
  if (rotationPoint) ConvertRotationPoint(*rotationPoint, datum);
  if (datum.computationIndicator > kMolodenskiBadekas) return kBadComputationIndicator;
  ConvertValidityArea(message, datum);
  datum.heightIndicator = message.heightIndicator;
  datumEntryName = DatumEntryName(message, grid);

  // Before the file is obtained, so that no exception comes between that and giving it back.
  const COrxStringT<wchar_t> path = FileOf(kDatumFiles, datumPath, datum.targetDatumName);
  const ResultCode result = InitDatumGFF(datum);
  if (result != kSuccess) return result;
  return AddAndGiveBack(kDatumFiles, path, [this] { return AddDatumToGFF(datum); });
}

COrxStringT<wchar_t> RTCMDataSupport::SetRegionNameByPlateNumber(std::uint32_t plateNumber) {
  regionName = RegionOfPlate(plateNumber);
  return regionName;
}

}  // namespace orx::cs::velta
