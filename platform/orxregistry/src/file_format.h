#pragma once

#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <optional>
#include <string>

#include "orxregistry/entry_areas.h"
#include "record_format.h"

/// The bytes of a file around its keys and values: a header, then segments, which are made of
/// pieces. See docs/gff-format.md. Nothing here trusts a byte that it reads.
namespace orx::format {

using record::Buffer;
using record::Bytes;

// The header.

struct FileHeader {
  std::u16string description;
  EntryAreas areas;
  std::uint32_t fanOut = 16;  ///< items of a node of the index
};

inline constexpr std::size_t kMaxFileHeader = std::size_t{1} << 14U;

/// True when a file's header can hold the areas.
bool AreRight(const EntryAreas& areas);

/// Takes the header off the front of a file; nothing when there is none, or one of a newer version.
std::optional<FileHeader> TakeFileHeader(Bytes& bytes);
/// A description that is too long is cut off.
void AppendFileHeader(Buffer& to, const FileHeader& header);

// Segments: a save each.

struct SegmentHeader {
  std::uint64_t size = 0;        ///< bytes of the pieces behind it
  std::uint64_t superseded = 0;  ///< bytes of values in the file that later ones replace
};

inline constexpr std::size_t kSegmentHeader = 32;

/// \param at the place in the file of the first byte
/// \return nothing when no segment begins there
std::optional<SegmentHeader> ReadSegmentHeader(Bytes bytes, std::uint64_t at);
/// \param to room for kSegmentHeader bytes, whose place in the file is `at`
void WriteSegmentHeader(unsigned char* to, std::uint64_t at, const SegmentHeader& header);
/// \return the next place behind `from` where a segment's mark is, or the size of `bytes`
std::size_t FindSegmentMark(Bytes bytes, std::size_t from);

// Pieces, which can be read one by one: each has its own checksum.

enum class PieceKind : std::uint8_t {
  kTree = 1,     ///< what the root holds, but for the entries; shape and data
  kShape = 2,    ///< a shape of entries
  kEntry = 3,    ///< an entry: place of its shape, head, data
  kNode = 4,     ///< a node of the index
  kTrailer = 5,  ///< the end of a segment
};

struct Piece {
  PieceKind kind;
  std::uint64_t at;  ///< its place in the file
  Bytes content;
};

inline constexpr std::size_t kPieceHeader = 16;

/// Bytes of the piece whose header `bytes` begin with, as it says.
std::uint64_t PieceSize(Bytes bytes);
/// Takes the piece at the front off `bytes`.
/// \param at the place in the file of the first byte
/// \return nothing when it is not whole
std::optional<Piece> TakePiece(Bytes& bytes, std::uint64_t at);
/// \param at the place in the file that the piece will have
void AppendPiece(Buffer& to, std::uint64_t at, PieceKind kind,
                 std::initializer_list<Bytes> content);

/// An entry: a sub-key of the container key.
struct Entry {
  std::uint64_t shapeAt;  ///< the place of the piece with its shape
  Bytes head;
  Bytes data;
};
std::optional<Entry> ReadEntry(Bytes content);
/// Bytes of the piece of an entry.
inline std::uint64_t EntrySize(const Entry& entry) {
  return kPieceHeader + sizeof entry.shapeAt + entry.head.size() + entry.data.size();
}
void AppendEntry(Buffer& to, std::uint64_t at, const Entry& entry);

/// Many small entries of one large shape would be large in memory: a shape that is larger than so
/// many times its entry belongs to this one and lies in front of it.
inline constexpr std::uint64_t kMaxShapeOfEntry = 4;

/// True when an entry may have a shape.
/// \param entry bytes of its piece
/// \param shape bytes of its piece
inline bool MayHaveShape(std::uint64_t entryAt, std::uint64_t entry, std::uint64_t shapeAt,
                         std::uint64_t shape) {
  return shapeAt + shape == entryAt || shape / kMaxShapeOfEntry <= entry;
}

/// The key of an entry.
/// \param shape content of the piece with its shape
/// \return none when they do not belong together
record::KeyRecord MakeEntry(const Entry& entry, std::uint64_t entryAt, Bytes shape);

/// What a segment ends with.
struct Trailer {
  std::uint64_t segmentAt = 0;  ///< the place of the segment
  std::uint64_t rootAt = 0;     ///< the place of the index's root; 0: there is none yet
  /// The place of the first segment whose entries the index does not have, or the file's end. 0:
  /// the file holds more than entries that were added one behind the other, and has no index.
  std::uint64_t reach = 0;
};
inline constexpr std::size_t kTrailer = kPieceHeader + 3 * sizeof(std::uint64_t);
/// \param content of a piece of that kind
Trailer ReadTrailer(Bytes content);
void AppendTrailer(Buffer& to, std::uint64_t at, const Trailer& trailer);

/// A larger segment is durable before the trailer behind it is written; a smaller one may have its
/// trailer in the file and something else not.
inline constexpr std::size_t kCheckedWithItsTrailer = std::size_t{1} << 16U;

/// Takes a segment apart.
/// \param at the segment's place in the file
/// \param take called for each piece: (piece) to false when it is not right
/// \return the bytes of the segment; 0 when it is not whole
template <class Take>
std::size_t TakeSegment(Bytes bytes, std::uint64_t at, SegmentHeader& header, const Take& take) {
  const std::optional<SegmentHeader> found = ReadSegmentHeader(bytes, at);
  if (!found || found->size > bytes.size() - kSegmentHeader || found->size < kTrailer) return 0;
  header = *found;
  Bytes rest = bytes.substr(kSegmentHeader, found->size);
  std::uint64_t pieceAt = at + kSegmentHeader;
  while (!rest.empty()) {
    const std::optional<Piece> piece = TakePiece(rest, pieceAt);
    if (!piece) return 0;
    const bool isLast = rest.empty();
    if ((piece->kind == PieceKind::kTrailer) != isLast || !take(*piece)) return 0;
    pieceAt += kPieceHeader + piece->content.size();
  }
  return kSegmentHeader + found->size;
}

}  // namespace orx::format
