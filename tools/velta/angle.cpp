#include "angle.h"

#include <charconv>
#include <cmath>
#include <cstdio>
#include <vector>

namespace velta_tool {
namespace {

constexpr double kSixty = 60;
constexpr std::size_t kParts = 3;  // degrees, minutes, seconds

/// The signs behind degrees, minutes and seconds; between parts a blank does, too.
const std::vector<std::string_view> kSigns[kParts] = {
    {"°", "d"}, {"'", "′", "’"}, {"\"", "″", "”", "''"}};

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
int TakeHemisphere(std::string_view& text, const Hemispheres& hemispheres) {
  if (text.empty()) return 0;
  const int sign = text.back() == hemispheres.positive   ? 1
                   : text.back() == hemispheres.negative ? -1
                                                         : 0;
  if (sign != 0) text.remove_suffix(1);
  return sign;
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

std::optional<double> ParseAngle(std::string_view text, const Hemispheres& hemispheres) {
  const int hemisphere = TakeHemisphere(text, hemispheres);
  if (hemisphere == 0) {
    if (const std::optional<double> number = ParseNumber(text)) return number;
  }
  SkipBlanks(text);
  const bool isNegative = Take(text, "-");
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

CLI::Validator AngleCheck(const Hemispheres& hemispheres, double most) {
  const auto check = [hemispheres, most](std::string& text) -> std::string {
    const std::optional<double> angle = ParseAngle(text, hemispheres);
    if (!angle) return text + " is not a number of degrees, nor degrees, minutes and seconds";
    if (std::abs(*angle) > most) {
      return text + " is not in range: at most " + std::to_string(std::lround(most)) + " degrees";
    }
    char digits[32];
    std::snprintf(digits, sizeof digits, "%.17g", *angle);
    text = digits;
    return {};
  };
  return {check, ""};
}

const CLI::Validator kNumber(
    [](std::string& text) { return ParseNumber(text) ? "" : text + " is not a number"; }, "");

}  // namespace velta_tool
