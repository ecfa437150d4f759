#pragma once

#include <bit>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <limits>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "orxregistry/bin_value.h"

/// The bytes of keys and values, in files and in memory alike: see docs/gff-format.md.
/// Integers are little-endian, nothing is aligned. Nothing here trusts a byte that it reads.
namespace orx::record {

using Bytes = std::basic_string_view<unsigned char>;
using Buffer = std::vector<unsigned char>;

static_assert(std::endian::native == std::endian::little, "stored as they stand in memory");

/// Keys nested deeper than this are damage.
inline constexpr int kMaxDepth = 64;

template <class Integer>
Integer Load(const unsigned char* at) {
  Integer value;
  std::memcpy(&value, at, sizeof value);
  return value;
}

template <class Integer>
void Store(unsigned char* at, Integer value) {
  std::memcpy(at, &value, sizeof value);
}

template <class Integer>
void Append(Buffer& to, Integer value) {
  const auto* const bytes = reinterpret_cast<const unsigned char*>(&value);
  to.insert(to.end(), bytes, bytes + sizeof value);
}

/// The UTF-16 name of a key or value, not aligned.
struct Name {
  const unsigned char* units = nullptr;
  std::size_t bytes = 0;

  bool operator==(const Name& other) const {
    return bytes == other.bytes && std::memcmp(units, other.units, bytes) == 0;
  }
};

/// A hash that nobody outside this process can foresee, so that no file can be made to slow the
/// look-up of its names.
std::size_t HashOf(const Name& name);

/// A value: its description, its name, its bytes.
struct Value {
  std::uint32_t type = 0;
  std::uint32_t elementSize = 0;  ///< 0: the data are zero-terminated UTF-16 text
  std::uint8_t dimension = 0;
  Name name;
  const unsigned char* data = nullptr;
  std::uint32_t dataSize = 0;
};

// Where the fields of a value's header are, and its size.
inline constexpr std::size_t kDataSizeAt = 0;
inline constexpr std::size_t kElementSizeAt = 4;
inline constexpr std::size_t kValueNameUnitsAt = 8;
inline constexpr std::size_t kTypeAt = 10;
inline constexpr std::size_t kValueDimensionAt = 11;
inline constexpr std::size_t kValueHeader = 12;

// The same for a key.
inline constexpr std::size_t kValuesSizeAt = 0;
inline constexpr std::size_t kKeysSizeAt = 8;
inline constexpr std::size_t kKeyNameUnitsAt = 16;
inline constexpr std::size_t kKeyDimensionAt = 18;
inline constexpr std::size_t kKeyReservedAt = 19;
inline constexpr std::size_t kKeyHeader = 20;

inline constexpr std::size_t kUnit = sizeof(char16_t);

inline bool IsTerminatedText(const unsigned char* data, std::size_t size) {
  if (size < kUnit || size % kUnit != 0) return false;
  return Load<char16_t>(data + size - kUnit) == 0;
}

/// True when the description and the data of a value agree: text ends with a zero unit and fills
/// its data, any other value has as many bytes as one element.
inline bool IsConsistent(const Value& value) {
  if (value.type == kNoValue || value.type > std::numeric_limits<std::uint8_t>::max()) return false;
  if (value.name.bytes / kUnit > std::numeric_limits<std::uint16_t>::max()) return false;
  if (value.elementSize == 0) return IsTerminatedText(value.data, value.dataSize);
  return value.dataSize == value.elementSize;
}

/// The record of a whole value whose description and data agree; made only by those who have
/// checked it or written it. It lies in a file's bytes or in a tree's memory.
class ValueRecord {
 public:
  /// None.
  ValueRecord() = default;

  explicit operator bool() const { return at_ != nullptr; }
  Name name() const {
    return {at_ + kValueHeader, kUnit * Load<std::uint16_t>(at_ + kValueNameUnitsAt)};
  }
  Value value() const;
  Bytes bytes() const {
    return {at_, kValueHeader + name().bytes + Load<std::uint32_t>(at_ + kDataSizeAt)};
  }

 private:
  friend ValueRecord TakeValue(Bytes& bytes);
  friend ValueRecord WriteValue(unsigned char* to, const Value& value);
  explicit ValueRecord(const unsigned char* at) : at_(at) {}

