#include "store/key_values.h"

#include <cstring>

#include "store/simple_value.h"

namespace orx::cs::velta {

bool Read(const StoredKey& key, const ValueOf<COrxStringT<wchar_t>>& value,
          COrxStringT<wchar_t>& to) {
  const StoredValue stored = key.Find(value.name);
  if (stored.descriptor.type != kWideString || stored.descriptor.dimension != kValueDimension) {
    return false;
  }
  if (!Read(stored, to)) to.clear();
  return true;
}

bool ReadDoubles(const StoredKey& key, const wchar_t* name, double* to, std::size_t count) {
  const StoredValue stored = key.Find(name);
  const std::size_t bytes = count * sizeof(double);
  if (stored.bytes != bytes) return false;
  // A text with a zero in its middle gives fewer bytes than are stored.
  TSimpleBinValue block;
  if (stored.descriptor.size == 0) {
    block.SetFromDescriptor(stored.descriptor, stored.data, false);
    if (block.GetByteSize() != bytes) return false;
  }
  std::memcpy(to, stored.data, bytes);
  return true;
}

}  // namespace orx::cs::velta
