#pragma once

#include <cstdint>
#include <cstring>
#include <string>
#include <type_traits>
#include <utility>

#include "orxutils/orx_string.h"
#include "store/binary_value.h"

namespace orx::cs::velta {

/// A number that is stored as a byte block.
template <class T>
struct BinaryType {
  T value;
};

/// The type codes of the kinds; the element size is the kind's own.
template <class T>
inline constexpr ValueType kTypeOf = kNoValue;
template <>
inline constexpr ValueType kTypeOf<signed char> = kSignedInteger;
template <>
inline constexpr ValueType kTypeOf<int> = kSignedInteger;
template <>
inline constexpr ValueType kTypeOf<unsigned short> = kUnsignedInteger;
template <>
inline constexpr ValueType kTypeOf<unsigned int> = kUnsignedInteger;
template <>
inline constexpr ValueType kTypeOf<bool> = kUnsignedInteger;
template <>
inline constexpr ValueType kTypeOf<BinaryType<unsigned int>> = kByteBlock;

/// A stored value as a T, or nothing. Values of another type or size are refused, not converted.
template <class T>
class TBinValue : public TBinaryValue {
  static_assert(kTypeOf<T> != kNoValue, "not a kind of stored value");

 public:
  TBinValue() = default;
  explicit TBinValue(const T& value) : valid_(true), value_(value) {}

  bool SetData(std::uint32_t type, const void* data, std::uint32_t size, bool /*copy*/) override {
    valid_ = type == kTypeOf<T> && size == sizeof(T);
    if (valid_ && data) value_ = Load(data);
    return valid_ || type == kNoValue;
  }
  std::int32_t Assign(const bin_value& other) override {
    return SetData(other.GetType(), other.GetData(), other.GetSize(), true) ? kSuccess
                                                                            : kValueRefused;
  }
  std::uint32_t GetType() const override { return valid_ ? kTypeOf<T> : kNoValue; }
  std::uint32_t GetSize() const override { return valid_ ? sizeof(T) : 0; }
  const void* GetData() const override { return valid_ ? &value_ : nullptr; }

  virtual T GetTypedValue() const { return value_; }

 private:
  static T Load(const void* data) {
    if constexpr (std::is_same_v<T, bool>) {
      return *static_cast<const unsigned char*>(data) != 0;
    } else {
      T value;
      std::memcpy(&value, data, sizeof value);
      return value;
    }
  }

  bool valid_ = false;
  T value_ = {};
};

/// A stored string. It is held as it is stored, in UTF-16, whatever a wide character is here.
template <>
class TBinValue<COrxStringT<wchar_t>> : public TBinaryValue {
 public:
  TBinValue() = default;
  explicit TBinValue(const COrxStringT<wchar_t>& value) : valid_(true), text_(ToUtf16(value)) {}

  bool SetData(std::uint32_t type, const void* data, std::uint32_t size, bool /*copy*/) override {
    valid_ = type == kWideString && size == 0;
    if (!valid_) return false;
    std::u16string text;
    if (data) {
      text.resize(TextBytes(data) / sizeof(char16_t) - 1);
      std::memcpy(text.data(), data, text.size() * sizeof(char16_t));
    }
    text_ = std::move(text);
    return true;
  }
  std::int32_t Assign(const bin_value& other) override {
    return SetData(other.GetType(), other.GetData(), other.GetSize(), true) ? kSuccess
                                                                            : kValueRefused;
  }
  std::uint32_t GetType() const override { return kWideString; }
  std::uint32_t GetSize() const override { return 0; }
  const void* GetData() const override { return text_.c_str(); }

  virtual COrxStringT<wchar_t> GetTypedValue() const { return FromUtf16(text_); }

 private:
  bool valid_ = false;
  std::u16string text_;
};

}  // namespace orx::cs::velta
