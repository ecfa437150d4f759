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

/// Keys and values, in files and in memory alike: see docs/gff-format.md. What a key holds is kept
/// in two parts: its shape, which is all but the bytes of the values, and its data, which are
/// these. Entries of one kind have one shape. Integers are little-endian, nothing is aligned.
/// Nothing here trusts a byte that it reads.
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

// Where the fields of a value's shape are; its name is behind them.
inline constexpr std::size_t kDataSizeAt = 0;
inline constexpr std::size_t kElementSizeAt = 4;
inline constexpr std::size_t kValueNameUnitsAt = 8;
inline constexpr std::size_t kTypeAt = 10;
inline constexpr std::size_t kValueDimensionAt = 11;
inline constexpr std::size_t kValueHeader = 12;

// The same for a key's head, which is all of it but what it holds.
inline constexpr std::size_t kKeyNameUnitsAt = 0;
inline constexpr std::size_t kKeyDimensionAt = 2;
inline constexpr std::size_t kKeyReservedAt = 3;
inline constexpr std::size_t kKeyHeader = 4;

// The same for the shape of what a key holds: bytes of the shapes of values and of sub-keys, which
// are behind these fields, and bytes of their data.
inline constexpr std::size_t kValuesShapeAt = 0;
inline constexpr std::size_t kKeysShapeAt = 8;
inline constexpr std::size_t kValuesDataAt = 16;
inline constexpr std::size_t kKeysDataAt = 24;
inline constexpr std::size_t kContentHeader = 32;

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

/// Shapes of values or of keys, one behind the other, and their data in the same order.
struct Part {
  Bytes shapes;
  Bytes data;
};

/// A whole value whose description and data agree; made only by those who have checked it or
/// written it. It lies in a file's bytes or in a tree's memory.
class ValueRecord {
 public:
  /// None.
  ValueRecord() = default;

  explicit operator bool() const { return shape_ != nullptr; }
  Name name() const {
    return {shape_ + kValueHeader, kUnit * Load<std::uint16_t>(shape_ + kValueNameUnitsAt)};
  }
  Value value() const;
  Bytes shape() const { return {shape_, kValueHeader + name().bytes}; }
  Bytes data() const { return {data_, Load<std::uint32_t>(shape_ + kDataSizeAt)}; }

 private:
  friend ValueRecord TakeValue(Part& values);
  friend ValueRecord WriteValue(unsigned char* to, const Value& value);
  ValueRecord(const unsigned char* shape, const unsigned char* data) : shape_(shape), data_(data) {}

  const unsigned char* shape_ = nullptr;
  const unsigned char* data_ = nullptr;
};

inline Value ValueRecord::value() const {
  Value value;
  value.dataSize = Load<std::uint32_t>(shape_ + kDataSizeAt);
  value.elementSize = Load<std::uint32_t>(shape_ + kElementSizeAt);
  value.type = shape_[kTypeAt];
  value.dimension = shape_[kValueDimensionAt];
  value.name = name();
  value.data = data_;
  return value;
}

/// Takes the value at the front off a part; none when it is not a whole value.
inline ValueRecord TakeValue(Part& values) {
  if (values.shapes.size() < kValueHeader) return {};
  const ValueRecord record(values.shapes.data(), values.data.data());
  const std::size_t shape = kValueHeader + record.name().bytes;
  const std::size_t data = record.data().size();
  if (shape > values.shapes.size() || data > values.data.size()) return {};
  const bool isLast = shape == values.shapes.size();
  if (isLast && data != values.data.size()) return {};
  if (!IsConsistent(record.value())) return {};
  values.shapes.remove_prefix(shape);
  values.data.remove_prefix(data);
  return record;
}

/// Bytes of a value, its description and its name included.
inline std::size_t ValueSize(const Value& value) {
  return kValueHeader + value.name.bytes + value.dataSize;
}

/// \param to room for ValueSize() bytes
/// \param value one that IsConsistent()
ValueRecord WriteValue(unsigned char* to, const Value& value);

/// What a key holds, of a size that its shape and its data agree about; made only by those who have
/// checked that. What the values and sub-keys are is not known yet.
class Content {
 public:
  /// Nothing.
  Content();

  Part values() const {
    return {{shape_ + kContentHeader, Size(kValuesShapeAt)}, {data_, Size(kValuesDataAt)}};
  }
  Part keys() const {
    return {{shape_ + kContentHeader + Size(kValuesShapeAt), Size(kKeysShapeAt)},
            {data_ + Size(kValuesDataAt), Size(kKeysDataAt)}};
  }
  Bytes shape() const {
    return {shape_, kContentHeader + Size(kValuesShapeAt) + Size(kKeysShapeAt)};
  }
  Bytes data() const { return {data_, Size(kValuesDataAt) + Size(kKeysDataAt)}; }
  bool IsEmpty() const { return shape().size() == kContentHeader; }

 private:
  friend std::optional<Content> TakeContent(Part& part);
  Content(const unsigned char* shape, const unsigned char* data) : shape_(shape), data_(data) {}
  std::size_t Size(std::size_t field) const { return Load<std::uint64_t>(shape_ + field); }

  const unsigned char* shape_;
  const unsigned char* data_;
};

