#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <utility>

#include "rtcm3/field_error.h"
#include "rtcm3/fields.h"

namespace orx::cs::velta::rtcm3 {

/// Bits of a text's count of characters.
inline constexpr unsigned kTextCounterWidth = 5;
/// The most characters that a text can have.
inline constexpr std::size_t kMaxTextLength = (1U << kTextCounterWidth) - 1;

/// The error that a field's value is outside its range.
inline FieldError RangeError(const FieldRange& range, std::string_view field,
                             const std::string& value) {
  return FieldError(std::string(field) + " must be an integer from " + std::to_string(range.min) +
                    " to " + std::to_string(range.max) + ", not " + value);
}

template <class Integer>
bool Holds(const FieldRange& range, Integer value) {
  return std::cmp_greater_equal(value, range.min) && std::cmp_less_equal(value, range.max);
}

/// The error that a text is too long or has characters that do not travel.
inline FieldError TextError(std::string_view field) {
  return FieldError(std::string(field) + " must be a text of at most " +
                    std::to_string(kMaxTextLength) + " ISO 8859-1 characters");
}

}  // namespace orx::cs::velta::rtcm3
