#include "pending_changes.h"

#include "key_tree.h"

namespace orx {

void PendingChanges::OfKey::Reserve(std::size_t value) {
  if (value >= isPending.size()) isPending.resize(value + 1);
  if (values.size() == values.capacity()) values.reserve(2 * values.size() + 1);
}

bool PendingChanges::OfKey::Add(std::size_t value) {
  Reserve(value);
  if (isPending[value]) return false;
  values.push_back(value);
  isPending[value] = true;
  return true;
}

PendingChanges::OfKey& PendingChanges::Of(const Key& key) {
  const auto [entry, isNew] = keys_.try_emplace(&key);
  OfKey& pending = entry->second;
  if (isNew && key.parent) {
    try {
      Of(*key.parent).keys.push_back(&key);
    } catch (...) {
      keys_.erase(&key);  // no save would reach it
      throw;
    }
  }
  return pending;
}

void PendingChanges::Forget(const Key& key) {
  keys_.at(key.parent).keys.pop_back();
  keys_.erase(&key);
}

void PendingChanges::Clear() {
  keys_.clear();
  superseded_ = 0;
}

}  // namespace orx
