#pragma once

#include "orxregistry/in_file_key.h"
#include "orxregistry/registry_key.h"

/// What is alike in the trees of all datum and projection files.
namespace orx::cs::velta {

/// What registry trees are made and opened with.
inline constexpr const wchar_t* kTreeDescription = L"Sylbri RTCM System";
inline constexpr unsigned kTreeFlags = 97;

/// The first sub-key, null when there is none.
TGenericRegistryKey FirstSubKey(const TGenericRegistryKey& key);

/// The container key of a tree: the first under its root; null when there is none.
TGenericRegistryKey ContainerOf(const TInKey& tree);

}  // namespace orx::cs::velta
