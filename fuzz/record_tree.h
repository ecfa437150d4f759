#pragma once

#include <cmath>
#include <cstdint>
#include <cstring>
#include <iterator>
#include <map>
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

/// What a key holds, or several do: the shapes, and the data in the same order.
struct Content {
  std::string shape;
  std::string data;
};

enum PieceKind : std::uint8_t { kTree = 1, kShape, kEntry, kNode, kTrailer };

/// A piece as it lies in a file. Where others refer to it, they do so by its place.
struct Piece {
  std::uint8_t kind = 0;
  std::string content;
  std::uint64_t at = 0;
};

struct Segment {
  std::uint64_t superseded = 0;
  std::vector<Piece> pieces;
  std::uint64_t at = 0;
};

struct File {
  std::string description;  ///< in UTF-16
  std::string areas;        ///< as they are stored
  std::uint32_t fanOut = 64;
  std::vector<Segment> segments;
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

inline std::uint64_t Checksum(std::string_view bytes, std::uint64_t seed = 0) {
  return XXH3_64bits_withSeed(bytes.data(), bytes.size(), seed);
}

inline File TakeApart(std::string_view bytes) {
  const std::size_t size = bytes.size();
  const auto here = [&] { return std::uint64_t{size - bytes.size()}; };
  File file;
  Take(bytes, 12);
  const auto description = TakeInteger<std::uint32_t>(bytes);
  const auto areas = TakeInteger<std::uint32_t>(bytes);
  file.fanOut = TakeInteger<std::uint32_t>(bytes);
  file.description = Take(bytes, description);
  file.areas = Take(bytes, areas);
  Take(bytes, 8);
  while (!bytes.empty()) {
    Segment& segment = file.segments.emplace_back();
    segment.at = here();
    Take(bytes, 8);
    const std::uint64_t end = TakeInteger<std::uint64_t>(bytes) + here() + 16;
    segment.superseded = TakeInteger<std::uint64_t>(bytes);
    Take(bytes, 8);
    while (!bytes.empty() && here() < end) {
      Piece& piece = segment.pieces.emplace_back();
      piece.at = here();
      Take(bytes, 8);
      const auto kindAndSize = TakeInteger<std::uint64_t>(bytes);
      piece.kind = static_cast<std::uint8_t>(kindAndSize);
      piece.content = Take(bytes, kindAndSize >> 8);
    }
  }
  return file;
}

/// Where in a piece the places of others are.
inline std::vector<std::size_t> ReferencesIn(const Piece& piece) {
  if (piece.kind == kEntry) return {0};
  if (piece.kind == kTrailer) return {0, 8, 16};
  if (piece.kind != kNode) return {};
  std::string_view content = piece.content;
  Take(content, 4);
  const auto items = TakeInteger<std::uint32_t>(content);
  std::vector<std::size_t> found;
  for (std::size_t i = 0; i < items && i < content.size(); ++i) {
    found.push_back(8 + i * (content.size() / items));
  }
  return found;
}

/// Puts another place where a piece says that something is.
inline void Refer(std::string& content, std::size_t at,
                  const std::map<std::uint64_t, std::uint64_t>& places) {
  std::uint64_t place = 0;
  if (content.size() < at + sizeof place) return;
  std::memcpy(&place, content.data() + at, sizeof place);
  const auto found = places.find(place);
  if (found != places.end()) std::memcpy(content.data() + at, &found->second, sizeof place);
}

/// \return the file, with all checksums and sizes right, and what refers to the place of something
///     referring to where that is now
inline std::string PutTogether(const File& file) {
  std::string bytes("\x89ORX\r\n\x1A\2\0\2\0\0", 12);
  Append(bytes, static_cast<std::uint32_t>(file.description.size()));
  Append(bytes, static_cast<std::uint32_t>(file.areas.size()));
  Append(bytes, file.fanOut);
  bytes += file.description + file.areas;
  Append(bytes, Checksum(bytes));
  std::map<std::uint64_t, std::uint64_t> places;
  std::uint64_t place = bytes.size();
  std::uint64_t oldEnd = 0;
  for (const Segment& segment : file.segments) {
    places[segment.at] = place;
    place += 32;
    for (const Piece& piece : segment.pieces) {
      places[piece.at] = place;
      place += 16 + piece.content.size();
      oldEnd = piece.at + 16 + piece.content.size();
    }
  }
  places.emplace(oldEnd, place);
  for (const Segment& segment : file.segments) {
    const std::uint64_t segmentAt = bytes.size();
    std::string pieces;
    for (Piece piece : segment.pieces) {
      for (const std::size_t at : ReferencesIn(piece)) Refer(piece.content, at, places);
      std::string checked;
      Append(checked, std::uint64_t{piece.content.size()} << 8 | piece.kind);
      checked += piece.content;
      Append(pieces, Checksum(checked, segmentAt + 32 + pieces.size()));
      pieces += checked;
    }
    bytes.append("SEG1\0\0\0\0", 8);
    Append(bytes, std::uint64_t{pieces.size()});
    Append(bytes, segment.superseded);
    Append(bytes, Checksum(std::string_view(bytes).substr(segmentAt), segmentAt));
    bytes += pieces;
  }
  return bytes;
}

/// A file that has no index yet, with small nodes from now on, so that a few entries fill some.
inline std::string WithFanOut(std::uint32_t items, std::string_view bytes) {
  File file = TakeApart(bytes);
  file.fanOut = items;
  return PutTogether(file);
}

inline Key TakeHead(std::string_view& bytes) {
  Key key;
  const std::size_t nameSize = 2 * std::size_t{TakeInteger<std::uint16_t>(bytes)};
  key.dimension = TakeInteger<std::uint8_t>(bytes);
  Take(bytes, 1);
  key.name = Take(bytes, nameSize);
  return key;
}

/// A key without a name.
inline Key TakeContent(std::string_view& shape, std::string_view& data, int depth = 0) {
  Key key;
  const auto valuesShape = TakeInteger<std::uint64_t>(shape);
  const auto keysShape = TakeInteger<std::uint64_t>(shape);
  Take(shape, 16);
  std::string_view values = Take(shape, valuesShape);
  std::string_view keys = Take(shape, keysShape);
  while (!values.empty()) {
    Value value;
    const auto dataSize = TakeInteger<std::uint32_t>(values);
    value.elementSize = TakeInteger<std::uint32_t>(values);
    const std::size_t nameSize = 2 * std::size_t{TakeInteger<std::uint16_t>(values)};
    value.type = TakeInteger<std::uint8_t>(values);
    value.dimension = TakeInteger<std::uint8_t>(values);
    value.name = Take(values, nameSize);
    value.data = Take(data, dataSize);
    key.values.push_back(value);
  }
  while (!keys.empty() && depth < 100) {
    const Key head = TakeHead(keys);
    Key& sub = key.keys.emplace_back(TakeContent(keys, data, depth + 1));
    sub.name = head.name;
    sub.dimension = head.dimension;
  }
  return key;
}

inline Content ContentOf(const Value& value) {
  Content content;
  Append(content.shape, static_cast<std::uint32_t>(value.data.size()));
  Append(content.shape, value.elementSize);
  Append(content.shape, static_cast<std::uint16_t>(value.name.size() / 2));
  Append(content.shape, value.type);
  Append(content.shape, value.dimension);
  content.shape.append(value.name, 0, value.name.size() / 2 * 2);
  content.data = value.data;
  return content;
}

/// What a key holds around its values' and its keys'.
inline Content Around(const Content& values, const Content& keys) {
  Content content;
  for (const std::string* const part : {&values.shape, &keys.shape, &values.data, &keys.data}) {
    Append(content.shape, std::uint64_t{part->size()});
  }
  content.shape += values.shape + keys.shape;
  content.data = values.data + keys.data;
  return content;
}

inline std::string HeadOf(const Key& key) {
  std::string head;
  Append(head, static_cast<std::uint16_t>(key.name.size() / 2));
  Append(head, key.dimension);
  Append(head, std::uint8_t{0});
  return head.append(key.name, 0, key.name.size() / 2 * 2);
}

inline Content ContentOf(const Key& key) {
  Content values;
  Content keys;
  for (const Value& value : key.values) {
    const Content content = ContentOf(value);
    values.shape += content.shape;
    values.data += content.data;
  }
  for (const Key& sub : key.keys) {
    const Content content = ContentOf(sub);
    keys.shape += HeadOf(sub) + content.shape;
    keys.data += content.data;
  }
  return Around(values, keys);
}

/// An entry of the shape at a place.
inline Piece EntryOf(std::uint64_t shapeAt, const Key& key) {
  Piece piece{kEntry, {}, 0};
  Append(piece.content, shapeAt);
  piece.content += HeadOf(key) + ContentOf(key).data;
  return piece;
}

/// A segment with what the root holds; entries are sub-keys of the first key. Each new shape of
/// entries is in front of the first that has it, and a large one in front of each.
inline Segment SegmentOf(const Content& tree, const std::vector<Key>& entries = {}) {
  static std::uint64_t nowhere = std::uint64_t{1} << 60U;
  Segment segment;
  segment.at = ++nowhere;
  segment.pieces.push_back({kTree, tree.shape + tree.data, ++nowhere});
  std::map<std::string, std::uint64_t> shapes;
  for (const Key& entry : entries) {
    const Content content = ContentOf(entry);
    const auto [shape, isNew] = shapes.try_emplace(content.shape, nowhere + 1);
    const bool isLarge =
        16 + content.shape.size() >= 4 * (25 + HeadOf(entry).size() + content.data.size());
    if (isNew || isLarge)
      segment.pieces.push_back({kShape, content.shape, shape->second = ++nowhere});
    segment.pieces.push_back(EntryOf(shape->second, entry));
    segment.pieces.back().at = ++nowhere;
  }
  Piece& trailer = segment.pieces.emplace_back(Piece{kTrailer, {}, ++nowhere});
  Append(trailer.content, segment.at);
  trailer.content.append(16, '\0');
  return segment;
}

/// The same of a key: what it holds, its first sub-key's being the entries.
inline Segment SegmentOf(Key root) {
  std::vector<Key> entries;
  if (!root.keys.empty()) entries.swap(root.keys.front().keys);
  return SegmentOf(ContentOf(root), entries);
}

/// Spoils registry files; `Mutate(bytes, size, largest size)` spoils plain bytes.
template <class Mutate>
class Spoiler {
 public:
  Spoiler(unsigned seed, Mutate* mutate) : random_(seed), mutate_(mutate) {}

