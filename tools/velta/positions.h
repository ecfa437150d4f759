#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace velta_tool {

/// A position of an input, as it is written.
struct PositionLine {
  double north;                  ///< degrees or metres
  double east;                   ///< likewise
  std::optional<double> height;  ///< metres
  std::string_view rest;         ///< further columns, in the line
  char separator;                ///< of the columns: a blank or a comma
};

/// True for a line that has no position to begin with: a blank one, or one that begins with "#".
bool IsRemark(std::string_view line);

/// Takes apart a line of two or three numbers with blanks or commas between them and anything
/// behind. Angles may be in degrees, minutes and seconds without blanks.
/// \throws std::invalid_argument with the reason when it is no position
PositionLine ParsePosition(std::string_view line, bool areAngles);

/// Appends a number with so many decimals.
void AppendFixed(double number, int decimals, std::string& out);

}  // namespace velta_tool
