#include "segment_file.h"

#include <utility>

namespace orx {
namespace {

using format::PieceKind;
using record::Bytes;

/// A file of at most so many bytes is read in one piece, before it is known what it is.
constexpr std::uint64_t kReadUnasked = 1U << 16U;

/// Takes a piece of a segment over.
/// \return false when the piece is not right
bool TakePiece(const format::Piece& piece, FileContent& content, const FindShape& findShape) {
  switch (piece.kind) {
    case PieceKind::kTree: {
      const std::optional<record::Content> tree = record::SplitContent(piece.content);
      if (!tree) return false;
      record::Part keys = tree->keys();
      if (!content.container) content.container = record::TakeKey(keys);
      content.trees.push_back(*tree);
      return true;
    }
    case PieceKind::kShape:
      content.shapes.emplace_hint(content.shapes.end(), piece.at, piece.content);
      return true;
    case PieceKind::kEntry: {
      const std::optional<format::Entry> entry = format::ReadEntry(piece.content);
      if (!entry || entry->shapeAt >= piece.at || !content.container) return false;
      const Bytes* shape = content.ShapeAt(entry->shapeAt);
      if (!shape && findShape && findShape(entry->shapeAt)) shape = content.ShapeAt(entry->shapeAt);
      const auto key = shape ? format::MakeEntry(*entry, piece.at, *shape) : record::KeyRecord();
      if (!key) return false;
      content.entries.push_back({key, piece.at});
      return true;
    }
    case PieceKind::kNode:
      return true;
    case PieceKind::kTrailer:
      content.trailer = format::ReadTrailer(piece.content);
      return true;
  }
  return false;
}

/// Tells damage from a save that never finished: behind damage there is another segment.
bool HasSegmentBehind(Bytes bytes, std::size_t at) {
  for (at = format::FindSegmentMark(bytes, at + 1); at < bytes.size();
       at = format::FindSegmentMark(bytes, at + 1)) {
    if (format::ReadSegmentHeader(bytes.substr(at), at)) return true;
  }
  return false;
}

/// Finds what is in a file that is in memory.
void FindSegments(Bytes bytes, FileContent& content) {
  Bytes rest = bytes;
  std::optional<format::FileHeader> header = format::TakeFileHeader(rest);
  if (!header) {
    content.error = kNotARegistryFile;
    return;
  }
  content.header = *std::move(header);
  content.start = bytes.size() - rest.size();
  content.end = content.start;
  while (const std::size_t size = AddSegment(bytes.substr(content.end), content.end, content)) {
    content.end += size;
  }
  // A file gets its name only with its first segment in it, so one without was cut off later.
  const bool damaged = content.end == content.start ||
                       (content.end < bytes.size() && HasSegmentBehind(bytes, content.end));
  if (damaged) content.error = kDamaged;
}

/// Of a file that cannot be read now. Without a stamp it counts as changed, so that it is read
/// again.
FileContent CannotBeOpened() {
  FileContent content;
  content.error = kCannotBeOpened;
  return content;
}

/// Reads an open file from its start, as it is just now.
FileContent ReadOnce(const os::File& file) {
  const std::optional<os::FileStamp> stamp = file.Stamp();
  if (!stamp) return CannotBeOpened();
  FileContent content;
  content.stamp = *stamp;
  if (stamp->size > kReadUnasked) {
    // No more is read of what is no registry file, however large.
    unsigned char header[format::kMaxFileHeader];
    const auto headerSize = file.Read(0, header, sizeof header);
    if (!headerSize) return CannotBeOpened();
    Bytes start(header, *headerSize);
    if (!format::TakeFileHeader(start)) {
      content.error = kNotARegistryFile;
      return content;
    }
  }
  content.memory = os::Memory(stamp->size);
  const auto size = file.Read(0, content.memory.get(), stamp->size);
  if (!size) return CannotBeOpened();
  FindSegments(Bytes(content.memory.get(), *size), content);
  return content;
}

}  // namespace

const Bytes* FileContent::ShapeAt(std::uint64_t at) const {
  const auto found = shapes.find(at);
  return found == shapes.end() ? nullptr : &found->second;
}

std::size_t AddSegment(Bytes bytes, std::uint64_t at, FileContent& content,
                       const FindShape& findShape) {
  const std::size_t trees = content.trees.size();
  const std::size_t entries = content.entries.size();
  const record::KeyRecord container = content.container;
  const format::Trailer trailer = content.trailer;
  format::SegmentHeader header;
  const std::size_t size = format::TakeSegment(bytes, at, header, [&](const format::Piece& piece) {
    return TakePiece(piece, content, findShape);
  });
  if (size == 0 || content.trailer.segmentAt != at) {
    content.container = container;
    content.trailer = trailer;
    content.trees.resize(trees);
    content.entries.resize(entries);
    content.shapes.erase(content.shapes.lower_bound(at), content.shapes.end());
    return 0;
  }
  content.superseded = header.superseded;
  return size;
}

FileContent ReadRegistryFile(const os::File& file) {
  for (;;) {
    FileContent content = ReadOnce(file);
    // What looks like damage can be a save that others cut off and wrote over meanwhile.
    if (content.error != kDamaged || file.Stamp() == content.stamp) return content;
  }
}

FileContent ReadRegistryFile(const std::filesystem::path& path) {
  const std::optional<os::File> file = os::File::OpenToRead(path);
  return file ? ReadRegistryFile(*file) : CannotBeOpened();
}

}  // namespace orx
