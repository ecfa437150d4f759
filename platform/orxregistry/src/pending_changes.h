#pragma once

#include <cstddef>
#include <cstdint>
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
    record::KeyRecord copied;         ///< a record that all of the key's content came from, or none
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
  /// What a save will write at least.
  std::size_t bytes() const { return bytes_; }
  /// Bytes of saved values that pending ones replace.
  std::uint64_t superseded() const { return superseded_; }

  /// What is pending of a key, which is also entered at the keys above it.
  OfKey& Of(const Key& key);
  /// What is pending of a key of which something is.
  const OfKey& At(const Key& key) const { return keys_.at(&key); }

  void CountBytes(std::size_t bytes) { bytes_ += bytes; }
  void CountSuperseded(std::size_t bytes) { superseded_ += bytes; }

  void Clear();

 private:
  std::unordered_map<const Key*, OfKey> keys_;
  std::size_t bytes_ = 0;
  std::uint64_t superseded_ = 0;
};

}  // namespace orx
