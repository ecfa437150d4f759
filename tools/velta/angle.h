#pragma once

#include <CLI/App.hpp>
#include <optional>
#include <string>
#include <string_view>

namespace velta_tool {

/// A finite decimal number, with a point and without anything behind it.
std::optional<double> ParseNumber(std::string_view text);

/// A coordinate that is an angle: the letters that it may end with, and how large it may be.
struct Coordinate {
  char positive;
  char negative;
  double most;  ///< degrees
};
inline constexpr Coordinate kLatitude{'N', 'S', 90};
inline constexpr Coordinate kLongitude{'E', 'W', 360};

/// An angle as people write it: "-9.5", "52°00'30.5\"N", "52 00 30", "52 30.5 S".
/// \return degrees; nothing when it is none
std::optional<double> ParseAngle(std::string_view text, const Coordinate& coordinate);

/// An angle as degrees, minutes and seconds, such as "-9°30'00.25\"". Seconds have no more decimals
/// than they need, and at most 7: a thousandth of the finest step of a message.
std::string DegreesMinutesSeconds(double degrees);

/// Adds "--lat" and "--lon", which need each other. Both take what ParseAngle does, and are in
/// degrees then.
void AddPosition(CLI::App& command, std::optional<double>& latitude,
                 std::optional<double>& longitude);

/// Adds "--dms" to a command that prints angles.
CLI::Option* AddDms(CLI::App& command, bool& dms);

/// Accepts what ParseNumber does.
extern const CLI::Validator kNumber;

}  // namespace velta_tool
