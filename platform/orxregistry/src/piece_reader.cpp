#include "piece_reader.h"

#include <algorithm>

namespace orx {
namespace {

using format::PieceKind;
using record::Buffer;
using record::Bytes;

constexpr std::size_t kBlock = 4096;
/// Enough for most pieces of their kind; a tree without entries is small.
constexpr std::size_t kExpectedTree = 1024;
constexpr std::size_t kExpectedEntry = 1024;
constexpr std::size_t kExpectedShape = 2048;

Bytes BytesOf(const Buffer& buffer) { return {buffer.data(), buffer.size()}; }

}  // namespace

bool PieceReader::ReadBytes(std::uint64_t at, unsigned char* to, std::size_t size) const {
  const std::uint64_t endAt = size_ - end_.size();
  if (at + size <= start_.size()) {
    std::copy_n(start_.data() + at, size, to);
    return true;
  }
  if (at >= endAt) {
    std::copy_n(end_.data() + (at - endAt), size, to);
    return true;
  }
  return file_.Read(at, to, size) == size;
}

std::optional<Buffer> PieceReader::ReadBytes(std::uint64_t at, std::uint64_t size) const {
  if (at > size_ || size > size_ - at) return std::nullopt;
  Buffer bytes(size);
  if (!ReadBytes(at, bytes.data(), size)) return std::nullopt;
  return bytes;
}

std::optional<PieceReader::Read> PieceReader::ReadPiece(std::uint64_t at, PieceKind kind,
                                                        std::size_t expected) const {
  if (at >= size_) return std::nullopt;
  std::optional<Buffer> bytes = ReadBytes(at, std::min<std::uint64_t>(expected, size_ - at));
  if (!bytes || bytes->size() < format::kPieceHeader) return std::nullopt;
  const std::uint64_t size = format::PieceSize(BytesOf(*bytes));
  if (size > bytes->size()) bytes = ReadBytes(at, size);
  if (!bytes) return std::nullopt;
  bytes->resize(size);
  Bytes rest = BytesOf(*bytes);
  const std::optional<format::Piece> piece = format::TakePiece(rest, at);
  if (!piece || piece->kind != kind) return std::nullopt;
  return Read{*piece, *std::move(bytes)};
}

std::optional<FileContent> PieceReader::ReadAround() {
  const std::optional<os::FileStamp> stamp = file_.Stamp();
  if (!stamp || stamp->size < format::kTrailer) return std::nullopt;
  size_ = stamp->size;
  FileContent content;
  content.end = size_;
  const std::size_t block = std::min<std::uint64_t>(kBlock, size_);
  std::optional<Buffer> end = ReadBytes(size_ - block, block);
  if (!end) return std::nullopt;
  end_ = *std::move(end);
  const auto trailer = ReadPiece(size_ - format::kTrailer, PieceKind::kTrailer, format::kTrailer);
  if (!trailer) return std::nullopt;
  content.trailer = format::ReadTrailer(trailer->piece.content);
  if (content.trailer.rootAt == 0 || content.trailer.rootAt >= content.trailer.reach) {
    return std::nullopt;
  }
  if (!ReadStart(content) || !ReadTail(content)) return std::nullopt;
  return content;
}

/// Reads the header and what the root holds.
bool PieceReader::ReadStart(FileContent& content) {
  std::optional<format::FileHeader> header;
  Bytes rest;
  for (const std::size_t size : {kBlock, format::kMaxFileHeader}) {
    std::optional<Buffer> start = ReadBytes(0, std::min<std::uint64_t>(size, size_));
    if (!start) return false;
    start_ = *std::move(start);
    rest = BytesOf(start_);
    header = format::TakeFileHeader(rest);
    if (header) break;
  }
  if (!header) return false;
  content.header = *std::move(header);
  fanOut_ = content.header.fanOut;
  areas_ = content.header.areas.size();
  const std::uint64_t segmentAt = start_.size() - rest.size();
  auto tree = ReadPiece(segmentAt + format::kSegmentHeader, PieceKind::kTree, kExpectedTree);
  const auto root = tree ? record::SplitContent(tree->piece.content) : std::nullopt;
  if (!root) return false;
  record::Part keys = root->keys();
  const record::KeyRecord container = record::TakeKey(keys);
  if (!container || !container.content().keys().shapes.empty()) return false;
  while (!keys.shapes.empty()) {
    const record::KeyRecord other = record::TakeKey(keys);
    if (!other || other.name() == container.name()) return false;
  }
  content.moreMemory.push_back(std::move(tree->memory));
  content.trees.push_back(*root);
  content.container = container;
  return true;
}

/// Reads the segments behind the reach of the index. The last segment is always looked at, as what
/// it says of the file may have been written before the rest of it; of a large one this is not so.
bool PieceReader::ReadTail(FileContent& content) {
  const auto& [segmentAt, rootAt, reach] = content.trailer;
  if (segmentAt >= size_ || reach > size_) return false;
  const bool isLarge = size_ - segmentAt > format::kCheckedWithItsTrailer;
  const std::uint64_t from = isLarge ? reach : std::min(reach, segmentAt);
  content.memory = os::Memory(size_ - from);
  if (!ReadBytes(from, content.memory.get(), size_ - from)) return false;
  const Bytes tail(content.memory.get(), size_ - from);
  const FindShape find = [&](std::uint64_t at) { return ReadShape(at, content); };
  for (std::size_t at = 0; at < tail.size();) {
    const std::size_t size = AddSegment(tail.substr(at), from + at, content, find);
    if (size == 0) return false;
    at += size;
  }
  // Only entries are behind the reach.
  if (content.trees.size() != 1) return false;
  std::erase_if(content.entries, [end = reach](const auto& entry) { return entry.at < end; });
  return true;
}

bool PieceReader::ReadShape(std::uint64_t at, FileContent& content) {
  std::optional<Read> shape = ReadPiece(at, PieceKind::kShape, kExpectedShape);
  if (!shape) return false;
  shapeBytes_ += shape->piece.content.size();
  if (shapeBytes_ > size_) return false;
  content.moreMemory.push_back(std::move(shape->memory));
  content.shapes.emplace(at, shape->piece.content);
  return true;
}

std::optional<PieceReader::Node> PieceReader::ReadNode(std::uint64_t at) const {
  const std::size_t size = format::kPieceHeader + NodeSize(fanOut_, areas_);
  const std::optional<Read> read = ReadPiece(at, PieceKind::kNode, size);
  std::optional<IndexNode> node = read ? orx::ReadNode(read->piece.content, areas_) : std::nullopt;
  if (!node || node->items.size() > fanOut_) return std::nullopt;
  return Node{*std::move(node), at + format::kPieceHeader + read->piece.content.size()};
}

std::optional<PieceReader::Entry> PieceReader::ReadEntry(std::uint64_t at, FileContent& around) {
  std::optional<Read> read = ReadPiece(at, PieceKind::kEntry, kExpectedEntry);
  const auto entry = read ? format::ReadEntry(read->piece.content) : std::nullopt;
  if (!entry || entry->shapeAt >= at) return std::nullopt;
  if (!around.ShapeAt(entry->shapeAt) && !ReadShape(entry->shapeAt, around)) return std::nullopt;
  const auto key = format::MakeEntry(*entry, at, *around.ShapeAt(entry->shapeAt));
  if (!key) return std::nullopt;
  return Entry{key, std::move(read->memory), at + format::EntrySize(*entry)};
}

}  // namespace orx
