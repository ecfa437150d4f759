#include "decimal.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <cstdlib>

namespace velta_tool {

bool IsSameNumber(double a, double b) {
  constexpr double kRounding = 1e-12;
  return std::abs(a - b) <= kRounding * std::max({1.0, std::abs(a), std::abs(b)});
}

double Shortest(double number, double step) {
  constexpr int kDigits = 17;
  constexpr double kShare = 0.01;
  for (int digits = 1; digits < kDigits; ++digits) {
    std::array<char, 32> text;
    std::snprintf(text.data(), text.size(), "%.*g", digits, number);
    const double shorter = std::strtod(text.data(), nullptr);
    const double difference = std::abs(shorter - number);
    if (IsSameNumber(shorter, number) || difference <= kShare * step) {
      return shorter == 0 ? 0 : shorter;
    }
  }
  return number;
}

std::string ShortestText(double number, double step) {
  constexpr double kLarge = 1e15;
  std::array<char, 64> digits;
  const auto format =
      std::abs(number) < kLarge ? std::chars_format::fixed : std::chars_format::general;
  const double shown = Shortest(number, step);
  char* const end = std::to_chars(digits.begin(), digits.end(), shown, format).ptr;
  return {digits.data(), end};
}

}  // namespace velta_tool
