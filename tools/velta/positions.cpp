#include "positions.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <stdexcept>

#include "angle.h"

namespace velta_tool {
namespace {

constexpr std::string_view kBlanks = " \t\r";

void SkipBlanks(std::string_view& text) {
  text.remove_prefix(std::min(text.find_first_not_of(kBlanks), text.size()));
}

/// Takes a column, and what separates it from the next.
/// \param isComma set when that is a comma
std::string_view TakeColumn(std::string_view& text, bool& isComma) {
  const std::string_view column = text.substr(0, text.find_first_of(" \t\r,"));
  text.remove_prefix(column.size());
  SkipBlanks(text);
  if (text.starts_with(',')) {
    isComma = true;
    text.remove_prefix(1);
    SkipBlanks(text);
  }
  return column;
}

std::string Quoted(std::string_view text) {
  return text.empty() ? "a column that is empty" : '"' + std::string(text) + '"';
}

double CoordinateOf(std::string_view text, const Coordinate* angle) {
  const std::optional<double> number = angle ? ParseAngle(text, *angle) : ParseNumber(text);
  if (!number) {
    throw std::invalid_argument(Quoted(text) + (angle ? " is not an angle" : " is not a number"));
  }
  if (angle && std::abs(*number) > angle->most) {
    throw std::invalid_argument(std::string(text) + " is not in range: at most " +
                                std::to_string(std::lround(angle->most)) + " degrees");
  }
  return *number;
}

/// True for what a program writes for a number that is none.
bool IsNotFinite(std::string_view text) {
  double number = 0;
  if (text.starts_with('+')) text.remove_prefix(1);
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  const bool isRead = end == text.data() + text.size() && !text.empty();
  return isRead && (error == std::errc::result_out_of_range || !std::isfinite(number));
}

}  // namespace

bool IsRemark(std::string_view line) {
  SkipBlanks(line);
  return line.empty() || line.starts_with('#');
}

PositionLine ParsePosition(std::string_view line, bool areAngles) {
  SkipBlanks(line);
  bool isComma = false;
  PositionLine position = {};
  position.north = CoordinateOf(TakeColumn(line, isComma), areAngles ? &kLatitude : nullptr);
  position.east = CoordinateOf(TakeColumn(line, isComma), areAngles ? &kLongitude : nullptr);
  std::string_view behind = line;
  const std::string_view third = TakeColumn(behind, isComma);
  if (IsNotFinite(third)) throw std::invalid_argument(Quoted(third) + " is not a finite height");
  position.height = ParseNumber(third);
  position.rest = position.height ? behind : line;
  while (!position.rest.empty() && kBlanks.find(position.rest.back()) != kBlanks.npos) {
    position.rest.remove_suffix(1);
  }
  position.separator = isComma ? ',' : ' ';
  return position;
}

void AppendFixed(double number, int decimals, std::string& out) {
  std::array<char, 384> digits;
  const auto result =
      std::to_chars(digits.begin(), digits.end(), number, std::chars_format::fixed, decimals);
  out.append(digits.begin(), result.ptr);
}

}  // namespace velta_tool
