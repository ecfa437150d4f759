#pragma once

#include <cstddef>
#include <cstdint>
#include <variant>

#include "velta/rtcm_messages.h"

namespace velta_tool::rtcm3 {

using orx::cs::velta::Rtcm1021;
using orx::cs::velta::Rtcm1022;
using orx::cs::velta::Rtcm1023;
using orx::cs::velta::Rtcm1024;
using orx::cs::velta::Rtcm1025;
using orx::cs::velta::Rtcm1026;
using orx::cs::velta::Rtcm1027;

/// Any of the messages 1021 to 1027, in the order of their numbers.
using Message = std::variant<Rtcm1021, Rtcm1022, Rtcm1023, Rtcm1024, Rtcm1025, Rtcm1026, Rtcm1027>;

inline constexpr unsigned kFirstMessage = 1021;
inline constexpr std::size_t kMessageTypes = std::variant_size_v<Message>;

/// The number that a message is known by, 1021 to 1027.
inline unsigned NumberOf(const Message& message) {
  return kFirstMessage + static_cast<unsigned>(message.index());
}

/// Makes `message` an empty message of a number.
/// \return false, and nothing done, for a number outside 1021 to 1027
bool Reset(Message& message, std::uint64_t number);

/// The message that a record stands for, told by its `messageType`; a 1021 may be a plain
/// RtcmBasicTransformMessage.
/// \throws std::invalid_argument for a type that is none of 21 to 25 and 27
Message FromRecord(const orx::cs::velta::RtcmMessage& record);

/// System Identification Number of a message.
std::uint32_t SystemIdOf(const Message& message);

}  // namespace velta_tool::rtcm3
