#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

#include "area_index.h"
#include "entry_bounds.h"
#include "file_format.h"
#include "record_format.h"

namespace orx {

struct FileContent;

/// What the next segment of a file is built on: the shapes that the file has and the edge of its
/// index.
class FileGrowth {
 public:
  /// Of a file with nothing but a header.
  /// \param start where its first segment will be
  FileGrowth(const format::FileHeader& header, std::uint64_t start);
  explicit FileGrowth(const FileContent& content);

  bool HasAreas() const { return !areas_.empty(); }
  bool HasIndex() const { return reach_ != 0; }

 private:
  friend class SegmentWriter;

  struct Shape {
    std::uint64_t at;
    std::uint64_t size;                ///< of its piece
    std::optional<AreaPlaces> places;  ///< nothing before an entry of it is met
  };
  struct Hash {
    std::size_t operator()(const std::string& shape) const;
  };

  using Shapes = std::unordered_map<std::string, Shape, Hash>;

  /// \return null when the file does not have the shape
  Shapes::value_type* Find(record::Bytes shape);
  Shapes::value_type* Put(record::Bytes shape, std::uint64_t at, std::uint64_t size);
  EntryBounds BoundsOf(Shape& shape, const record::Content& content) const;

  EntryAreas areas_;
  Shapes shapes_;
  IndexEdge edge_;
  std::vector<IndexItem> tail_;  ///< the entries that the index does not have
  std::uint64_t rootAt_ = 0;     ///< as in format::Trailer
  std::uint64_t reach_ = 0;      ///< the same
};

/// Makes a segment.
class SegmentWriter {
 public:
  /// \param growth of the file; what it is afterwards is right when the segment gets written
  /// \param to where the segment is appended
  /// \param at the place that it will have in the file
  SegmentWriter(FileGrowth& growth, record::Buffer& to, std::uint64_t at);

  /// Makes room for so many bytes more.
  void Reserve(std::size_t bytes) { to_.reserve(to_.size() + bytes); }
  /// Adds what the root holds, but for the entries. To be called before AddEntry().
  void AddTree(const record::ContentBuffer& content);
  void AddEntry(record::Bytes head, const record::Content& content);
  /// \param superseded as in format::SegmentHeader
  /// \param addsEntriesOnly false: it holds something else, or an entry that the file has already,
  ///     so that the file has no index until it is written afresh
  void Finish(std::uint64_t superseded, bool addsEntriesOnly);

 private:
  std::uint64_t Here() const { return at_ + (to_.size() - start_); }

  FileGrowth& growth_;
  record::Buffer& to_;
  const std::uint64_t at_;
  const std::size_t start_;
  std::vector<IndexItem> entries_;
  FileGrowth::Shapes::value_type* last_ = nullptr;  ///< the shape of the entry that was added last
};

}  // namespace orx
