#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <utility>

#include "area_index.h"
#include "file_format.h"
#include "os_file.h"
#include "segment_file.h"

namespace orx {

/// Reads an open file piece by piece, each checked by its own checksum.
class PieceReader {
 public:
  explicit PieceReader(os::File file) : file_(std::move(file)) {}

  const os::File& file() const { return file_; }

  /// Reads what is around the index: the header, what the root holds, the shapes that are needed,
  /// and the entries behind the reach of the index. To be called first.
  /// \return nothing when the file has no index, or is not as it should be
  std::optional<FileContent> ReadAround();

  /// A node, and where its piece ends.
  struct Node {
    IndexNode node;
    std::uint64_t end = 0;
  };
  std::optional<Node> ReadNode(std::uint64_t at) const;

  /// An entry, what its key lies in, and where its piece ends.
  struct Entry {
    record::KeyRecord key;
    record::Buffer memory;
    std::uint64_t end = 0;
  };
  /// \param around what ReadAround() gave; it gets the entry's shape
  std::optional<Entry> ReadEntry(std::uint64_t at, FileContent& around);

 private:
  /// A checked piece and what its content lies in.
  struct Read {
    format::Piece piece;
    record::Buffer memory;
  };

  bool ReadBytes(std::uint64_t at, unsigned char* to, std::size_t size) const;
  std::optional<record::Buffer> ReadBytes(std::uint64_t at, std::uint64_t size) const;
  /// \param expected bytes that are enough for most pieces of the kind
  std::optional<Read> ReadPiece(std::uint64_t at, format::PieceKind kind,
                                std::size_t expected) const;
  bool ReadStart(FileContent& content);
  bool ReadTail(FileContent& content);
  bool ReadShape(std::uint64_t at, FileContent& content);

  os::File file_;
  std::uint64_t size_ = 0;
  std::uint64_t shapeBytes_ = 0;  ///< of the shapes that were read; in a sound file they lie apart
  record::Buffer start_;          ///< the first bytes of the file
  record::Buffer end_;            ///< the last
  std::uint32_t fanOut_ = 0;
  std::size_t areas_ = 0;
};

}  // namespace orx
