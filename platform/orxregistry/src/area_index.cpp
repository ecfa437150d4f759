#include "area_index.h"

#include <algorithm>
#include <iterator>

namespace orx {
namespace {

using record::Load;
using record::Store;

// A node: level, number of items, items.
constexpr std::size_t kItemsAt = 2 * sizeof(std::uint32_t);

std::size_t ItemSize(std::size_t areas) { return sizeof(std::uint64_t) + areas * sizeof(Bounds); }

IndexItem ItemOf(std::uint64_t at, const IndexNode& node) {
  IndexItem item{at, node.items.front().bounds};
  for (const IndexItem& below : node.items) {
    for (std::size_t i = 0; i < item.bounds.size(); ++i) item.bounds[i].Include(below.bounds[i]);
  }
  return item;
}

}  // namespace

std::size_t NodeSize(std::size_t items, std::size_t areas) {
  return kItemsAt + items * ItemSize(areas);
}

std::optional<IndexNode> ReadNode(record::Bytes content, std::size_t areas) {
  if (content.size() < kItemsAt) return std::nullopt;
  IndexNode node;
  node.level = Load<std::uint32_t>(content.data());
  const auto count = Load<std::uint32_t>(content.data() + sizeof node.level);
  if (node.level > kMaxIndexLevel || count == 0) return std::nullopt;
  if (content.size() != NodeSize(count, areas)) return std::nullopt;
  node.items.resize(count);
  const unsigned char* at = content.data() + kItemsAt;
  for (IndexItem& item : node.items) {
    item.at = Load<std::uint64_t>(at);
    at += sizeof item.at;
    for (std::size_t i = 0; i < areas; ++i) {
      item.bounds[i] = Load<Bounds>(at);
      at += sizeof(Bounds);
    }
  }
  return node;
}

record::Buffer MakeNode(const IndexNode& node, std::size_t areas) {
  record::Buffer content(NodeSize(node.items.size(), areas));
  Store(content.data(), node.level);
  Store(content.data() + sizeof node.level, static_cast<std::uint32_t>(node.items.size()));
  unsigned char* at = content.data() + kItemsAt;
  for (const IndexItem& item : node.items) {
    Store(at, item.at);
    at += sizeof item.at;
    for (std::size_t i = 0; i < areas; ++i) {
      Store(at, item.bounds[i]);
      at += sizeof(Bounds);
    }
  }
  return content;
}

bool IndexEdge::Load(std::uint64_t rootAt, const Read& read) {
  std::vector<IndexNode> last;  // from the root down, the last of each level
  for (std::uint64_t at = rootAt;; at = last.back().items.back().at) {
    std::optional<IndexNode> node = read(at);
    if (!node || node->items.size() > fanOut_) return false;
    if (!last.empty() && node->level + 1 != last.back().level) return false;
    last.push_back(*std::move(node));
    if (last.back().level == 0) break;
  }
  open_.clear();
  bool isFull = true;  // the node below
  std::transform(last.rbegin(), last.rend(), std::back_inserter(open_), [&](IndexNode& node) {
    if (!isFull) node.items.pop_back();
    isFull = node.items.size() == fanOut_;
    return isFull ? std::vector<IndexItem>() : std::move(node.items);
  });
  if (isFull) open_.push_back({ItemOf(rootAt, last.front())});
  return true;
}

std::size_t IndexEdge::RoomInLeaf() const {
  return open_.empty() ? fanOut_ : fanOut_ - open_.front().size();
}

std::uint64_t IndexEdge::Extend(const std::vector<IndexItem>& entries, const Write& write) {
  std::vector<IndexItem> added = entries;  // to this level
  std::optional<IndexItem> partial;        // the node below that is not full
  for (std::uint32_t level = 0;; ++level) {
    if (level == open_.size()) open_.emplace_back();
    const auto writeNode = [&](std::vector<IndexItem> items) {
      const IndexNode node{level, std::move(items)};
      return ItemOf(write(node), node);
    };
    std::vector<IndexItem>& open = open_[level];
    std::vector<IndexItem> full;  // the nodes of this level that are
    for (const IndexItem& item : added) {
      open.push_back(item);
      if (open.size() < fanOut_) continue;
      full.push_back(writeNode(std::move(open)));
      open.clear();
    }
    if (partial || !open.empty()) {
      std::vector<IndexItem> items = open;
      if (partial) items.push_back(*partial);
      partial = writeNode(std::move(items));
    }
    const bool isTop = level + 1 == open_.size();
    if (isTop && full.size() + (partial ? 1 : 0) == 1) {
      const std::uint64_t rootAt = partial ? partial->at : full.front().at;
      if (!partial) open_.push_back(std::move(full));
      return rootAt;
    }
    added = std::move(full);
  }
}

}  // namespace orx
