#include "record_format.h"

#include <bit>
#include <limits>

#include "orxregistry/bin_value.h"

namespace orx::record {

static_assert(std::endian::native == std::endian::little, "stored as they stand in memory");

namespace {

// Where the fields of a value's header are, and its size.
constexpr std::size_t kDataSizeAt = 0;
constexpr std::size_t kElementSizeAt = 4;
constexpr std::size_t kValueNameUnitsAt = 8;
constexpr std::size_t kTypeAt = 10;
constexpr std::size_t kValueDimensionAt = 11;
constexpr std::size_t kValueHeader = 12;

// The same for a key.
constexpr std::size_t kValuesSizeAt = 0;
constexpr std::size_t kKeysSizeAt = 8;
constexpr std::size_t kKeyNameUnitsAt = 16;
constexpr std::size_t kKeyDimensionAt = 18;
constexpr std::size_t kKeyReservedAt = 19;
constexpr std::size_t kKeyHeader = 20;

constexpr std::size_t kUnit = sizeof(char16_t);

void AppendBytes(Buffer& to, const unsigned char* bytes, std::size_t size) {
  to.insert(to.end(), bytes, bytes + size);
}

template <class Integer>
void Patch(Buffer& to, std::size_t at, Integer value) {
  std::memcpy(to.data() + at, &value, sizeof value);
}

bool IsTerminatedText(const unsigned char* data, std::size_t size) {
  if (size < kUnit || size % kUnit != 0) return false;
  return Load<char16_t>(data + size - kUnit) == 0;
}

}  // namespace

bool IsConsistent(const Value& value) {
  if (value.type == kNoValue || value.type > std::numeric_limits<std::uint8_t>::max()) return false;
  if (value.name.bytes / kUnit > std::numeric_limits<std::uint16_t>::max()) return false;
  if (value.elementSize == 0) return IsTerminatedText(value.data, value.dataSize);
  return value.dataSize == value.elementSize;
}

Value ValueAt(const unsigned char* record) {
  Value value;
  value.dataSize = Load<std::uint32_t>(record + kDataSizeAt);
  value.elementSize = Load<std::uint32_t>(record + kElementSizeAt);
  value.type = record[kTypeAt];
  value.dimension = record[kValueDimensionAt];
  value.name.units = record + kValueHeader;
  value.name.bytes = kUnit * Load<std::uint16_t>(record + kValueNameUnitsAt);
  value.data = value.name.units + value.name.bytes;
  return value;
}

std::size_t ValueRecordSize(const Value& value) {
  return kValueHeader + value.name.bytes + value.dataSize;
}

std::optional<Value> TakeValue(Bytes& bytes) {
  if (bytes.size() < kValueHeader) return std::nullopt;
  const Value value = ValueAt(bytes.data());
  const std::size_t size = ValueRecordSize(value);
  if (size > bytes.size() || !IsConsistent(value)) return std::nullopt;
  bytes.remove_prefix(size);
  return value;
}

Key KeyAt(const unsigned char* record) {
  Key key;
  key.dimension = record[kKeyDimensionAt];
  key.name.units = record + kKeyHeader;
  key.name.bytes = kUnit * Load<std::uint16_t>(record + kKeyNameUnitsAt);
  const unsigned char* const values = key.name.units + key.name.bytes;
  key.values = Bytes(values, Load<std::uint64_t>(record + kValuesSizeAt));
  key.keys = Bytes(values + key.values.size(), Load<std::uint64_t>(record + kKeysSizeAt));
  return key;
}

std::optional<Key> TakeKey(Bytes& bytes) {
  if (bytes.size() < kKeyHeader) return std::nullopt;
  const unsigned char* const record = bytes.data();
  const std::size_t name = kUnit * Load<std::uint16_t>(record + kKeyNameUnitsAt);
  if (record[kKeyReservedAt] != 0 || bytes.size() - kKeyHeader < name) return std::nullopt;
  const std::size_t rest = bytes.size() - kKeyHeader - name;
  const auto values = Load<std::uint64_t>(record + kValuesSizeAt);
  const auto keys = Load<std::uint64_t>(record + kKeysSizeAt);
  if (values > rest || keys > rest - values) return std::nullopt;
  bytes.remove_prefix(kKeyHeader + name + values + keys);
  return KeyAt(record);
}

void AppendValue(Buffer& to, const Value& value) {
  Append(to, value.dataSize);
  Append(to, value.elementSize);
  Append(to, static_cast<std::uint16_t>(value.name.bytes / kUnit));
  Append(to, static_cast<std::uint8_t>(value.type));
  Append(to, value.dimension);
  AppendBytes(to, value.name.units, value.name.bytes);
  AppendBytes(to, value.data, value.dataSize);
}

KeyWriter::KeyWriter(Buffer& to, std::uint8_t dimension, const Name& name)
    : to_(to), start_(to.size()) {
  Append(to, std::uint64_t{0});
  Append(to, std::uint64_t{0});
  Append(to, static_cast<std::uint16_t>(name.bytes / kUnit));
  Append(to, dimension);
  Append(to, std::uint8_t{0});
  AppendBytes(to, name.units, name.bytes);
  valuesStart_ = to.size();
  keysStart_ = to.size();
}

void KeyWriter::EndValues() { keysStart_ = to_.size(); }

void KeyWriter::Close() {
  Patch(to_, start_ + kValuesSizeAt, std::uint64_t{keysStart_ - valuesStart_});
  Patch(to_, start_ + kKeysSizeAt, std::uint64_t{to_.size() - keysStart_});
}

}  // namespace orx::record
