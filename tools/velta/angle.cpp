#include "angle.h"

#include <array>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <vector>

#include "decimal.h"

namespace velta_tool {
namespace {

constexpr double kSixty = 60;
constexpr std::size_t kParts = 3;  // degrees, minutes, seconds

/// The signs behind degrees, minutes and seconds; between parts a blank does, too.
const std::vector<std::string_view> kSigns[kParts] = {
    {"°", "º", "d"}, {"'", "′", "’"}, {"\"", "″", "”", "''"}};

void SkipBlanks(std::string_view& text) {
  text.remove_prefix(std::min(text.find_first_not_of(' '), text.size()));
}

bool Take(std::string_view& text, std::string_view start) {
  if (!text.starts_with(start)) return false;
  text.remove_prefix(start.size());
  return true;
}

/// Takes digits, with or without a fraction.
std::optional<double> TakeUnsigned(std::string_view& text) {
  const std::size_t length = std::min(text.find_first_not_of("0123456789."), text.size());
  const std::optional<double> number = ParseNumber(text.substr(0, length));
  text.remove_prefix(length);
  return number;
}

/// +1 or -1 for the letter that the text ends with, which is taken; 0 without one.
int TakeHemisphere(std::string_view& text, const Coordinate& coordinate) {
  if (text.empty()) return 0;
  const int sign = text.back() == coordinate.positive   ? 1
                   : text.back() == coordinate.negative ? -1
                                                        : 0;
  if (sign != 0) text.remove_suffix(1);
  return sign;
}

/// Accepts an angle, and makes it a number of degrees.
CLI::Validator AngleCheck(const Coordinate& coordinate) {
  const auto check = [coordinate](std::string& text) -> std::string {
    const std::optional<double> angle = ParseAngle(text, coordinate);
    if (!angle) return text + " is not a number of degrees, nor degrees, minutes and seconds";
    if (std::abs(*angle) > coordinate.most) {
      return text + " is not in range: at most " + std::to_string(std::lround(coordinate.most)) +
             " degrees";
    }
    std::array<char, 32> digits;
    std::snprintf(digits.data(), digits.size(), "%.17g", *angle);
    text = digits.data();
    return {};
  };
  return {check, ""};
}

}  // namespace

std::optional<double> ParseNumber(std::string_view text) {
  double number = 0;
  const char* const end = text.data() + text.size();
  if (text.starts_with('+')) text.remove_prefix(1);
  const auto [rest, error] = std::from_chars(text.data(), end, number);
  if (error != std::errc() || rest != end || !std::isfinite(number)) return std::nullopt;
  return number;
}

std::optional<double> ParseAngle(std::string_view text, const Coordinate& coordinate) {
  const int hemisphere = TakeHemisphere(text, coordinate);
  if (hemisphere == 0) {
    if (const std::optional<double> number = ParseNumber(text)) return number;
  }
  SkipBlanks(text);
  const bool isNegative = Take(text, "-");
  if (!isNegative) Take(text, "+");
  if (isNegative && hemisphere != 0) return std::nullopt;
  double degrees = 0;
  double unit = 1;
  bool hasFraction = false;
  for (std::size_t part = 0; part < kParts && !text.empty(); ++part) {
    const std::optional<double> number = TakeUnsigned(text);
    if (!number || hasFraction || (part > 0 && *number >= kSixty)) return std::nullopt;
    hasFraction = *number != std::floor(*number);
    degrees += *number / unit;
    unit *= kSixty;
    bool isSeparated = text.starts_with(' ') || text.empty();
    for (const std::string_view sign : kSigns[part]) isSeparated = isSeparated || Take(text, sign);
    if (!isSeparated) return std::nullopt;
    SkipBlanks(text);
  }
  if (unit == 1 || !text.empty()) return std::nullopt;
  return isNegative || hemisphere < 0 ? -degrees : degrees;
}

std::string DegreesMinutesSeconds(double degrees) {
  constexpr int kDecimals = 7;
  constexpr long long kUnitsPerSecond = 10'000'000;
  constexpr double kNoAngle = 1e6;  // nor can units of seconds be counted there
  const bool isAngle = std::abs(degrees) < kNoAngle;
  if (!isAngle) return ShortestText(degrees, 0);
  long long rest = std::llround(std::abs(degrees) * kSixty * kSixty * kUnitsPerSecond);
  const long long units = rest % kUnitsPerSecond;
  rest /= kUnitsPerSecond;
  const long long seconds = rest % 60;
  const long long minutes = rest / 60 % 60;
  const bool isNegative = degrees < 0 && (rest != 0 || units != 0);
  std::array<char, 64> text;
  std::snprintf(text.data(), text.size(), "%s%lld°%02lld'%02lld.%0*lld", isNegative ? "-" : "",
                rest / 3600, minutes, seconds, kDecimals, units);
  std::string angle = text.data();
  angle.erase(angle.find_last_not_of('0') + 1);
  if (angle.back() == '.') angle.pop_back();
  return angle + '"';
}

void AddPosition(CLI::App& command, std::optional<double>& latitude,
                 std::optional<double>& longitude) {
  auto* north = command.add_option("--lat", latitude, "latitude")
                    ->type_name("DEGREES")
                    ->transform(AngleCheck(kLatitude));
  auto* east = command.add_option("--lon", longitude, "longitude")
                   ->type_name("DEGREES")
                   ->transform(AngleCheck(kLongitude));
  north->needs(east);
  east->needs(north);
}

CLI::Option* AddDms(CLI::App& command, bool& dms) {
  return command.add_flag("--dms", dms, "print angles in degrees, minutes and seconds");
}

const CLI::Validator kNumber(
    [](std::string& text) { return ParseNumber(text) ? "" : text + " is not a number"; }, "");

}  // namespace velta_tool
