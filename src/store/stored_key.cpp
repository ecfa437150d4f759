#include "store/stored_key.h"

#include "store/key_values.h"

namespace orx::cs::velta {
namespace {

/// Takes a value as it lies in the tree.
class Borrowed : public bin_value {
 public:
  std::int32_t SetFromDescriptor(const ValueDescriptor& descriptor, const void* data,
                                 bool /*copy*/) override {
    value.descriptor = descriptor;
    value.data = data;
    return 0;
  }
  ValueDescriptor GetDescriptor() const override { return value.descriptor; }
  const void* GetRawData() const override { return value.data; }
  std::uint32_t GetByteSize() const override { return value.bytes; }
  std::uint32_t GetType() const override { return value.descriptor.type; }
  const void* GetData() const override { return value.data; }
  std::uint32_t GetSize() const override { return value.descriptor.size; }

  StoredValue value;
};

}  // namespace

StoredValue FindValue(const TGenericRegistryKey& key, const wchar_t* name) {
  Borrowed borrowed;
  if (!key.GetValue(name, borrowed, 0, false)) return {};
  const bool isText = borrowed.value.descriptor.size == 0;
  borrowed.value.bytes = isText ? key.GetValueSize(name) : borrowed.value.descriptor.size;
  return borrowed.value;
}

void ShapeMemory::GoTo(const TGenericRegistryKey& entry) {
  const KeyBytes bytes = entry.GetBytes();
  if (!bytes.shape || bytes.shape != bytes_.shape) known_.clear();
  entry_ = entry;
  bytes_ = bytes;
  next_ = 0;
}

StoredValue ShapeMemory::Find(const wchar_t* sub, const wchar_t* name) {
  if (next_ < known_.size() && known_[next_].sub == sub && known_[next_].name == name) {
    const Known& known = known_[next_++];
    StoredValue value = known.value;
    value.data = bytes_.data + known.place;
    return value;
  }
  const StoredValue value = FindValue(sub ? OpenExisting(entry_, sub) : entry_, name);
  if (!value || !bytes_.shape) return value;
  const auto place =
      static_cast<std::size_t>(static_cast<const unsigned char*>(value.data) - bytes_.data);
  known_.insert(known_.begin() + static_cast<std::ptrdiff_t>(next_++), {sub, name, value, place});
  return value;
}

StoredKey StoredKey::Sub(const wchar_t* name) const {
  return memory_ ? StoredKey(*memory_, name) : StoredKey(OpenExisting(key_, name));
}

}  // namespace orx::cs::velta
