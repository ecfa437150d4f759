#include "store/registry_tree.h"

namespace orx::cs::velta {

TGenericRegistryKey FirstSubKey(const TGenericRegistryKey& key) {
  TGenRegKeyIterator walk(key);
  return TGenericRegistryKey(walk++);
}

TGenericRegistryKey ContainerOf(const TInKey& tree) {
  return FirstSubKey(TGenericRegistryKey(TGenericRegistryKeyPtr(tree)));
}

}  // namespace orx::cs::velta
