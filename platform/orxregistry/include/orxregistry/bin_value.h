#pragma once

#include <cstdint>

namespace orx {

/// Type codes of stored values.
enum ValueType : std::uint32_t {
  kNoValue = 0,
  kByteBlock = 1,
  kSignedInteger = 2,
  kUnsignedInteger = 3,  ///< also booleans, of one byte
  kWideString = 5        ///< UTF-16 with a terminating zero unit
};

/// What a stored value is.
struct ValueDescriptor {
  std::uint32_t type;      ///< a ValueType
  std::uint32_t size;      ///< element size in bytes; 0: the size follows the zero-terminated text
  std::uint8_t dimension;  ///< number of elements
};

/// A value on its way into or out of a registry key. The order of the operations is binding: the
/// registry calls them across library boundaries.
class bin_value {
 public:
  virtual ~bin_value() = default;
  /// Takes a stored value over.
  /// \param descriptor what the value is
  /// \param data the value's bytes; they stay valid as long as the tree they come from
  /// \param copy true: take a copy; false: the bytes may be kept by reference
  /// \return 0, or a code that says why the value was refused
  virtual std::int32_t SetFromDescriptor(const ValueDescriptor& descriptor, const void* data,
                                         bool copy) = 0;
  /// What the value is; type kNoValue when there is none.
  virtual ValueDescriptor GetDescriptor() const = 0;
  /// The value's bytes, or null.
  virtual const void* GetRawData() const = 0;
  /// Number of bytes to store.
  virtual std::uint32_t GetByteSize() const = 0;
  /// A ValueType.
  virtual std::uint32_t GetType() const = 0;
  /// The value's bytes, or null.
  virtual const void* GetData() const = 0;
  /// Element size in bytes.
  virtual std::uint32_t GetSize() const = 0;
  /// Takes a copy of another adaptor's value.
  /// \return 0, or a code that says why the value was refused
  virtual std::int32_t Assign(const bin_value& other) {
    return SetFromDescriptor(other.GetDescriptor(), other.GetRawData(), true);
  }
};

}  // namespace orx
