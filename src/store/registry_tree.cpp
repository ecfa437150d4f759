#include "store/registry_tree.h"

namespace orx::cs::velta {

TGenericRegistryKey ContainerOf(const TInKey& tree) {
  TGenRegKeyIterator walk{TGenericRegistryKey(TGenericRegistryKeyPtr(tree))};
  return TGenericRegistryKey(walk++);
}

void ReadIfLost(TInFileKey& file) {
  if (file.GetErrorState() == kCannotBeOpened) file.Reload();
}

}  // namespace orx::cs::velta
