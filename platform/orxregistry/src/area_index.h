#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <optional>
#include <vector>

#include "entry_bounds.h"
#include "record_format.h"

/// The index of a file: a tree over its entries, in their order, that finds those which may be for
/// a position. It only grows, at its right edge: a save writes the nodes there afresh, up to the
/// root, behind the entries that it adds.
namespace orx {

/// A piece of the file, an entry or a node, with the bounds of all that is in it.
struct IndexItem {
  std::uint64_t at = 0;
  EntryBounds bounds = {kEverything, kEverything};
};

struct IndexNode {
  std::uint32_t level = 0;  ///< 0: its items are entries
  std::vector<IndexItem> items;
};

/// Levels above this are no index that a file could need.
inline constexpr std::uint32_t kMaxIndexLevel = 32;

/// \param content of a node's piece
/// \param areas how many each item has bounds of
/// \return nothing when it is not whole
std::optional<IndexNode> ReadNode(record::Bytes content, std::size_t areas);
record::Buffer MakeNode(const IndexNode& node, std::size_t areas);
/// Bytes of a node's content.
std::size_t NodeSize(std::size_t items, std::size_t areas);

/// The nodes that are not full, from which the index grows.
class IndexEdge {
 public:
  using Read = std::function<std::optional<IndexNode>(std::uint64_t at)>;
  /// \return the place of the node
  using Write = std::function<std::uint64_t(const IndexNode& node)>;

  explicit IndexEdge(std::uint32_t fanOut) : fanOut_(fanOut) {}

  /// Reads the edge of an index.
  /// \return false when there is none at that place
  bool Load(std::uint64_t rootAt, const Read& read);

  /// How many more items fill the last leaf.
  std::size_t RoomInLeaf() const;

  /// Adds entries behind the others.
  /// \param write called for each node that is new, the root last
  /// \return the place of the root
  std::uint64_t Extend(const std::vector<IndexItem>& entries, const Write& write);

 private:
  std::uint32_t fanOut_;
  /// By level, the items of the node that is not full, but for its last if that is not full either.
  std::vector<std::vector<IndexItem>> open_;
};

}  // namespace orx
