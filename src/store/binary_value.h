#pragma once

#include <cstdint>
#include <cstring>

#include "orxregistry/bin_value.h"
#include "velta/result_codes.h"

namespace orx::cs::velta {

/// Bytes of zero-terminated UTF-16 text, its terminator included. The text need not be aligned.
inline std::uint32_t TextBytes(const void* text) {
  const auto* at = static_cast<const unsigned char*>(text);
  char16_t unit = u'\0';
  std::uint32_t bytes = 0;
  do {
    std::memcpy(&unit, at + bytes, sizeof unit);
    bytes += sizeof unit;
  } while (unit != u'\0');
  return bytes;
}

/// What every adaptor does alike, on top of the typed operations.
class TBinaryValue : public bin_value {
 public:
  std::int32_t SetFromDescriptor(const ValueDescriptor& descriptor, const void* data,
                                 bool copy) override {
    return SetData(descriptor.type, data, descriptor.size, copy) ? kSuccess : kValueRefused;
  }

  ValueDescriptor GetDescriptor() const override { return {GetType(), GetSize(), 1}; }

  const void* GetRawData() const override { return GetData(); }

  std::uint32_t GetByteSize() const override {
    const void* const data = GetData();
    if (!data) return 0;
    return GetType() == kWideString && GetSize() == 0 ? TextBytes(data) : GetSize();
  }

  /// Takes a value over.
  /// \param size element size in bytes; 0: zero-terminated UTF-16 text
  /// \param copy false: the bytes may be kept by reference
  /// \return false when a value of that type or size is not this adaptor's kind
  virtual bool SetData(std::uint32_t type, const void* data, std::uint32_t size, bool copy) = 0;
};

}  // namespace orx::cs::velta
