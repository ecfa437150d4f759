#pragma once

#include <string>

#include "rtcm3/message.h"

/// The messages' integers in the units that people use.
namespace velta_tool {

/// Appends a message as rtcm3::AppendJsonLine does, with degrees, metres, arc-seconds and ppm, and
/// scales as factors; codes and names stay. A number has as few digits as tell it to a hundredth
/// of its field's step.
/// \param dms degrees as texts of degrees, minutes and seconds
void AppendJsonLineInUnits(const orx::cs::velta::rtcm3::Message& message, bool dms,
                           std::string& out);

/// Every unit with the fields that have it, as lines.
std::string FieldsByUnit();

}  // namespace velta_tool
