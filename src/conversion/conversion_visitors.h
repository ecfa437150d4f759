#pragma once

#include <cstdint>
#include <type_traits>

#include "conversion/message_fields.h"
#include "conversion/truncation.h"

/// The visitors of message_fields.h that convert, one for each direction.
namespace orx::cs::velta {

/// From the message's integers to numbers.
inline constexpr auto kToNumber = [](const char*, auto integer, double& number,
                                     const Scaling& scaling) {
  number = scaling.toNumber(static_cast<double>(integer));
};

/// From numbers to the message's integers, toward zero.
/// \tparam kToUint32 how a number becomes an unsigned field of 32 bits: ToUint32 or ToLow32
template <std::uint32_t (*kToUint32)(double)>
struct ToInteger {
  void operator()(const char*, std::int32_t& integer, double number, const Scaling& s) const {
    integer = ToInt32(s.toInteger(number));
  }
  void operator()(const char*, std::uint32_t& integer, double number, const Scaling& s) const {
    integer = kToUint32(s.toInteger(number));
  }
  void operator()(const char*, std::int64_t& integer, double number, const Scaling& s) const {
    integer = ToInt64(s.toInteger(number));
  }
  void operator()(const char*, std::uint64_t& integer, double number, const Scaling& s) const {
    integer = ToUint64(s.toInteger(number));
  }
};

}  // namespace orx::cs::velta
