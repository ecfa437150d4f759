// From a projection entry to the record of its 1025 or 1027.

#include "conversion/projection_conversion.h"
#include "generate/make_record.h"
#include "store/area_search.h"
#include "store/gff_layout.h"
#include "velta/rtcm_generator.h"

namespace orx::cs::velta {
namespace {

using Parameters = double[16];

Rtcm1025 Make1025(ProjectionData::projList type, const Parameters& parameters) {
  Rtcm1025 message;
  message.projectionType = type;
  SetParameters(parameters, message);
  return message;
}

Rtcm1027 Make1027(bool isRectified, const Parameters& parameters) {
  Rtcm1027 message;
  message.projectionType = ProjectionData::OM;
  message.rectificationFlag = isRectified;
  SetParameters(parameters, message);
  return message;
}

template <class Message>
boost::shared_ptr<RtcmMessage> Finish(Message message, std::int32_t systemId) {
  message.systemId = static_cast<std::uint32_t>(systemId);
  return MakeRecord(message);
}

}  // namespace

boost::shared_ptr<RtcmMessage> RTCMGenerator::getRtcmProjMessage() const {
  const TGenericRegistryKey entry = AllEntries(projFile_, kSearchedProjectionGrid).Next();
  const TGenericRegistryKey standard = OpenExisting(entry, layout::kStandardProjection);
  COrxStringT<wchar_t> typeName;
  if (!Read(standard, layout::kProjectionType, typeName)) return nullptr;
  Parameters parameters;
  if (!Read(standard, layout::kProjectionParameters, parameters)) return nullptr;
  const auto type = getRtcmPrjTypeFromString(typeName);
  if (type == ProjectionData::NONE) return nullptr;
  if (type == ProjectionData::OM || type == ProjectionData::ROM) {
    return Finish(Make1027(type == ProjectionData::ROM, parameters), systemId_);
  }
  return Finish(Make1025(type, parameters), systemId_);
}

}  // namespace orx::cs::velta
