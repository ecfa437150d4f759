#pragma once

#include <CLI/App.hpp>
#include <optional>
#include <string>
#include <string_view>

namespace velta_tool {

/// A finite decimal number, with a point and without anything behind it.
std::optional<double> ParseNumber(std::string_view text);

/// The letters that an angle may end with.
struct Hemispheres {
  char positive;
  char negative;
};
inline constexpr Hemispheres kLatitude{'N', 'S'};
inline constexpr Hemispheres kLongitude{'E', 'W'};

/// An angle as people write it: "-9.5", "52°00'30.5\"N", "52 00 30", "52 30.5 S".
/// \return degrees; nothing when it is none
std::optional<double> ParseAngle(std::string_view text, const Hemispheres& hemispheres);

/// Accepts an angle of at most so many degrees, and makes it a number of degrees.
CLI::Validator AngleCheck(const Hemispheres& hemispheres, double most);

/// Accepts what ParseNumber does.
extern const CLI::Validator kNumber;

}  // namespace velta_tool
