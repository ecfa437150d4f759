#pragma once

#include <cstdint>
#include <memory>
#include <memory_resource>
#include <set>
#include <utility>
#include <vector>

#include "file_save.h"
#include "named_list.h"
#include "orxregistry/in_file_key.h"
#include "orxregistry/registry_key.h"
#include "pending_changes.h"
#include "record_format.h"
#include "segment_file.h"

namespace orx {

/// A key in memory: its record, and what is laid over what that holds. Its sub-keys and its
/// values are each taken apart when they are first needed.
class TGenericRegistryKeyImp {
 public:
  TGenericRegistryKeyImp(KeyTree& owner, TGenericRegistryKeyImp* above, record::KeyRecord record)
      : tree(&owner),
        parent(above),
        record_(record),
        first_{record.content(), nullptr},
        depth_(static_cast<std::uint8_t>(above ? above->depth_ + 1 : 0)) {}

  record::Name name() const { return record_.name(); }
  std::uint8_t dimension() const { return record_.dimension(); }

  KeyTree* const tree;
  TGenericRegistryKeyImp* const parent;  ///< null for the root

 private:
  friend class KeyTree;

  struct Layer {
    record::Content content;
    Layer* next;
  };

  bool HasOneLayer() const { return !first_.next; }
  /// True when nobody has put anything into it or looked for anything in it.
  bool IsBlank() const { return HasOneLayer() && !values_ && !keys_ && first_.content.IsEmpty(); }

  const record::KeyRecord record_;
  Layer first_;
  Layer* last_ = nullptr;  ///< null: the first is the last
  NamedList<record::ValueRecord>* values_ = nullptr;
  NamedList<TGenericRegistryKeyImp*>* keys_ = nullptr;
  const std::uint8_t depth_;
  bool valuesAreWhole_ = false;  ///< every layer's values are in `values_`
  bool keysAreWhole_ = false;    ///< every layer's keys are in `keys_`
};

/// The values of the key that was looked at last, if it is one record with few of them. Most keys
/// of a file are read once, value after value, so that a list for each would only cost memory.
class VisitedValues {
 public:
  /// \return false when the key has too many values, or damaged ones
  bool Visit(const TGenericRegistryKeyImp& key, record::Part values);
  bool IsAt(const TGenericRegistryKeyImp& key) const { return key_ == &key; }
  /// Looks at the value found last and those behind it first.
  /// \return none when there is none of that name
  record::ValueRecord Find(LookupName& name);

 private:
  static constexpr std::size_t kMost = 16;

  const TGenericRegistryKeyImp* key_ = nullptr;
  std::size_t count_ = 0;
  std::size_t last_ = 0;
  record::ValueRecord values_[kMost];
};

/// A tree of keys in memory, together with the bytes of the file that it came from. What changed
/// since it was last saved is kept apart, so that saving costs what changed.
///
/// What always holds: A key is what its layers make when they are laid over one another in their
/// order, the entries of the file behind those of the first key below the root, and nothing is ever
/// taken out of it. Records lie in the file's bytes, in `memory_`, or in the trees of `lenders_`,
/// and stay there as long as the tree does. A list of values or of sub-keys is either not there, or
/// growing while its layers are taken apart, or whole; only a whole one gets what is new, and the
/// places in it do not move. Whatever is not in the file is pending, with all keys above it. A tree
/// with an error is only read.
class KeyTree : public std::enable_shared_from_this<KeyTree> {
 public:
  using Key = TGenericRegistryKeyImp;

  /// A tree without a file.
  explicit KeyTree(const std::u16string& description);
  explicit KeyTree(FileContent content);
  KeyTree(const KeyTree&) = delete;
  KeyTree& operator=(const KeyTree&) = delete;

  Key& root() { return *root_; }
  /// The first key below the root, whose sub-keys are the tree's entries; null when there is none.
  Key* Container();
  /// The sub-keys of a key, in their order.
  const std::pmr::vector<Key*>& Keys(Key& key) { return TakeKeys(key).items(); }
  const std::pmr::vector<record::ValueRecord>& Values(Key& key) { return TakeValues(key).items(); }

