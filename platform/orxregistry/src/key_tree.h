#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <memory_resource>
#include <string>
#include <string_view>
#include <unordered_map>
#include <unordered_set>
#include <utility>
#include <vector>

#include "orxregistry/in_file_key.h"
#include "orxregistry/registry_key.h"
#include "record_format.h"
#include "segment_file.h"

namespace orx {

/// The UTF-16 form of a name that is looked up.
class LookupName {
 public:
  explicit LookupName(std::wstring_view name) : utf16_(ToUtf16(name)) {}
  record::Name Get() const {
    return {reinterpret_cast<const unsigned char*>(utf16_.data()),
            utf16_.size() * sizeof(char16_t)};
  }

 private:
  std::u16string utf16_;
};

/// A value in memory: its record, in the file's bytes or in the tree's memory.
using ValueRecord = const unsigned char*;

inline record::Name NameOf(ValueRecord value) { return record::ValueAt(value).name; }
inline record::Name NameOf(const TGenericRegistryKeyImp* key);

/// Things with names, in the order in which they were added. Finding one does not get slower with
/// their number.
template <class Item>
class NamedList {
 public:
  explicit NamedList(std::pmr::memory_resource* memory) : items_(memory) {}

  const std::pmr::vector<Item>& items() const { return items_; }

  /// \return the place of the item of that name in `items()`, or their number
  std::size_t Find(const record::Name& name) const {
    if (index_) {
      const auto found = index_->find(name);
      return found == index_->end() ? items_.size() : *found;
    }
    std::size_t place = 0;
    while (place < items_.size() && !(NameOf(items_[place]) == name)) ++place;
    return place;
  }

  void Append(Item item) {
    items_.push_back(item);
    if (index_) {
      index_->insert(items_.size() - 1);
    } else if (items_.size() > kLinear) {
      MakeIndex();
    }
  }

  /// Puts another item of the same name in the place of one.
  void Replace(std::size_t place, Item item) { items_[place] = item; }

 private:
  /// Up to this many items a look at each is faster than an index.
  static constexpr std::size_t kLinear = 12;

  struct Hash {
    using is_transparent = void;
    const NamedList* list;
    std::size_t operator()(const record::Name& name) const {
      return std::hash<std::string_view>()({reinterpret_cast<const char*>(name.units), name.bytes});
    }
    std::size_t operator()(std::size_t place) const { return (*this)(NameOf(list->items_[place])); }
  };
  struct Equal {
    using is_transparent = void;
    const NamedList* list;
    record::Name Get(const record::Name& name) const { return name; }
    record::Name Get(std::size_t place) const { return NameOf(list->items_[place]); }
    template <class A, class B>
    bool operator()(const A& a, const B& b) const {
      return Get(a) == Get(b);
    }
  };
  using Index = std::pmr::unordered_set<std::size_t, Hash, Equal>;

  void MakeIndex() {
    std::pmr::polymorphic_allocator<> memory(items_.get_allocator().resource());
    auto* const index = memory.new_object<Index>(4 * kLinear, Hash{this}, Equal{this});
    for (std::size_t place = 0; place < items_.size(); ++place) index->insert(place);
    index_ = index;
  }

  std::pmr::vector<Item> items_;
  Index* index_ = nullptr;  ///< in the memory of `items_`
};

/// A key in memory. It is taken apart into values and sub-keys when it is first visited; until then
/// it only knows the records that are laid over one another to make it.
class TGenericRegistryKeyImp {
 public:
  TGenericRegistryKeyImp(KeyTree& owner, TGenericRegistryKeyImp* above, record::Name ownName,
                         std::uint8_t ownDimension)
      : tree(&owner),
        parent(above),
        name(ownName),
        dimension(ownDimension),
        depth(static_cast<std::uint8_t>(above ? above->depth + 1 : 0)) {}

  KeyTree* tree;
  TGenericRegistryKeyImp* parent;  ///< null for the root
  record::Name name;
  std::uint8_t dimension;
  std::uint8_t depth;

 private:
  friend class KeyTree;

  struct Layer {
    record::Bytes values;
    record::Bytes keys;
    Layer* next;
  };
  struct Content {
    explicit Content(std::pmr::memory_resource* memory) : values(memory), keys(memory) {}
    NamedList<ValueRecord> values;
    NamedList<TGenericRegistryKeyImp*> keys;
  };

  Layer* firstLayer_ = nullptr;  ///< layers not taken apart yet
  Layer* lastLayer_ = nullptr;
  Content* content_ = nullptr;
};

inline record::Name NameOf(const TGenericRegistryKeyImp* key) { return key->name; }

/// A tree of keys in memory, together with the bytes of the file that it came from. What changed
/// since it was last saved is kept apart, so that saving costs what changed.
class KeyTree {
 public:
  using Key = TGenericRegistryKeyImp;

  explicit KeyTree(std::u16string text);
  explicit KeyTree(FileContent content);
  KeyTree(const KeyTree&) = delete;
  KeyTree& operator=(const KeyTree&) = delete;

  Key& root() { return *root_; }
  /// The sub-keys of a key, in their order.
  const std::pmr::vector<Key*>& Keys(Key& key) { return Visit(key).keys.items(); }
  const std::pmr::vector<ValueRecord>& Values(Key& key) { return Visit(key).values.items(); }

  /// \return null when there is none of that name
  Key* FindKey(Key& key, const record::Name& name);
  ValueRecord FindValue(Key& key, const record::Name& name);

  /// \return the sub-key of that name, made when missing; null when it would be too deep or its
  ///     name is too long
  Key* OpenKey(Key& key, const record::Name& name, std::uint8_t dimension);
  /// Puts a value into a key, in the place of one of the same name.
  /// \return false when the value's description and data disagree
  bool SetValue(Key& key, const record::Value& value);
  /// Lays a key of this or another tree over a key of this one.
  void DeepCopy(Key& to, Key& from);

  /// True from the first change until MarkSaved().
  bool has_unsaved() const { return changed_; }
  /// Bytes of saved values that unsaved ones replace.
  std::uint64_t superseded() const { return superseded_; }
  /// The record of the root with what is not saved; empty when there is nothing.
  record::Buffer WriteUnsaved();
  /// The record of the root with everything.
  record::Buffer WriteAll();
  void MarkSaved();

  RegistryError error = kRegistryOk;
  const std::u16string description;
  FilePosition position;  ///< where the tree's file was last seen to end

 private:
  using Content = Key::Content;
  struct Unsaved {
    std::vector<ValueRecord> values;
    std::vector<Key*> keys;
  };

  template <class T, class... Arguments>
  T* Make(Arguments&&... arguments) {
    return std::pmr::polymorphic_allocator<>(&memory_).new_object<T>(
        std::forward<Arguments>(arguments)...);
  }
  void AddLayer(Key& key, const record::Key& bytes);
  Content& Visit(Key& key);
  bool TakeApart(Key& key, Content& content, const Key::Layer& layer);
  Unsaved& MarkUnsaved(Key& key);
  void WriteUnsaved(record::Buffer& to, const Key& key);
  void WriteAll(record::Buffer& to, Key& key);

  std::unique_ptr<unsigned char[]> file_;
  std::pmr::monotonic_buffer_resource memory_;
  Key* root_;
  bool changed_ = false;
  std::uint64_t superseded_ = 0;
  std::unordered_map<const Key*, Unsaved> unsaved_;
};

}  // namespace orx