  const unsigned char* at_ = nullptr;
};

inline Value ValueRecord::value() const {
  Value value;
  value.dataSize = Load<std::uint32_t>(at_ + kDataSizeAt);
  value.elementSize = Load<std::uint32_t>(at_ + kElementSizeAt);
  value.type = at_[kTypeAt];
  value.dimension = at_[kValueDimensionAt];
  value.name = name();
  value.data = value.name.units + value.name.bytes;
  return value;
}

/// Takes the value at the front of `bytes` off them; none when it is not a whole value.
inline ValueRecord TakeValue(Bytes& bytes) {
  if (bytes.size() < kValueHeader) return {};
  const ValueRecord record(bytes.data());
  const Value value = record.value();  // not checked yet
  const std::size_t size = kValueHeader + value.name.bytes + value.dataSize;
  if (size > bytes.size() || !IsConsistent(value)) return {};
  bytes.remove_prefix(size);
  return record;
}

/// Bytes of the record of a value.
inline std::size_t ValueRecordSize(const Value& value) {
  return kValueHeader + value.name.bytes + value.dataSize;
}

/// \param to room for ValueRecordSize() bytes
/// \param value one that IsConsistent()
ValueRecord WriteValue(unsigned char* to, const Value& value);

/// The record of a key whose values and sub-keys lie within it; made only by those who have checked
/// that or written it. What the values and sub-keys are is not known yet.
class KeyRecord {
 public:
  /// None.
  KeyRecord() = default;

  explicit operator bool() const { return at_ != nullptr; }
  Name name() const {
    return {at_ + kKeyHeader, kUnit * Load<std::uint16_t>(at_ + kKeyNameUnitsAt)};
  }
  std::uint8_t dimension() const { return at_[kKeyDimensionAt]; }
  Bytes values() const {
    return {at_ + kKeyHeader + name().bytes, Load<std::uint64_t>(at_ + kValuesSizeAt)};
  }
  Bytes keys() const {
    return {values().data() + values().size(), Load<std::uint64_t>(at_ + kKeysSizeAt)};
  }
  Bytes bytes() const { return {at_, kKeyHeader + name().bytes + values().size() + keys().size()}; }

 private:
  friend KeyRecord TakeKey(Bytes& bytes);
  friend KeyRecord WriteEmptyKey(unsigned char* to, std::uint8_t dimension, const Name& name);
  explicit KeyRecord(const unsigned char* at) : at_(at) {}

  const unsigned char* at_ = nullptr;
};

/// Takes the key at the front of `bytes` off them; none when it is not a whole key.
inline KeyRecord TakeKey(Bytes& bytes) {
  if (bytes.size() < kKeyHeader) return {};
  const unsigned char* const at = bytes.data();
  const std::size_t name = kUnit * Load<std::uint16_t>(at + kKeyNameUnitsAt);
  if (at[kKeyReservedAt] != 0 || bytes.size() - kKeyHeader < name) return {};
  const std::size_t rest = bytes.size() - kKeyHeader - name;
  const auto values = Load<std::uint64_t>(at + kValuesSizeAt);
  const auto keys = Load<std::uint64_t>(at + kKeysSizeAt);
  if (values > rest || keys > rest - values) return {};
  bytes.remove_prefix(kKeyHeader + name + values + keys);
  return KeyRecord(at);
}

/// Bytes of the record of a key without values and sub-keys.
inline std::size_t EmptyKeySize(const Name& name) { return kKeyHeader + name.bytes; }

/// \param to room for EmptyKeySize() bytes
KeyRecord WriteEmptyKey(unsigned char* to, std::uint8_t dimension, const Name& name);

/// True when the bytes are one key and so is everything in it, no more than `depth` levels deep.
bool IsWhole(Bytes bytes, int depth);

inline void AppendBytes(Buffer& to, Bytes bytes) {
  to.insert(to.end(), bytes.begin(), bytes.end());
}

/// Writes a key around what is appended between construction and Close().
class KeyWriter {
 public:
  KeyWriter(Buffer& to, std::uint8_t dimension, const Name& name);
  /// Values are complete; sub-keys follow.
  void EndValues();
  void Close();

 private:
  Buffer& to_;
  std::size_t start_;
  std::size_t valuesStart_;
  std::size_t keysStart_;
};

}  // namespace orx::record