  /// \return null when there is none of that name
  template <class AnyName>
  Key* FindKey(Key& key, AnyName& name) {
    const auto& keys = TakeKeys(key);
    const std::size_t place = keys.Find(name);
    return place == keys.items().size() ? nullptr : keys.items()[place];
  }
  record::ValueRecord FindValue(Key& key, LookupName& name);

  /// What an entry, or a key in one, holds if that is one record in the tree's file; else null.
  const record::Content* ContentAsLoaded(const Key& key) const;

  /// True when what a key of the tree holds is whole, and not too deep.
  bool IsWhole(const record::Content& content, const Key& key) {
    return wholeShape_.IsWhole(content, record::kMaxDepth - key.depth_);
  }

  /// Takes everything in a key apart, to find damage.
  void LookInto(Key& key);

  /// \return the sub-key of that name, made when missing; null when it would be too deep or its
  ///     name is too long
  Key* OpenKey(Key& key, const record::Name& name, std::uint8_t dimension);
  /// Puts a value into a key, in the place of one of the same name.
  /// \return false when the value's description and data disagree
  bool SetValue(Key& key, const record::Value& value);
  /// Lays a key of this or another tree over a key of this one.
  void DeepCopy(Key& to, Key& from);
  /// True when some of the tree lies in the memory of trees that it was copied from.
  bool HasBorrowed() const { return !lenders_.empty(); }
  /// Makes a key that is not among the sub-keys of the one above it.
  /// \param memory in which the record lies
  Key& MakeLoose(Key& above, record::KeyRecord record, record::Buffer memory);

  /// True from the first change until MarkSaved().
  bool HasUnsaved() const { return pending_.Any(); }
  /// Bytes of saved values that unsaved ones replace.
  std::uint64_t superseded() const { return pending_.superseded(); }
  /// The key whose sub-keys are the entries of a file: that of the name of its first below the
  /// root. \return null when the file or the tree has no such key
  const Key* FindContainer(const FileContent& file);

  // What is not saved, of which there is something. The container is the key whose sub-keys are the
  // entries of the file.

  /// True when it is new sub-keys of the container and nothing else.
  bool AddsEntriesOnly(const Key& container) const;
  /// The sub-keys of a key of which something is not saved.
  const std::vector<const Key*>& UnsavedIn(const Key& key) const;
  /// Writes all but the entries.
  void WriteUnsavedTree(SegmentWriter& to, const Key* container);
  void WriteUnsavedEntries(SegmentWriter& to, const Key& container);

  void WriteAll(SegmentWriter& to);
  void MarkSaved() { pending_.Clear(); }

  /// What the tree was loaded from.
  FileContent& content() { return content_; }
  /// That of the tree's file.
  format::FileHeader& header() { return content_.header; }

  RegistryError error = kRegistryOk;
  FilePosition position;  ///< where it was last seen to end

 private:
  template <class T, class... Arguments>
  T* Make(Arguments&&... arguments) {
    return std::pmr::polymorphic_allocator<>(&memory_).new_object<T>(
        std::forward<Arguments>(arguments)...);
  }
  unsigned char* Room(std::size_t bytes);
  record::KeyRecord MakeRecord(const record::Name& name, std::uint8_t dimension);
  void AddLayer(Key& key, const record::Content& content);
  void TakeKey(Key& above, const record::KeyRecord& found);
  NamedList<record::ValueRecord>& TakeValues(Key& key);
  NamedList<Key*>& TakeKeys(Key& key);
  PendingChanges::OfKey& MarkUnsaved(const Key& key);
  void WriteUnsaved(record::ContentBuffer& to, const Key& key, const Key* container);
  void WriteAll(record::ContentBuffer& to, Key& key);

  FileContent content_;
  std::set<std::shared_ptr<KeyTree>> lenders_;  ///< trees in whose memory copied records lie
  std::pmr::monotonic_buffer_resource memory_;
  Key* root_;
  VisitedValues visited_;
  record::WholeShape wholeShape_;
  bool isAsLoaded_ = true;  ///< nothing was changed since it was loaded
  PendingChanges pending_;
};

}  // namespace orx
