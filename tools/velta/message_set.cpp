#include "message_set.h"

#include <variant>

namespace velta_tool {
namespace {

using orx::cs::velta::MsgUtilized;
using orx::cs::velta::RtcmBasicTransformMessage;
using orx::cs::velta::RTCMDataSupport;
using orx::cs::velta::UtilizedMsgInfo;

constexpr unsigned kFirstAnnounced = 1023;
constexpr unsigned kUnsupported = 1026;
/// The flags of the messages 1023 to 1027.
constexpr bool UtilizedMsgInfo::*kFlags[] = {&UtilizedMsgInfo::use1023, &UtilizedMsgInfo::use1024,
                                             &UtilizedMsgInfo::use1025, &UtilizedMsgInfo::use1026,
                                             &UtilizedMsgInfo::use1027};

std::size_t IndexOf(unsigned number) { return number - rtcm3::kFirstMessage; }

}  // namespace

void MessageSet::Put(const rtcm3::Message& message, RTCMDataSupport& support) {
  messages_[message.index()] = message;
  announced_ = {};
  for (auto& slot : messages_) {
    if (!slot) continue;
    std::visit(
        [this, &support](auto& record) {
          if constexpr (std::is_base_of_v<RtcmBasicTransformMessage,
                                          std::decay_t<decltype(record)>>) {
            const UtilizedMsgInfo& info = support.GetUtilizedMessageInfo(record);
            for (const auto flag : kFlags) announced_.*flag |= info.*flag;
            announced_.systemId = info.systemId;
          }
        },
        *slot);
  }
}

std::vector<std::string> MessageSet::Missing() const {
  std::vector<std::string> missing;
  if (!Has(1021) && !Has(1022)) missing.emplace_back("1021 or 1022");
  for (unsigned i = 0; i < std::size(kFlags); ++i) {
    const unsigned number = kFirstAnnounced + i;
    if (announced_.*kFlags[i] && !Has(number) && number != kUnsupported) {
      missing.push_back(std::to_string(number));
    }
  }
  return missing;
}

bool MessageSet::Has(unsigned number) const { return messages_[IndexOf(number)].has_value(); }

bool MessageSet::Announces(unsigned number) const {
  return announced_.*kFlags[number - kFirstAnnounced];
}

template <class Record>
const Record* MessageSet::Find() const {
  for (const auto& slot : messages_) {
    if (slot && std::holds_alternative<Record>(*slot)) return &std::get<Record>(*slot);
  }
  return nullptr;
}

MsgUtilized MessageSet::Records() const {
  MsgUtilized records;
  records.msg1021 = Find<rtcm3::Rtcm1021>();
  records.msg1022 = Find<rtcm3::Rtcm1022>();
  records.msg1023 = Find<rtcm3::Rtcm1023>();
  records.msg1024 = Find<rtcm3::Rtcm1024>();
  records.msg1025 = Find<rtcm3::Rtcm1025>();
  records.msg1026 = Find<rtcm3::Rtcm1026>();
  records.msg1027 = Find<rtcm3::Rtcm1027>();
  records.info = announced_;
  return records;
}

}  // namespace velta_tool
