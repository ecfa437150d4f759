#pragma once

#include <string>
#include <string_view>

#include "rtcm3/export.h"
#include "rtcm3/field_error.h"
#include "rtcm3/message.h"

namespace orx::cs::velta::rtcm3 {

/// Appends a message as a JSON object on a line of its own, in UTF-8: "message" with its number,
/// then the fields in the order in which they travel, by the names of the record's members. Numbers
/// are the integers of the message.
VELTA_RTCM3_EXPORT void AppendJsonLine(const Message& message, std::string& out);

/// Reads what AppendJsonLine writes, whatever the order of the fields.
/// \throws FieldError that says what is missing, unknown, of the wrong type or out of range
VELTA_RTCM3_EXPORT Message ParseJsonLine(std::string_view line);

}  // namespace orx::cs::velta::rtcm3
