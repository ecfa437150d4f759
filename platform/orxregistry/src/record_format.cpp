#include "record_format.h"

#include <algorithm>
#include <random>

#define XXH_INLINE_ALL
#include <xxhash.h>

namespace orx::record {

std::size_t HashOf(const Name& name) {
  static const std::uint64_t seed = std::random_device()();
  return XXH3_64bits_withSeed(name.units, name.bytes, seed);
}

ValueRecord WriteValue(unsigned char* to, const Value& value) {
  Store(to + kDataSizeAt, value.dataSize);
  Store(to + kElementSizeAt, value.elementSize);
  Store(to + kValueNameUnitsAt, static_cast<std::uint16_t>(value.name.bytes / kUnit));
  to[kTypeAt] = static_cast<unsigned char>(value.type);
  to[kValueDimensionAt] = value.dimension;
  unsigned char* const data = std::copy_n(value.name.units, value.name.bytes, to + kValueHeader);
  std::copy_n(value.data, value.dataSize, data);
  return ValueRecord(to);
}

KeyRecord WriteEmptyKey(unsigned char* to, std::uint8_t dimension, const Name& name) {
  Store(to + kValuesSizeAt, std::uint64_t{0});
  Store(to + kKeysSizeAt, std::uint64_t{0});
  Store(to + kKeyNameUnitsAt, static_cast<std::uint16_t>(name.bytes / kUnit));
  to[kKeyDimensionAt] = dimension;
  to[kKeyReservedAt] = 0;
  std::copy_n(name.units, name.bytes, to + kKeyHeader);
  return KeyRecord(to);
}

bool IsWhole(Bytes bytes, int depth) {
  const KeyRecord key = TakeKey(bytes);
  if (!key || !bytes.empty() || depth < 0) return false;
  for (Bytes values = key.values(); !values.empty();) {
    if (!TakeValue(values)) return false;
  }
  for (Bytes keys = key.keys(); !keys.empty();) {
    const KeyRecord sub = TakeKey(keys);
    if (!sub || !IsWhole(sub.bytes(), depth - 1)) return false;
  }
  return true;
}

KeyWriter::KeyWriter(Buffer& to, std::uint8_t dimension, const Name& name)
    : to_(to), start_(to.size()) {
  to.resize(start_ + EmptyKeySize(name));
  WriteEmptyKey(to.data() + start_, dimension, name);
  valuesStart_ = to.size();
  keysStart_ = to.size();
}

void KeyWriter::EndValues() { keysStart_ = to_.size(); }

void KeyWriter::Close() {
  unsigned char* const record = to_.data() + start_;
  Store(record + kValuesSizeAt, std::uint64_t{keysStart_ - valuesStart_});
  Store(record + kKeysSizeAt, std::uint64_t{to_.size() - keysStart_});
}

}  // namespace orx::record
