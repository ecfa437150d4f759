#pragma once

#include <string>
#include <string_view>

#include "rtcm3/export.h"
#include "rtcm3/field_error.h"
#include "rtcm3/message.h"

/// The codec: RTCM 3 streams to message records, and back.
namespace orx::cs::velta::rtcm3 {

/// What a payload turned out to be.
enum class Decoded {
  kMessage,     ///< one of the messages 1021 to 1027
  kCutMessage,  ///< one whose last field lacks less than a byte, the missing bits taken for 0
  kOther,       ///< a message of another number, or none at all
  kTooShort     ///< a message 1021 to 1027 that lacks more
};

/// Takes a frame's payload apart. What follows the last field is passed over, as the standard lets
/// messages grow.
///
/// The indicator of a datum message is a set of bits in the order in which they are sent: bit 0 of
/// the record is the first of them. A sender that numbers them from the other end announces with
/// bits that are reserved; when these alone are set, they are taken for what it means.
/// \param payload the bytes of the payload
/// \param message receives the message; without meaning unless the answer is kMessage or
///     kCutMessage
VELTA_RTCM3_EXPORT Decoded Decode(std::string_view payload, Message& message);

/// Appends a message as a frame.
/// \throws FieldError when a field does not fit its width, or an indicator has reserved bits alone,
///     which would be read as announcements; `out` is then unchanged
VELTA_RTCM3_EXPORT void Encode(const Message& message, std::string& out);

}  // namespace orx::cs::velta::rtcm3
