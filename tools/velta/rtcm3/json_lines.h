#pragma once

#include <string>
#include <string_view>

#include "rtcm3/message.h"

namespace velta_tool::rtcm3 {

/// Appends a message as a JSON object on a line of its own: "message" with its number, then the
/// fields in the order in which they travel. Numbers are the integers of the message.
void AppendJsonLine(const Message& message, std::string& out);

/// Reads what AppendJsonLine writes, whatever the order of the fields.
/// \throws FieldError that says what is missing, unknown, of the wrong type or out of range
Message ParseJsonLine(std::string_view line);

}  // namespace velta_tool::rtcm3
