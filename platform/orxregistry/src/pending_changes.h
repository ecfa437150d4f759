#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <unordered_map>
#include <vector>

#include "record_format.h"

namespace orx {

class TGenericRegistryKeyImp;

/// What is in a tree and in no file yet: the keys that a save has to write, each with the places,
/// in its lists, of the values and the sub-keys that it has to write there.
class PendingChanges {
 public:
  using Key = TGenericRegistryKeyImp;

  /// What is pending of a key.
  struct OfKey {
    bool isNew = false;                     ///< no file has the key
    std::optional<record::Content> copied;  ///< what all that the key holds came from, if one did
    std::vector<std::size_t> values;  ///< places of the values, in the order in which they changed
    std::vector<bool> isPending;      ///< by place; those behind its end are not
    std::vector<const Key*> keys;

    /// Makes room, so that Add() of the same place does not throw.
    void Reserve(std::size_t value);
    /// \return false when it was pending already
    bool Add(std::size_t value);
  };

  /// True from the first change until Clear().
  bool Any() const { return !keys_.empty(); }
  /// Bytes of saved values that pending ones replace.
  std::uint64_t superseded() const { return superseded_; }

  /// What is pending of a key, which is also entered at the keys above it.
  OfKey& Of(const Key& key);
  /// What is pending of a key of which something is.
  const OfKey& At(const Key& key) const { return keys_.at(&key); }
  /// \return null when nothing is pending of the key
  const OfKey* Find(const Key& key) const {
    const auto found = keys_.find(&key);
    return found == keys_.end() ? nullptr : &found->second;
  }

  void CountSuperseded(std::size_t bytes) { superseded_ += bytes; }

  /// Forgets a key below the root, of which something has just become pending.
  void Forget(const Key& key);
  void Clear();

 private:
  std::unordered_map<const Key*, OfKey> keys_;
  std::uint64_t superseded_ = 0;
};

}  // namespace orx
