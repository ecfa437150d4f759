#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <variant>
#include <vector>

#include "rtcm3/export.h"
#include "velta/rtcm_messages.h"

namespace orx::cs::velta::rtcm3 {

/// Any of the messages 1021 to 1027, in the order of their numbers.
using Message = std::variant<Rtcm1021, Rtcm1022, Rtcm1023, Rtcm1024, Rtcm1025, Rtcm1026, Rtcm1027>;

inline constexpr unsigned kFirstMessage = 1021;                             ///< the lowest number
inline constexpr std::size_t kMessageTypes = std::variant_size_v<Message>;  ///< how many numbers

/// The number that a message is known by, 1021 to 1027.
inline unsigned NumberOf(const Message& message) {
  return kFirstMessage + static_cast<unsigned>(message.index());
}

/// System Identification Number of a message.
VELTA_RTCM3_EXPORT std::uint32_t SystemIdOf(const Message& message);

/// Makes `message` an empty message of a number, with its `messageType` set.
/// \return false, and nothing done, for a number outside 1021 to 1027
VELTA_RTCM3_EXPORT bool Reset(Message& message, std::uint64_t number);

/// The message that a record stands for, told by its `messageType`; a 1021 may be a plain
/// RtcmBasicTransformMessage. What RTCMGenerator answers becomes a message so.
/// \throws std::invalid_argument for a type that is none of 21 to 25 and 27, and for a record that
///     is not of the class that its type says
VELTA_RTCM3_EXPORT Message FromRecord(const RtcmMessage& record);

/// The names of the fields in which two messages differ, in the order in which they travel;
/// "message" alone when they are of different numbers, nothing when they say the same.
VELTA_RTCM3_EXPORT std::vector<std::string> DifferingFields(const Message& a, const Message& b);

/// True for a 1025 or 1027 whose scale field is 0, which by its definition is a scale of 0.993: a
/// sender that fills in nothing, most likely. Types without a scale have a 0 there by right.
VELTA_RTCM3_EXPORT bool HasUnlikelyScale(const Message& message);

}  // namespace orx::cs::velta::rtcm3