/// Takes what a key holds off the front of a part; nothing when it is not whole.
inline std::optional<Content> TakeContent(Part& part) {
  if (part.shapes.size() < kContentHeader) return std::nullopt;
  const Content content(part.shapes.data(), part.data.data());
  const std::size_t shapeRest = part.shapes.size() - kContentHeader;
  const std::size_t valuesShape = content.Size(kValuesShapeAt);
  const std::size_t valuesData = content.Size(kValuesDataAt);
  const std::size_t keysShape = content.Size(kKeysShapeAt);
  const std::size_t keysData = content.Size(kKeysDataAt);
  if (valuesShape > shapeRest || keysShape > shapeRest - valuesShape) return std::nullopt;
  if (valuesData > part.data.size() || keysData > part.data.size() - valuesData) {
    return std::nullopt;
  }
  if (valuesShape == 0 && valuesData != 0) return std::nullopt;
  if (keysShape == 0 && keysData != 0) return std::nullopt;
  part.shapes.remove_prefix(kContentHeader + valuesShape + keysShape);
  part.data.remove_prefix(valuesData + keysData);
  return content;
}

/// What a key holds that has all of this shape and of these data; nothing when they disagree.
inline std::optional<Content> MakeContent(Bytes shape, Bytes data) {
  Part part{shape, data};
  const std::optional<Content> content = TakeContent(part);
  return part.shapes.empty() && part.data.empty() ? content : std::nullopt;
}

/// The same where the data lie behind the shape.
inline std::optional<Content> SplitContent(Bytes bytes) {
  Part part{bytes, bytes};
  const std::optional<Content> content = TakeContent(part);
  if (!content) return std::nullopt;
  const std::size_t shape = content->shape().size();
  return MakeContent(bytes.substr(0, shape), bytes.substr(shape));
}

/// A key: its head, which is its name and its dimension, and what it holds.
class KeyRecord {
 public:
  /// None.
  KeyRecord() = default;

  explicit operator bool() const { return head_ != nullptr; }
  Name name() const {
    return {head_ + kKeyHeader, kUnit * Load<std::uint16_t>(head_ + kKeyNameUnitsAt)};
  }
  std::uint8_t dimension() const { return head_[kKeyDimensionAt]; }
  Bytes head() const { return {head_, kKeyHeader + name().bytes}; }
  const Content& content() const { return content_; }

 private:
  friend Bytes TakeHead(Bytes& bytes);
  friend KeyRecord MakeKey(Bytes head, const Content& content);
  KeyRecord(const unsigned char* head, const Content& content) : head_(head), content_(content) {}

  const unsigned char* head_ = nullptr;
  Content content_;
};

/// Takes a key's head off the front of `bytes`; an empty one when it is not whole.
inline Bytes TakeHead(Bytes& bytes) {
  if (bytes.size() < kKeyHeader || bytes[kKeyReservedAt] != 0) return {};
  const Bytes head = KeyRecord(bytes.data(), {}).head();
  if (head.size() > bytes.size()) return {};
  bytes.remove_prefix(head.size());
  return head;
}

/// \param head one that TakeHead() or WriteHead() gave
inline KeyRecord MakeKey(Bytes head, const Content& content) { return {head.data(), content}; }

/// Takes the key at the front off a part; none when it is not a whole key.
inline KeyRecord TakeKey(Part& keys) {
  const Bytes head = TakeHead(keys.shapes);
  if (head.empty()) return {};
  const std::optional<Content> content = TakeContent(keys);
  if (!content) return {};
  if (keys.shapes.empty() && !keys.data.empty()) return {};
  return MakeKey(head, *content);
}

/// Bytes of a key's head.
inline std::size_t HeadSize(const Name& name) { return kKeyHeader + name.bytes; }

/// \param to room for HeadSize() bytes
Bytes WriteHead(unsigned char* to, std::uint8_t dimension, const Name& name);

/// Tells whether everything that a key holds is whole. Of many keys in turn most have one shape, of
/// which only the texts are looked at then.
class WholeShape {
 public:
  /// \param content in memory that lives as long as this
  /// \param depth so many levels deep at most
  bool IsWhole(const Content& content, int depth);

 private:
  struct Text {
    std::size_t place;
    std::size_t bytes;
  };

  bool LookInto(const Content& content, int depth, const unsigned char* data);

  const unsigned char* shape_ = nullptr;  ///< that of the last one which was whole
  int depth_ = 0;                         ///< the same
  std::vector<Text> texts_;               ///< in its data
};

inline void AppendBytes(Buffer& to, Bytes bytes) {
  to.insert(to.end(), bytes.begin(), bytes.end());
}

/// Where what a key holds is written: the shape to one place, the data to another.
struct ContentBuffer {
  Buffer shape;
  Buffer data;
};

/// Writes what a key holds: what is appended between construction and Close().
class ContentWriter {
 public:
  explicit ContentWriter(ContentBuffer& to);
  void Append(const Part& part);
  void Append(ValueRecord value) { Append({value.shape(), value.data()}); }
  /// Values are complete; sub-keys follow.
  void EndValues();
  void Close();

 private:
  ContentBuffer& to_;
  std::size_t start_;
  std::size_t valuesShape_ = 0;
  std::size_t valuesData_ = 0;
  std::size_t dataStart_;
};

/// What a ContentWriter has written.
inline Content ContentOf(const ContentBuffer& written) {
  const Bytes shape(written.shape.data(), written.shape.size());
  return *MakeContent(shape, {written.data.data(), written.data.size()});
}

}  // namespace orx::record
