#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// The bytes of keys and values, in files and in memory alike: see docs/gff-format.md.
/// Integers are little-endian, nothing is aligned. Nothing here trusts a byte that it reads.
namespace orx::record {

using Bytes = std::basic_string_view<unsigned char>;
using Buffer = std::vector<unsigned char>;

/// Keys nested deeper than this are damage.
inline constexpr int kMaxDepth = 64;

template <class Integer>
Integer Load(const unsigned char* at) {
  Integer value;
  std::memcpy(&value, at, sizeof value);
  return value;
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

/// A value: its description, its name, its bytes.
struct Value {
  std::uint32_t type = 0;
  std::uint32_t elementSize = 0;  ///< 0: the data are zero-terminated UTF-16 text
  std::uint8_t dimension = 0;
  Name name;
  const unsigned char* data = nullptr;
  std::uint32_t dataSize = 0;
};

/// A key: its dimension, its name, its values and its sub-keys, still in bytes.
struct Key {
  std::uint8_t dimension = 0;
  Name name;
  Bytes values;
  Bytes keys;
};

/// True when the description and the data of a value agree: text ends with a zero unit and fills
/// its data, any other value has as many bytes as one element.
bool IsConsistent(const Value& value);

/// Takes the value at the front of `bytes` off them; nothing when it is not a whole value.
std::optional<Value> TakeValue(Bytes& bytes);

/// Takes the key at the front of `bytes` off them; nothing when it is not a whole key.
std::optional<Key> TakeKey(Bytes& bytes);

/// The value whose record TakeValue has accepted.
Value ValueAt(const unsigned char* record);

/// The key whose record TakeKey has accepted.
Key KeyAt(const unsigned char* record);

/// Bytes of the record of a value.
std::size_t ValueRecordSize(const Value& value);

void AppendValue(Buffer& to, const Value& value);

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
