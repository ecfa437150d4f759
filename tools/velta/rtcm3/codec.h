#pragma once

#include <cstdint>
#include <span>
#include <string>

#include "rtcm3/message.h"

namespace velta_tool::rtcm3 {

/// What a payload turned out to be.
enum class Decoded {
  kMessage,  ///< one of the messages 1021 to 1027
  kOther,    ///< a message of another number, or none at all
  kTooShort  ///< a message 1021 to 1027 that ends before its last field
};

/// Takes a frame's payload apart. What follows the last field is passed over.
/// \param message receives the message; without meaning unless the answer is kMessage
Decoded Decode(std::span<const std::uint8_t> payload, Message& message);

/// Appends a message as a frame.
/// \throws FieldError when a field does not fit its width; `out` is then unchanged
void Encode(const Message& message, std::string& out);

}  // namespace velta_tool::rtcm3
