#pragma once

#include <cmath>
#include <cstdint>
#include <cstring>
#include <iterator>
#include <random>
#include <string>
#include <string_view>
#include <vector>

#define XXH_INLINE_ALL
#include <xxhash.h>

/// Registry files taken apart, spoiled in one place and put together again with right sizes and
/// checksums, so that what is tried lies behind them. Follows docs/gff-format.md and shares no code
/// with the library.
namespace velta_fuzz {

struct Value {
  std::uint32_t elementSize = 0;
  std::uint8_t type = 0;
  std::uint8_t dimension = 0;
  std::string name;
  std::string data;
};

struct Key {
  std::uint8_t dimension = 0;
  std::string name;
  std::vector<Value> values;
  std::vector<Key> keys;
};

/// A segment: the record of its root, not taken apart.
struct Segment {
  std::uint64_t superseded = 0;
  std::string tree;
};

template <class Integer>
void Append(std::string& to, Integer value) {
  to.append(reinterpret_cast<const char*>(&value), sizeof value);
}

/// Takes what is asked for off the front of `bytes`, or what there is.
inline std::string_view Take(std::string_view& bytes, std::size_t size) {
  const std::string_view taken = bytes.substr(0, size);
  bytes.remove_prefix(taken.size());
  return taken;
}

template <class Integer>
Integer TakeInteger(std::string_view& bytes) {
  Integer value = 0;
  const std::string_view taken = Take(bytes, sizeof value);
  std::memcpy(&value, taken.data(), taken.size());
  return value;
}

inline std::vector<Segment> TakeApart(std::string_view file) {
  std::vector<Segment> segments;
  Take(file, 12);
  Take(file, TakeInteger<std::uint32_t>(file));
  Take(file, 8);
  while (!file.empty()) {
    Take(file, 8);
    const auto size = TakeInteger<std::uint64_t>(file);
    const auto superseded = TakeInteger<std::uint64_t>(file);
    Take(file, 16);
    segments.push_back({superseded, std::string(Take(file, size))});
  }
  return segments;
}

/// \param description in UTF-16
inline std::string PutTogether(const std::vector<Segment>& segments,
                               const std::string& description = "") {
  const auto checksum = [](const std::string& bytes, std::size_t from, std::uint64_t seed = 0) {
    return std::uint64_t{XXH3_64bits_withSeed(bytes.data() + from, bytes.size() - from, seed)};
  };
  std::string file("\x89ORX\r\n\x1A\n\0\2\0\0", 12);
  Append(file, static_cast<std::uint32_t>(description.size()));
  file += description;
  Append(file, checksum(file, 0));
  for (const Segment& segment : segments) {
    const std::size_t at = file.size();
    file.append("SEG1\0\0\0\0", 8);
    Append(file, std::uint64_t{segment.tree.size()});
    Append(file, segment.superseded);
    Append(file, checksum(segment.tree, 0));
    Append(file, checksum(file, at, at));
    file += segment.tree;
  }
  return file;
}

inline Key TakeKey(std::string_view& bytes, int depth = 0) {
  Key key;
  std::string_view header = Take(bytes, 20);
  const auto valuesSize = TakeInteger<std::uint64_t>(header);
  const auto keysSize = TakeInteger<std::uint64_t>(header);
  const std::size_t nameSize = 2 * std::size_t{TakeInteger<std::uint16_t>(header)};
  key.dimension = TakeInteger<std::uint8_t>(header);
  key.name = Take(bytes, nameSize);
  std::string_view values = Take(bytes, valuesSize);
  std::string_view keys = Take(bytes, keysSize);
  while (!values.empty()) {
    Value value;
    const auto dataSize = TakeInteger<std::uint32_t>(values);
    value.elementSize = TakeInteger<std::uint32_t>(values);
    const std::size_t valueNameSize = 2 * std::size_t{TakeInteger<std::uint16_t>(values)};
    value.type = TakeInteger<std::uint8_t>(values);
    value.dimension = TakeInteger<std::uint8_t>(values);
    value.name = Take(values, valueNameSize);
    value.data = Take(values, dataSize);
    key.values.push_back(value);
  }
  while (!keys.empty() && depth < 100) key.keys.push_back(TakeKey(keys, depth + 1));
  return key;
}

inline std::string BytesOf(const Value& value) {
  std::string bytes;
  Append(bytes, static_cast<std::uint32_t>(value.data.size()));
  Append(bytes, value.elementSize);
  Append(bytes, static_cast<std::uint16_t>(value.name.size() / 2));
  Append(bytes, value.type);
  Append(bytes, value.dimension);
  return bytes.append(value.name, 0, value.name.size() / 2 * 2) + value.data;
}

/// A key's record around its values' and its keys'.
inline std::string Around(const Key& key, const std::string& values, const std::string& keys) {
  std::string bytes;
  Append(bytes, std::uint64_t{values.size()});
  Append(bytes, std::uint64_t{keys.size()});
  Append(bytes, static_cast<std::uint16_t>(key.name.size() / 2));
  Append(bytes, key.dimension);
  Append(bytes, std::uint8_t{0});
  return bytes.append(key.name, 0, key.name.size() / 2 * 2) + values + keys;
}

inline std::string BytesOf(const Key& key) {
  std::string values, keys;
  for (const Value& value : key.values) values += BytesOf(value);
  for (const Key& sub : key.keys) keys += BytesOf(sub);
  return Around(key, values, keys);
}

/// Spoils registry files; `Mutate(bytes, size, largest size)` spoils plain bytes.
template <class Mutate>
class Spoiler {
 public:
  Spoiler(unsigned seed, Mutate* mutate) : random_(seed), mutate_(mutate) {}

