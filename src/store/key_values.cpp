#include "store/key_values.h"

#include <cstring>

#include "store/simple_value.h"

namespace orx::cs::velta {

bool ReadDoubles(const TGenericRegistryKey& key, const wchar_t* name, double* to,
                 std::size_t count) {
  const std::size_t bytes = count * sizeof(double);
  if (key.GetValueSize(name) != bytes) return false;
  TSimpleBinValue block;
  // A text with a zero in its middle gives fewer bytes than are stored.
  if (!key.GetValue(name, block, 0, false)) return false;
  if (block.GetByteSize() != bytes) return false;
  std::memcpy(to, block.GetData(), bytes);
  return true;
}

}  // namespace orx::cs::velta
