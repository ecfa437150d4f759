#include "file_format.h"

#include <algorithm>
#include <cstring>
#include <string_view>

#include "orxregistry/in_file_key.h"

#define XXH_INLINE_ALL
#include <xxhash.h>

namespace orx::format {
namespace {

using record::Append;
using record::AppendBytes;
using record::Load;
using record::Store;

// The file's header: magic with the layout's version in its last byte, registry version, sizes of
// the description and of the areas, fan-out, both, checksum.
constexpr unsigned char kMagic[8] = {0x89, 'O', 'R', 'X', '\r', '\n', 0x1A, 2};
constexpr std::size_t kVersionAt = sizeof kMagic;
constexpr std::size_t kDescriptionSizeAt = kVersionAt + sizeof(std::uint32_t);
constexpr std::size_t kAreasSizeAt = kDescriptionSizeAt + sizeof(std::uint32_t);
constexpr std::size_t kFanOutAt = kAreasSizeAt + sizeof(std::uint32_t);
constexpr std::size_t kDescriptionAt = kFanOutAt + sizeof(std::uint32_t);
constexpr std::size_t kChecksum = sizeof(std::uint64_t);
constexpr std::size_t kMaxText = 4096;
static_assert(kDescriptionAt + 2 * kMaxText + kChecksum <= kMaxFileHeader);
constexpr std::uint32_t kLeastFanOut = 2;
constexpr std::uint32_t kMostFanOut = 1024;

// A segment's header: mark, zero, size, superseded bytes, checksum, for which its place in the file
// is the seed.
constexpr std::uint32_t kSegmentMark = 0x31474553;  // "SEG1"
constexpr std::size_t kSizeAt = 8;
constexpr std::size_t kSupersededAt = 16;
constexpr std::size_t kSegmentChecksumAt = 24;

// A piece's header: checksum of all behind it, for which its place in the file is the seed, then
// its kind, in the lowest byte, and its size.
constexpr std::size_t kKindAndSizeAt = kChecksum;
constexpr unsigned kSizeShift = 8;
constexpr std::uint64_t kKindMask = 0xFF;

std::uint64_t Checksum(const unsigned char* bytes, std::size_t size, std::uint64_t seed = 0) {
  return XXH3_64bits_withSeed(bytes, size, seed);
}

Bytes BytesOf(std::u16string_view text) {
  return {reinterpret_cast<const unsigned char*>(text.data()), text.size() * sizeof(char16_t)};
}

std::u16string TextOf(Bytes bytes) {
  std::u16string text(bytes.size() / sizeof(char16_t), u'\0');
  std::memcpy(text.data(), bytes.data(), text.size() * sizeof(char16_t));
  return text;
}

// An area: its size, the number of needed names, flags, the names, each with the number of its
// units in front.
constexpr std::uint8_t kZeroIsUnknown = 1;

void AppendName(Buffer& to, const std::u16string& name) {
  Append(to, static_cast<std::uint16_t>(name.size()));
  AppendBytes(to, BytesOf(name));
}

void AppendArea(Buffer& to, const EntryArea& area) {
  Append(to, area.bytes);
  Append(to, static_cast<std::uint8_t>(area.needed.size()));
  Append(to, area.isZeroUnknown ? kZeroIsUnknown : std::uint8_t{0});
  AppendName(to, area.key);
  AppendName(to, area.value);
  for (const std::u16string& name : area.needed) AppendName(to, name);
}

template <class Integer>
bool Take(Bytes& bytes, Integer& to) {
  if (bytes.size() < sizeof to) return false;
  to = Load<Integer>(bytes.data());
  bytes.remove_prefix(sizeof to);
  return true;
}

bool TakeName(Bytes& bytes, std::u16string& name) {
  std::uint16_t units = 0;
  if (!Take(bytes, units) || bytes.size() < units * sizeof(char16_t)) return false;
  name = TextOf(bytes.substr(0, units * sizeof(char16_t)));
  bytes.remove_prefix(units * sizeof(char16_t));
  return true;
}

bool TakeArea(Bytes& bytes, EntryArea& area) {
  std::uint8_t needed = 0;
  std::uint8_t flags = 0;
  if (!Take(bytes, area.bytes) || area.bytes < 4 * sizeof(double)) return false;
  if (!Take(bytes, needed) || !Take(bytes, flags) || flags > kZeroIsUnknown) return false;
  area.isZeroUnknown = flags == kZeroIsUnknown;
  area.needed.resize(needed);
  if (!TakeName(bytes, area.key) || !TakeName(bytes, area.value)) return false;
  return std::all_of(area.needed.begin(), area.needed.end(),
                     [&](std::u16string& name) { return TakeName(bytes, name); });
}

Buffer MakeAreas(const EntryAreas& areas) {
  Buffer bytes;
  for (const EntryArea& area : areas) AppendArea(bytes, area);
  return bytes;
}

bool ReadAreas(Bytes bytes, EntryAreas& areas) {
  while (!bytes.empty()) {
    if (areas.size() == kMaxEntryAreas || !TakeArea(bytes, areas.emplace_back())) return false;
  }
  return true;
}

}  // namespace

bool AreRight(const EntryAreas& areas) {
  const Buffer bytes = MakeAreas(areas);
  EntryAreas read;
  return bytes.size() <= kMaxText && ReadAreas({bytes.data(), bytes.size()}, read) && read == areas;
}

std::optional<FileHeader> TakeFileHeader(Bytes& bytes) {
  if (bytes.size() < kDescriptionAt + kChecksum) return std::nullopt;
  if (std::memcmp(bytes.data(), kMagic, sizeof kMagic) != 0) return std::nullopt;
  if (Load<std::uint32_t>(bytes.data() + kVersionAt) != kRegistryVersion) return std::nullopt;
  const auto description = Load<std::uint32_t>(bytes.data() + kDescriptionSizeAt);
  const auto areas = Load<std::uint32_t>(bytes.data() + kAreasSizeAt);
  if (description > kMaxText || description % sizeof(char16_t) != 0) return std::nullopt;
  if (areas > kMaxText) return std::nullopt;
  const std::size_t checked = kDescriptionAt + description + areas;
  if (bytes.size() < checked + kChecksum) return std::nullopt;
  if (Load<std::uint64_t>(bytes.data() + checked) != Checksum(bytes.data(), checked)) {
    return std::nullopt;
  }
  FileHeader header;
  header.fanOut = Load<std::uint32_t>(bytes.data() + kFanOutAt);
  if (header.fanOut < kLeastFanOut || header.fanOut > kMostFanOut) return std::nullopt;
  header.description = TextOf(bytes.substr(kDescriptionAt, description));
  if (!ReadAreas(bytes.substr(kDescriptionAt + description, areas), header.areas)) {
    return std::nullopt;
  }
  bytes.remove_prefix(checked + kChecksum);
  return header;
}

void AppendFileHeader(Buffer& to, const FileHeader& header) {
  const std::size_t start = to.size();
  const Bytes description = BytesOf(header.description).substr(0, kMaxText);
  const Buffer areas = MakeAreas(header.areas);
  to.insert(to.end(), kMagic, kMagic + sizeof kMagic);
  Append(to, std::uint32_t{kRegistryVersion});
  Append(to, static_cast<std::uint32_t>(description.size()));
  Append(to, static_cast<std::uint32_t>(areas.size()));
  Append(to, header.fanOut);
  AppendBytes(to, description);
  AppendBytes(to, {areas.data(), areas.size()});
  Append(to, Checksum(to.data() + start, to.size() - start));
}

std::optional<SegmentHeader> ReadSegmentHeader(Bytes bytes, std::uint64_t at) {
  if (bytes.size() < kSegmentHeader) return std::nullopt;
  const unsigned char* const header = bytes.data();
  if (Load<std::uint64_t>(header) != kSegmentMark) return std::nullopt;
  const auto checksum = Load<std::uint64_t>(header + kSegmentChecksumAt);
  if (checksum != Checksum(header, kSegmentChecksumAt, at)) return std::nullopt;
  return SegmentHeader{Load<std::uint64_t>(header + kSizeAt),
                       Load<std::uint64_t>(header + kSupersededAt)};
}

void WriteSegmentHeader(unsigned char* to, std::uint64_t at, const SegmentHeader& header) {
  Store(to, std::uint64_t{kSegmentMark});
  Store(to + kSizeAt, header.size);
  Store(to + kSupersededAt, header.superseded);
  Store(to + kSegmentChecksumAt, Checksum(to, kSegmentChecksumAt, at));
}

std::size_t FindSegmentMark(Bytes bytes, std::size_t from) {
  const std::string_view text(reinterpret_cast<const char*>(bytes.data()), bytes.size());
  const std::string_view mark(reinterpret_cast<const char*>(&kSegmentMark), sizeof kSegmentMark);
  return std::min(text.find(mark, from), bytes.size());
}

std::uint64_t PieceSize(Bytes bytes) {
  return kPieceHeader + (Load<std::uint64_t>(bytes.data() + kKindAndSizeAt) >> kSizeShift);
}

std::optional<Piece> TakePiece(Bytes& bytes, std::uint64_t at) {
  if (bytes.size() < kPieceHeader) return std::nullopt;
  const std::uint64_t size = PieceSize(bytes);
  if (size > bytes.size()) return std::nullopt;
  const unsigned char* const start = bytes.data();
  if (Load<std::uint64_t>(start) != Checksum(start + kChecksum, size - kChecksum, at)) {
    return std::nullopt;
  }
  const auto kind = Load<std::uint64_t>(start + kKindAndSizeAt) & kKindMask;
  if (kind < static_cast<std::uint64_t>(PieceKind::kTree)) return std::nullopt;
  if (kind > static_cast<std::uint64_t>(PieceKind::kTrailer)) return std::nullopt;
  const Piece piece{static_cast<PieceKind>(kind), at,
                    bytes.substr(kPieceHeader, size - kPieceHeader)};
  if (piece.kind == PieceKind::kTrailer && size != kTrailer) return std::nullopt;
  bytes.remove_prefix(size);
  return piece;
}

void AppendPiece(Buffer& to, std::uint64_t at, PieceKind kind,
                 std::initializer_list<Bytes> content) {
  const std::size_t start = to.size();
  std::uint64_t size = 0;
  for (const Bytes part : content) size += part.size();
  to.resize(start + kPieceHeader);
  Store(to.data() + start + kKindAndSizeAt, size << kSizeShift | static_cast<std::uint64_t>(kind));
  for (const Bytes part : content) AppendBytes(to, part);
  unsigned char* const piece = to.data() + start;
  Store(piece, Checksum(piece + kChecksum, to.size() - start - kChecksum, at));
}

std::optional<Entry> ReadEntry(Bytes content) {
  Entry entry = {};
  if (!Take(content, entry.shapeAt)) return std::nullopt;
  entry.head = record::TakeHead(content);
  if (entry.head.empty()) return std::nullopt;
  entry.data = content;
  return entry;
}

record::KeyRecord MakeEntry(const Entry& entry, std::uint64_t entryAt, Bytes shape) {
  if (!MayHaveShape(entryAt, EntrySize(entry), entry.shapeAt, kPieceHeader + shape.size())) {
    return {};
  }
  const std::optional<record::Content> content = record::MakeContent(shape, entry.data);
  return content ? record::MakeKey(entry.head, *content) : record::KeyRecord();
}

void AppendEntry(Buffer& to, std::uint64_t at, const Entry& entry) {
  unsigned char shapeAt[sizeof entry.shapeAt];
  Store(shapeAt, entry.shapeAt);
  AppendPiece(to, at, PieceKind::kEntry, {{shapeAt, sizeof shapeAt}, entry.head, entry.data});
}

Trailer ReadTrailer(Bytes content) {
  Trailer trailer;
  Take(content, trailer.segmentAt);
  Take(content, trailer.rootAt);
  Take(content, trailer.reach);
  return trailer;
}

void AppendTrailer(Buffer& to, std::uint64_t at, const Trailer& trailer) {
  Buffer content;
  Append(content, trailer.segmentAt);
  Append(content, trailer.rootAt);
  Append(content, trailer.reach);
  AppendPiece(to, at, PieceKind::kTrailer, {{content.data(), content.size()}});
}

}  // namespace orx::format