  std::string operator()(std::string_view file) {
    std::vector<Segment> segments = TakeApart(file);
    if (segments.empty() || Chance(16)) return PutTogether({{0, Small(std::string(file))}});
    Segment& segment = Any(segments);
    switch (random_() % 8) {
      case 0:
        segments.push_back(segment);
        break;
      case 1:
        segments.erase(segments.begin() + (&segment - segments.data()));
        break;
      case 2:
        segment.superseded = Chance(2) ? 0 : random_();
        break;
      case 3:
        segment.tree = Small(segment.tree);
        break;
      default:
        std::string_view bytes = segment.tree;
        Key root = TakeKey(bytes);
        Spoil(root);
        segment.tree = BytesOf(root);
    }
    return PutTogether(segments);
  }

 private:
  bool Chance(unsigned oneIn) { return random_() % oneIn == 0; }
  template <class Item>
  Item& Any(std::vector<Item>& items) {
    return items[random_() % items.size()];
  }
  /// Spoils a few bytes.
  std::string Small(std::string bytes) {
    const std::size_t size = bytes.size();
    bytes.resize(size + 64);
    bytes.resize(mutate_(reinterpret_cast<std::uint8_t*>(bytes.data()), size, bytes.size()));
    return bytes;
  }

  /// A key somewhere below this one, or it.
  Key& AnyKey(Key& key) {
    Key* found = &key;
    while (!found->keys.empty() && !Chance(4)) found = &Any(found->keys);
    return *found;
  }

  void Spoil(Key& root) {
    Key& key = AnyKey(root);
    switch (random_() % 8) {
      case 0:
        key.name = Small(key.name);
        break;
      case 1:
        if (!key.keys.empty())
          key.keys.erase(key.keys.begin() + (&Any(key.keys) - key.keys.data()));
        break;
      case 2: {
        Key copy = AnyKey(root);  // also below itself
        key.keys.push_back(std::move(copy));
        break;
      }
      case 3: {
        const Key& other = AnyKey(root);
        std::vector<Value> copies = other.values;
        key.values.insert(key.values.end(), copies.begin(), copies.end());
        break;
      }
      default:
        if (!key.values.empty()) Spoil(key, Any(key.values));
    }
  }

  void Spoil(Key& key, Value& value) {
    switch (random_() % 8) {
      case 0:
        value.name = Small(value.name);
        return;
      case 1:
        key.values.erase(key.values.begin() + (&value - key.values.data()));
        return;
      case 2:
        (Chance(2) ? value.type : value.dimension) = static_cast<std::uint8_t>(random_() % 8);
        return;
      case 3:
        value.elementSize = Chance(2) ? 0 : static_cast<std::uint32_t>(random_());
        return;
      case 4:
      case 5:
        if (value.data.size() >= sizeof(double)) {
          constexpr double kOdd[] = {0.0,   -0.0,  1.0,      6.3,        1e-300,
                                     1e300, -1e18, INFINITY, double{NAN}};
          const std::size_t at = random_() % (value.data.size() / sizeof(double)) * sizeof(double);
          std::memcpy(value.data.data() + at, &kOdd[random_() % std::size(kOdd)], sizeof(double));
          return;
        }
        [[fallthrough]];
      default:
        value.data = Small(value.data);
        if (Chance(8)) return;
        if (value.elementSize == 0) {
          value.data.resize(value.data.size() / 2 * 2);
          value.data.append(2, '\0');
        } else {
          value.elementSize = static_cast<std::uint32_t>(value.data.size());
        }
    }
  }

  std::minstd_rand random_;
  Mutate* mutate_;
};

}  // namespace velta_fuzz
