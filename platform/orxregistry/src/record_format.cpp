#include "record_format.h"

#include <random>

#define XXH_INLINE_ALL
#include <xxhash.h>

namespace orx::record {
std::size_t HashOf(const Name& name) {
  static const std::uint64_t seed = std::random_device()();
  return XXH3_64bits_withSeed(name.units, name.bytes, seed);
}

bool IsWhole(Bytes bytes, int depth) {
  const std::optional<Key> key = TakeKey(bytes);
  if (!key || !bytes.empty() || depth < 0) return false;
  for (Bytes values = key->values; !values.empty();) {
    if (!TakeValue(values)) return false;
  }
  for (Bytes keys = key->keys; !keys.empty();) {
    const Bytes all = keys;
    if (!TakeKey(keys)) return false;
    if (!IsWhole(all.substr(0, all.size() - keys.size()), depth - 1)) return false;
  }
  return true;
}

void AppendValue(Buffer& to, const Value& value) {
  Append(to, value.dataSize);
  Append(to, value.elementSize);
  Append(to, static_cast<std::uint16_t>(value.name.bytes / kUnit));
  Append(to, static_cast<std::uint8_t>(value.type));
  Append(to, value.dimension);
  AppendBytes(to, {value.name.units, value.name.bytes});
  AppendBytes(to, {value.data, value.dataSize});
}

KeyWriter::KeyWriter(Buffer& to, std::uint8_t dimension, const Name& name)
    : to_(to), start_(to.size()) {
  Append(to, std::uint64_t{0});
  Append(to, std::uint64_t{0});
  Append(to, static_cast<std::uint16_t>(name.bytes / kUnit));
  Append(to, dimension);
  Append(to, std::uint8_t{0});
  AppendBytes(to, {name.units, name.bytes});
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