  std::string operator()(std::string_view bytes) {
    File file = TakeApart(bytes);
    if (file.segments.empty() || Chance(16)) {
      return PutTogether({{}, {}, 64, {SegmentOf(Content{Small(std::string(bytes)), {}})}});
    }
    Segment& segment = Any(file.segments);
    switch (random_() % 8) {
      case 0:
        file.segments.push_back(segment);
        break;
      case 1:
        file.segments.erase(file.segments.begin() + (&segment - file.segments.data()));
        break;
      case 2:
        (Chance(2) ? segment.superseded : segment.at) = Chance(2) ? 0 : random_();
        if (Chance(4)) file.areas = Small(file.areas);
        break;
      default:
        if (!segment.pieces.empty()) Spoil(segment, Any(segment.pieces));
    }
    return PutTogether(file);
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

  void Spoil(Segment& segment, Piece& piece) {
    const auto place = segment.pieces.begin() + (&piece - segment.pieces.data());
    if (Chance(8)) {
      Piece copy = piece;
      segment.pieces.insert(place, std::move(copy));
    } else if (Chance(16)) {
      segment.pieces.erase(place);
    } else if (piece.kind == kTree) {
      Key root = TakeTree(piece.content);
      Spoil(root);
      const Content spoiled = ContentOf(root);
      piece.content = spoiled.shape + spoiled.data;
    } else if (const Piece* const shape = ShapeOf(segment, piece)) {
      std::string_view entry = piece.content;
      Take(entry, 8);
      const Key head = TakeHead(entry);
      std::string_view shapeBytes = shape->content;
      Key key = TakeContent(shapeBytes, entry);
      key.name = head.name;
      Spoil(key);
      const std::uint64_t at = piece.at + 1;
      piece.content = EntryOf(at, key).content;
      segment.pieces.insert(place, {kShape, ContentOf(key).shape, at});
    } else {
      piece.content = Small(piece.content);
    }
  }

  static Key TakeTree(std::string_view bytes) {
    std::string_view shape = bytes;
    std::string_view sizes = bytes;
    const std::uint64_t values = TakeInteger<std::uint64_t>(sizes);
    const std::uint64_t keys = TakeInteger<std::uint64_t>(sizes);
    std::string_view data = bytes;
    Take(data, 32 + values + keys);
    return TakeContent(shape, data);
  }

  /// \return the shape of an entry that lies in the same segment, or null
  static const Piece* ShapeOf(const Segment& segment, const Piece& piece) {
    std::string_view content = piece.content;
    const auto at = TakeInteger<std::uint64_t>(content);
    for (const Piece& shape : segment.pieces) {
      if (piece.kind == kEntry && shape.kind == kShape && shape.at == at) return &shape;
    }
    return nullptr;
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
