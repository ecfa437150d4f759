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
  return {to, data};
}

Content::Content() {
  static constexpr unsigned char kNothing[kContentHeader] = {};
  shape_ = kNothing;
  data_ = kNothing;
}

Bytes WriteHead(unsigned char* to, std::uint8_t dimension, const Name& name) {
  Store(to + kKeyNameUnitsAt, static_cast<std::uint16_t>(name.bytes / kUnit));
  to[kKeyDimensionAt] = dimension;
  to[kKeyReservedAt] = 0;
  std::copy_n(name.units, name.bytes, to + kKeyHeader);
  return {to, HeadSize(name)};
}

bool WholeShape::IsWhole(const Content& content, int depth) {
  const unsigned char* const data = content.data().data();
  if (content.shape().data() == shape_ && depth >= depth_) {
    return std::all_of(texts_.begin(), texts_.end(), [data](const Text& text) {
      return IsTerminatedText(data + text.place, text.bytes);
    });
  }
  shape_ = nullptr;
  texts_.clear();
  if (!LookInto(content, depth, data)) return false;
  shape_ = content.shape().data();
  depth_ = depth;
  return true;
}

bool WholeShape::LookInto(const Content& content, int depth, const unsigned char* data) {
  if (depth < 0) return false;
  for (Part values = content.values(); !values.shapes.empty();) {
    const ValueRecord found = TakeValue(values);
    if (!found) return false;
    const Value value = found.value();
    if (value.elementSize != 0) continue;
    texts_.push_back({static_cast<std::size_t>(value.data - data), value.dataSize});
  }
  for (Part keys = content.keys(); !keys.shapes.empty();) {
    const KeyRecord sub = TakeKey(keys);
    if (!sub || !LookInto(sub.content(), depth - 1, data)) return false;
  }
  return true;
}

ContentWriter::ContentWriter(ContentBuffer& to)
    : to_(to), start_(to.shape.size()), dataStart_(to.data.size()) {
  to.shape.resize(start_ + kContentHeader);
}

void ContentWriter::Append(const Part& part) {
  AppendBytes(to_.shape, part.shapes);
  AppendBytes(to_.data, part.data);
}

void ContentWriter::EndValues() {
  valuesShape_ = to_.shape.size() - start_ - kContentHeader;
  valuesData_ = to_.data.size() - dataStart_;
}

void ContentWriter::Close() {
  unsigned char* const header = to_.shape.data() + start_;
  const std::size_t shape = to_.shape.size() - start_ - kContentHeader;
  Store(header + kValuesShapeAt, std::uint64_t{valuesShape_});
  Store(header + kKeysShapeAt, std::uint64_t{shape - valuesShape_});
  Store(header + kValuesDataAt, std::uint64_t{valuesData_});
  Store(header + kKeysDataAt, std::uint64_t{to_.data.size() - dataStart_ - valuesData_});
}

}  // namespace orx::record
