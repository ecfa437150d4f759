// From a projection entry to the record of its 1025 or 1027.

#include "generate/make_record.h"
#include "records/message_units.h"
#include "records/projection_types.h"
#include "records/truncation.h"
#include "store/gff_layout.h"
#include "store/registry_tree.h"
#include "store/stored_entries.h"
#include "velta/rtcm_generator.h"

namespace orx::cs::velta {
namespace {

using Parameters = double[16];

std::int64_t Angle(double degrees) { return ToInt64(degrees / kProjectionAngleResolution); }
std::int64_t Length(double metres) { return ToInt64(metres / kProjectionLengthResolution); }
std::uint64_t UnsignedLength(double metres) {
  return ToUint64(metres / kProjectionLengthResolution);
}
double ScaleAddition(double factor) {
  return (factor / kPpm - kProjectionScaleBase) / kProjectionScaleResolution;
}

Rtcm1025 Make1025(ProjectionData::projList type, const Parameters& p) {
  Rtcm1025 message;
  message.projectionType = type;
  message.loNO = Angle(p[0]);
  const bool hasScale = HasScaleFactor(type);
  if (hasScale) message.addSNO = ToLow32(ScaleAddition(p[1]));
  const double* const rest = p + (hasScale ? 2 : 1);
  message.laNO = Angle(rest[0]);
  message.fe = UnsignedLength(rest[1]);
  message.fn = Length(rest[2]);
  return message;
}

Rtcm1027 Make1027(bool isRectified, const Parameters& p) {
  Rtcm1027 message;
  message.projectionType = ProjectionData::OM;
  message.rectificationFlag = isRectified;
  message.azIL = ToUint64(p[0] / kProjectionAngleResolution);
  message.addSIL = ToUint64(ScaleAddition(p[1]));
  message.loPC = Angle(p[2]);
  message.laPC = Angle(p[3]);
  message.epc = UnsignedLength(p[4]);
  message.npc = Length(p[5]);
  if (isRectified) message.diffARSG = ToInt32((p[6] - p[0]) / kProjectionAngleResolution);
  return message;
}

template <class Message>
boost::shared_ptr<RtcmMessage> Finish(Message message, std::int32_t systemId) {
  message.systemId = static_cast<std::uint32_t>(systemId);
  return MakeRecord(message);
}

}  // namespace

boost::shared_ptr<RtcmMessage> RTCMGenerator::getRtcmProjMessage() const {
  const TGenericRegistryKey entry = FirstSubKey(OpenContainer(projFile));
  const TGenericRegistryKey standard = OpenExisting(entry, layout::kStandardProjection);
  COrxStringT<wchar_t> typeName;
  if (!Read(standard, layout::kProjectionType, typeName)) return nullptr;
  Parameters parameters;
  if (!Read(standard, layout::kProjectionParameters, parameters)) return nullptr;
  const auto type = getRtcmPrjTypeFromString(typeName);
  if (type == ProjectionData::NONE) return nullptr;
  if (type == ProjectionData::OM || type == ProjectionData::ROM) {
    return Finish(Make1027(type == ProjectionData::ROM, parameters), systemId);
  }
  return Finish(Make1025(type, parameters), systemId);
}

}  // namespace orx::cs::velta
