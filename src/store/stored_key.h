#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "orxregistry/registry_key.h"

/// Looking for values in the keys of a file.
namespace orx::cs::velta {

/// A value as it is stored.
struct StoredValue {
  ValueDescriptor descriptor = {};  ///< type 0: there is none
  std::uint32_t bytes = 0;
  const void* data = nullptr;  ///< as long as the key's tree lives

  explicit operator bool() const { return descriptor.type != kNoValue; }
};

StoredValue FindValue(const TGenericRegistryKey& key, const wchar_t* name);

/// Looks for the same values in one entry after the other. Entries of one shape have them at the
/// same places, so that they are looked up once.
class ShapeMemory {
 public:
  /// Goes to the next entry.
  void GoTo(const TGenericRegistryKey& entry);

  /// \param sub of the entry; null: the entry itself
  /// \param name always the same pointer for one name, as `sub` is
  StoredValue Find(const wchar_t* sub, const wchar_t* name);

 private:
  struct Known {
    const wchar_t* sub;
    const wchar_t* name;
    StoredValue value;
    std::size_t place;  ///< in the entry's bytes
  };

  TGenericRegistryKey entry_{nullptr};
  KeyBytes bytes_;
  std::vector<Known> known_;  ///< in the order in which they are looked for
  std::size_t next_ = 0;
};

/// A key whose values are read.
class StoredKey {
 public:
  StoredKey(const TGenericRegistryKey& key) : key_(key) {}  // NOLINT: it is the same key
  /// The entry that a memory is at, or a sub-key of it. The memory must outlive the object.
  explicit StoredKey(ShapeMemory& memory, const wchar_t* sub = nullptr)
      : memory_(&memory), sub_(sub) {}

  StoredKey Sub(const wchar_t* name) const;
  StoredValue Find(const wchar_t* name) const {
    return memory_ ? memory_->Find(sub_, name) : FindValue(key_, name);
  }

 private:
  TGenericRegistryKey key_{nullptr};
  ShapeMemory* memory_ = nullptr;
  const wchar_t* sub_ = nullptr;
};

}  // namespace orx::cs::velta
