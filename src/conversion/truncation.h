#pragma once

#include <cstdint>
#include <limits>

/// Conversions of doubles to message integers: toward zero, never to the nearest, and defined for
/// every double. What the integer cannot hold, a NaN included, becomes the smallest value of the
/// signed type, as the processor's own conversion does.
namespace orx::cs::velta {

namespace truncation {

inline constexpr double kTwoTo31 = 2147483648.0;
inline constexpr double kTwoTo63 = 9223372036854775808.0;

}  // namespace truncation

inline std::int32_t ToInt32(double value) {
  const bool fits = value > -truncation::kTwoTo31 - 1.0 && value < truncation::kTwoTo31;
  return fits ? static_cast<std::int32_t>(value) : std::numeric_limits<std::int32_t>::min();
}

inline std::int64_t ToInt64(double value) {
  const bool fits = value >= -truncation::kTwoTo63 && value < truncation::kTwoTo63;
  return fits ? static_cast<std::int64_t>(value) : std::numeric_limits<std::int64_t>::min();
}

/// A negative value wraps around, as in the signed type.
inline std::uint64_t ToUint64(double value) {
  const bool beyondSigned = value >= truncation::kTwoTo63 && value < 2.0 * truncation::kTwoTo63;
  return beyondSigned ? static_cast<std::uint64_t>(value)
                      : static_cast<std::uint64_t>(ToInt64(value));
}

/// A 32-bit unsigned field that is converted as a signed one.
inline std::uint32_t ToUint32(double value) { return static_cast<std::uint32_t>(ToInt32(value)); }

/// The low half of the 64-bit conversion.
inline std::uint32_t ToLow32(double value) { return static_cast<std::uint32_t>(ToInt64(value)); }

}  // namespace orx::cs::velta
