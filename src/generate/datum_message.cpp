// From a datum entry to the record of its 1021 or 1022.

#include "generate/make_record.h"
#include "records/message_units.h"
#include "records/truncation.h"
#include "store/gff_layout.h"
#include "store/stored_entries.h"
#include "velta/rtcm_generator.h"

namespace orx::cs::velta {
namespace {

constexpr std::uint32_t kMessage1021 = 21;
constexpr std::uint32_t kMessage1022 = 22;

std::uint32_t ExtentOf(double radians) {
  const std::uint32_t extent = ToUint32(radians / kTwoArcSeconds);
  return extent > kLargestExtent ? 0 : extent;
}

void SetArea(const projmath::TRectRgn& area, RtcmBasicTransformMessage& message) {
  message.phiV = ToInt32((area.south + area.northExtent * 0.5) / kTwoArcSeconds);
  message.lambdaV = ToInt32((area.west + area.eastExtent * 0.5) / kTwoArcSeconds);
  message.dPhiV = ExtentOf(area.northExtent);
  message.dLambdaV = ExtentOf(area.eastExtent);
}

void SetEllipsoids(const DatumData& datum, RtcmBasicTransformMessage& message) {
  const projmath::Ellipsoid& source = datum.sourceEllipsoid;
  const projmath::Ellipsoid& target = datum.targetEllipsoid;
  message.addAs = ToUint32((source.a - kSemiMajorAxisBase) / kAxisResolution);
  message.addBs = ToUint32((source.second - kSemiMinorAxisBase) / kAxisResolution);
  message.addAt = ToUint32((target.a - kSemiMajorAxisBase) / kAxisResolution);
  message.addBt = ToUint32((target.second - kSemiMinorAxisBase) / kAxisResolution);
}

void SetParameters(const double (&parameters)[13], RtcmBasicTransformMessage& message) {
  message.dX = ToInt32(parameters[0] / kTranslationResolution);
  message.dY = ToInt32(parameters[1] / kTranslationResolution);
  message.dZ = ToInt32(parameters[2] / kTranslationResolution);
  message.r1 = ToInt32(parameters[3] / kRotationResolution);
  message.r2 = ToInt32(parameters[4] / kRotationResolution);
  message.r3 = ToInt32(parameters[5] / kRotationResolution);
  message.dS = ToInt32(parameters[6] / kScaleResolution);
}

void SetRotationPoint(const double (&parameters)[13], Rtcm1022& message) {
  message.xp = ToInt64(parameters[7] / kTranslationResolution);
  message.yp = ToInt64(parameters[8] / kTranslationResolution);
  message.zp = ToInt64(parameters[9] / kTranslationResolution);
}

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
  SetArea(area, message);
  SetEllipsoids(datum, message);
  SetParameters(datum.parameters, message);
  message.computationIndicator = datum.computationIndicator;
  message.heightIndicator = datum.heightIndicator;
  SetNames(datum, message);
  if (datum.computationIndicator == kMolodenskiBadekas) {
    message.messageType = kMessage1022;
    SetRotationPoint(datum.parameters, message);
    return MakeRecord(message);
  }
  message.messageType = kMessage1021;
  return MakeRecord<RtcmBasicTransformMessage>(message);
}

}  // namespace

boost::shared_ptr<RtcmBasicTransformMessage> RTCMGenerator::getRtcmDatumMessage(
    double latitude, double longitude, double /*height*/) const {
  const TGenericRegistryKey container = OpenContainer(datumFile);
  for (TGenRegKeyIterator walk(container); walk;) {
    const TGenericRegistryKey standard =
        OpenExisting(TGenericRegistryKey(walk++), layout::kStandardDatum);
    projmath::TRectRgn area;
    if (!ReadValidityArea(standard, area)) return nullptr;
    if (!area.Inside(latitude, longitude, false)) continue;
    DatumData datum;
    if (!ReadTransformation(container, standard, datum)) return nullptr;
    return MakeMessage(area, datum, static_cast<std::uint32_t>(systemId));
  }
  return nullptr;
}

}  // namespace orx::cs::velta
