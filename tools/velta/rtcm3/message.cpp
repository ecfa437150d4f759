#include "rtcm3/message.h"

#include <stdexcept>
#include <string>
#include <utility>

namespace velta_tool::rtcm3 {
namespace {

/// A message's type is its number less this.
constexpr unsigned kTypeBase = 1000;

template <std::size_t Index>
void Emplace(Message& message) {
  message.emplace<Index>().messageType = kFirstMessage + Index - kTypeBase;
}

template <std::size_t... Index>
void EmplaceAt(Message& message, std::size_t index, std::index_sequence<Index...>) {
  ((Index == index ? Emplace<Index>(message) : void()), ...);
}

}  // namespace

bool Reset(Message& message, std::uint64_t number) {
  if (number < kFirstMessage || number >= kFirstMessage + kMessageTypes) return false;
  const auto index = static_cast<std::size_t>(number - kFirstMessage);
  EmplaceAt(message, index, std::make_index_sequence<kMessageTypes>());
  return true;
}

Message FromRecord(const orx::cs::velta::RtcmMessage& record) {
  using orx::cs::velta::RtcmBasicTransformMessage;
  switch (record.messageType + kTypeBase) {
    case 1021: {
      Rtcm1021 message;
      static_cast<RtcmBasicTransformMessage&>(message) =
          static_cast<const RtcmBasicTransformMessage&>(record);
      return message;
    }
    case 1022:
      return static_cast<const Rtcm1022&>(record);
    case 1023:
      return static_cast<const Rtcm1023&>(record);
    case 1024:
      return static_cast<const Rtcm1024&>(record);
    case 1025:
      return static_cast<const Rtcm1025&>(record);
    case 1027:
      return static_cast<const Rtcm1027&>(record);
    default:
      throw std::invalid_argument("no message of type " + std::to_string(record.messageType));
  }
}

std::uint32_t SystemIdOf(const Message& message) {
  return std::visit([](const auto& record) { return record.systemId; }, message);
}

}  // namespace velta_tool::rtcm3
