#pragma once

#include <cstddef>
#include <string>
#include <string_view>

#include "rtcm3/export.h"
#include "rtcm3/field_error.h"
#include "rtcm3/message.h"

namespace orx::cs::velta::rtcm3 {

/// The longest line that is read, in bytes; that of a message has less than 2 kB.
inline constexpr std::size_t kMaxJsonLine = std::size_t{64} * 1024;

/// Appends a message as a JSON object on a line of its own, in UTF-8: "message" with its number,
/// then the fields in the order in which they travel, by the names of the record's members. Numbers
/// are the integers of the message.
VELTA_RTCM3_EXPORT void AppendJsonLine(const Message& message, std::string& out);

/// Reads what AppendJsonLine writes, whatever the order of the fields.
/// \throws FieldError that says what is missing, unknown, there twice, of the wrong type or out of
///     range, or that the line is too long
VELTA_RTCM3_EXPORT Message ParseJsonLine(std::string_view line);

}  // namespace orx::cs::velta::rtcm3
