// From a message set to its datum and its projection.

#include "velta/rtcm_data_support.h"

namespace orx::cs::velta {

UtilizedMsgInfo& RTCMDataSupport::GetUtilizedMessageInfo(RtcmBasicTransformMessage& message) {
  msgUtilized = MsgUtilized();
  UtilizedMsgInfo& info = msgUtilized.info;
  info.systemId = static_cast<std::int32_t>(message.systemId);
  unsigned number = kFirstAnnounced;
  for (const auto flag : kMessageFlags) {
    info.*flag = (message.utilizedMsgIndicator & AnnouncementBit(number++)) != 0;
  }
  return info;
}

ResultCode RTCMDataSupport::ParseRTCMMEssages(MsgUtilized& messages) {
  msgUtilized = messages;
  const UtilizedMsgInfo& info = messages.info;
  if (!messages.msg1021 && !messages.msg1022) return kNoDatumMessage;
  if (info.use1023 && !messages.msg1023) return kMissing1023;
  const Rtcm1023* const datumGrid = info.use1023 ? messages.msg1023 : nullptr;
  ResultCode result = kSuccess;
  bool isNamed = false;
  if (messages.msg1021) {
    result = ParseDatumMessages(*messages.msg1021, datumGrid);
    isNamed = !messages.msg1021->targetName.empty();
  }
  if (messages.msg1022) {
    result = ParseDatumMessages(*messages.msg1022, datumGrid);
    isNamed = !messages.msg1022->targetName.empty();
  }
  if (result != kSuccess) return result;
  if (!isNamed) return kNoDatumName;

  // A projection is named after the datum that has just been ingested.
  if (!info.use1025 && !info.use1027) return result;
  // All of them are there before the first is taken.
  if (info.use1024 && !messages.msg1024) return kMissingProjectionPart;
  if (info.use1025 && !messages.msg1025) return kMissingProjectionPart;
  if (info.use1027 && !messages.msg1027) return kMissingProjectionPart;
  const Rtcm1024* const planeGrid = info.use1024 ? messages.msg1024 : nullptr;
  if (info.use1025) result = ParseProjectionMessages(*messages.msg1025, planeGrid);
  if (info.use1027) result = ParseProjectionMessages(*messages.msg1027, planeGrid);
  return result;
}

}  // namespace orx::cs::velta
