#include "segment_writer.h"

#include <algorithm>

#include "segment_file.h"

namespace orx {
namespace {

using format::PieceKind;
using record::Bytes;

std::string KeyOf(Bytes shape) {
  return {reinterpret_cast<const char*>(shape.data()), shape.size()};
}

Bytes BytesOf(const std::string& shape) {
  return {reinterpret_cast<const unsigned char*>(shape.data()), shape.size()};
}

}  // namespace

std::size_t FileGrowth::Hash::operator()(const std::string& shape) const {
  return record::HashOf({BytesOf(shape).data(), shape.size()});
}

FileGrowth::FileGrowth(const format::FileHeader& header, std::uint64_t start)
    : areas_(header.areas), edge_(header.fanOut), reach_(areas_.empty() ? 0 : start) {}

FileGrowth::FileGrowth(const FileContent& content) : FileGrowth(content.header, content.start) {
  for (const auto& [at, shape] : content.shapes) {
    Put(shape, at, format::kPieceHeader + shape.size());
  }
  if (content.trailer.reach == 0) reach_ = 0;
  if (!HasIndex()) return;
  rootAt_ = content.trailer.rootAt;
  if (rootAt_ != 0) reach_ = content.trailer.reach;
  const auto read = [&](std::uint64_t at) -> std::optional<IndexNode> {
    if (at >= content.end) return std::nullopt;
    Bytes bytes(content.memory.get() + at, content.end - at);
    const std::optional<format::Piece> piece = format::TakePiece(bytes, at);
    if (!piece || piece->kind != PieceKind::kNode) return std::nullopt;
    return ReadNode(piece->content, areas_.size());
  };
  if (rootAt_ != 0 && !edge_.Load(rootAt_, read)) {
    reach_ = 0;
    return;
  }
  for (auto entry = content.entries.rbegin();
       entry != content.entries.rend() && entry->at >= reach_; ++entry) {
    const record::Content& its = entry->key.content();
    tail_.push_back({entry->at, BoundsOf(Find(its.shape())->second, its)});
  }
  std::reverse(tail_.begin(), tail_.end());
}

FileGrowth::Shapes::value_type* FileGrowth::Find(Bytes shape) {
  const auto found = shapes_.find(KeyOf(shape));
  return found == shapes_.end() ? nullptr : &*found;
}

FileGrowth::Shapes::value_type* FileGrowth::Put(Bytes shape, std::uint64_t at, std::uint64_t size) {
  return &*shapes_.insert_or_assign(KeyOf(shape), Shape{at, size, {}}).first;
}

EntryBounds FileGrowth::BoundsOf(Shape& shape, const record::Content& content) const {
  // An entry that is damaged does not tell where others of its shape have their areas.
  if (!shape.places || !shape.places->HasAny()) shape.places.emplace(areas_, content);
  return shape.places->BoundsIn(content.data());
}

SegmentWriter::SegmentWriter(FileGrowth& growth, record::Buffer& to, std::uint64_t at)
    : growth_(growth), to_(to), at_(at), start_(to.size()) {
  to.resize(start_ + format::kSegmentHeader);
}

void SegmentWriter::AddTree(const record::ContentBuffer& content) {
  format::AppendPiece(
      to_, Here(), PieceKind::kTree,
      {{content.shape.data(), content.shape.size()}, {content.data.data(), content.data.size()}});
}

void SegmentWriter::AddEntry(Bytes head, const record::Content& content) {
  const Bytes shape = content.shape();
  const format::Entry entry{0, head, content.data()};
  if (!last_ || BytesOf(last_->first) != shape) last_ = growth_.Find(shape);
  const bool mayShare = last_ && format::MayHaveShape(0, format::EntrySize(entry), last_->second.at,
                                                      last_->second.size);
  if (!mayShare) {
    const std::uint64_t at = Here();
    format::AppendPiece(to_, at, PieceKind::kShape, {shape});
    last_ = growth_.Put(shape, at, Here() - at);
  }
  if (growth_.HasIndex()) {
    entries_.push_back({Here(), growth_.BoundsOf(last_->second, content)});
  }
  format::AppendEntry(to_, Here(), {last_->second.at, head, content.data()});
}

void SegmentWriter::Finish(std::uint64_t superseded, bool addsEntriesOnly) {
  if (!addsEntriesOnly) growth_.reach_ = 0;
  if (growth_.HasIndex()) {
    std::vector<IndexItem>& tail = growth_.tail_;
    tail.insert(tail.end(), entries_.begin(), entries_.end());
    if (tail.size() >= growth_.edge_.RoomInLeaf()) {
      growth_.rootAt_ = growth_.edge_.Extend(tail, [this](const IndexNode& node) {
        const std::uint64_t at = Here();
        const record::Buffer content = MakeNode(node, growth_.areas_.size());
        format::AppendPiece(to_, at, PieceKind::kNode, {{content.data(), content.size()}});
        return at;
      });
      growth_.reach_ = Here() + format::kTrailer;
      tail.clear();
    }
  }
  const std::uint64_t rootAt = growth_.HasIndex() ? growth_.rootAt_ : 0;
  format::AppendTrailer(to_, Here(), {at_, rootAt, growth_.reach_});
  const std::uint64_t size = to_.size() - start_ - format::kSegmentHeader;
  format::WriteSegmentHeader(to_.data() + start_, at_, {size, superseded});
}

}  // namespace orx
