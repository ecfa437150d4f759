#include "orxregistry/area_walk.h"

#include <filesystem>
#include <optional>
#include <utility>
#include <vector>

#include "key_tree.h"
#include "orxutils/path.h"
#include "piece_reader.h"

namespace orx {

class TAreaWalk::Walk {
 public:
  Walk(const std::filesystem::path& path, const EntryAreas& areas, std::size_t area,
       MayHold mayHold)
      : area_(area), mayHold_(std::move(mayHold)) {
    std::optional<os::File> file = os::File::OpenToRead(path);
    if (!file) return;
    reader_.emplace(*std::move(file));
    std::optional<FileContent> around = reader_->ReadAround();
    if (!around || around->header.areas != areas || !Descend(around->trailer.rootAt)) {
      ReadWhole();
      return;
    }
    Take(*std::move(around));
  }

  TGenericRegistryKey Container() const {
    if (!tree_) return TGenericRegistryKey(nullptr);
    return Share(tree_->Container());
  }

  TGenericRegistryKey Next() {
    while (!nodes_.empty()) {
      WalkedNode& node = nodes_.back();
      if (node.next == node.items.size()) {
        nodes_.pop_back();
        continue;
      }
      const IndexItem& item = node.items[node.next++];
      if (!MayHold(item)) continue;
      // In a file as it is written, what comes later lies behind, and in front of what leads to it.
      const bool isInOrder = item.at >= floors_[node.level] && item.at < node.place;
      if (node.level == 0) {
        TGenericRegistryKey entry = isInOrder ? Read(item.at) : TGenericRegistryKey(nullptr);
        if (!entry.IsNull()) return entry;
        ReadWhole();
      } else if (!isInOrder || !Descend(item.at)) {
        ReadWhole();
      }
    }
    if (!rest_) return TGenericRegistryKey(nullptr);
    return TGenericRegistryKey((*rest_)++);
  }

 private:
  /// A node that is walked.
  struct WalkedNode {
    std::uint32_t level;
    std::uint64_t place;
    std::vector<IndexItem> items;
    std::size_t next;
  };

  TGenericRegistryKey Share(KeyTree::Key* key) const {
    return TGenericRegistryKey(TGenericRegistryKeyImpPtr(tree_, key));
  }

  bool MayHold(const IndexItem& item) const {
    const auto& [low, high] = item.bounds[area_];
    return mayHold_({{low[0], low[1]}, {high[0], high[1]}});
  }

  /// Makes what was read the tree whose entries are walked, behind those of the index.
  void Take(FileContent content) {
    tree_ = std::make_shared<KeyTree>(std::move(content));
    rest_.emplace(Container());
  }

  /// Begins again, with all entries.
  void ReadWhole() {
    nodes_.clear();
    Take(ReadRegistryFile(reader_->file()));
  }

  /// Goes on with a node.
  bool Descend(std::uint64_t place) {
    std::optional<PieceReader::Node> read = reader_->ReadNode(place);
    if (!read) return false;
    const std::uint32_t level = read->node.level;
    if (nodes_.empty()) {
      floors_.assign(level + 2, 0);
    } else if (level + 1 != nodes_.back().level) {
      return false;
    }
    floors_[level + 1] = read->end;
    nodes_.push_back({level, place, std::move(read->node.items), 0});
    return true;
  }

  TGenericRegistryKey Read(std::uint64_t place) {
    std::optional<PieceReader::Entry> entry = reader_->ReadEntry(place, tree_->content());
    if (!entry) return TGenericRegistryKey(nullptr);
    floors_[0] = entry->end;
    return Share(&tree_->MakeLoose(*tree_->Container(), entry->key, std::move(entry->memory)));
  }

  const std::size_t area_;
  const TAreaWalk::MayHold mayHold_;
  std::optional<PieceReader> reader_;
  std::vector<WalkedNode>
      nodes_;  ///< from the root to where the walk is; none: it has left the index
  /// By level, where what comes next there must lie behind; in front of the nodes' the entries'.
  std::vector<std::uint64_t> floors_;
  std::shared_ptr<KeyTree> tree_;
  std::optional<TGenRegKeyIterator>
      rest_;  ///< what is behind the index; all, where that is not used
};

TAreaWalk::TAreaWalk(const COrxStringT<wchar_t>& fileName, const EntryAreas& areas,
                     std::size_t area, MayHold mayHold) {
  const std::optional<std::filesystem::path> path = ToPath(fileName);
  if (path) walk_ = std::make_unique<Walk>(*path, areas, area, std::move(mayHold));
}

TAreaWalk::~TAreaWalk() = default;

TGenericRegistryKey TAreaWalk::Container() const {
  return walk_ ? walk_->Container() : TGenericRegistryKey(nullptr);
}

TGenericRegistryKey TAreaWalk::Next() {
  return walk_ ? walk_->Next() : TGenericRegistryKey(nullptr);
}

}  // namespace orx
