#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

#include "orxregistry/registry_key.h"
#include "store/simple_value.h"
#include "store/stored_key.h"
#include "store/typed_value.h"

/// How the values of a key are written, tested and read.
namespace orx::cs::velta {

/// A value of one kind, by its name.
template <class T>
struct ValueOf {
  const wchar_t* name;
};

/// A block of doubles, by its name.
template <std::size_t count>
struct DoublesOf {
  static constexpr std::uint32_t kBytes = count * sizeof(double);
  const wchar_t* name;
};

inline constexpr std::uint8_t kValueDimension = 1;

/// \return false when the key did not take the value
template <class T>
bool Add(TGenericRegistryKey& key, const ValueOf<T>& value, const T& content) {
  return key.AddValue(value.name, TBinValue<T>(content), kValueDimension, true) != 0;
}

template <std::size_t count>
bool Add(TGenericRegistryKey& key, const DoublesOf<count>& value, const double (&content)[count]) {
  const TSimpleBinValue block(kByteBlock, content, sizeof content);
  return key.AddValue(value.name, block, kValueDimension, true) != 0;
}

/// A key that has none when there is no such sub-key.
inline TGenericRegistryKey OpenExisting(const TGenericRegistryKey& parent, std::wstring_view name) {
  return {parent, name, 0, false};
}

/// Reads a value that must have the type code and the size of its kind.
/// \return false when it has not; `to` is then as it was
template <class T>
bool Read(const StoredValue& stored, T& to) {
  TBinValue<T> typed{T()};
  if (!stored || typed.SetFromDescriptor(stored.descriptor, stored.data, false) != 0) return false;
  to = typed.GetTypedValue();
  return true;
}

/// The same of a key's value.
template <class T>
bool Read(const StoredKey& key, const ValueOf<T>& value, T& to) {
  return Read(key.Find(value.name), to);
}

/// Reads a value that must be there, of whatever kind.
/// \return false when there is none; of another kind `to` is T()
template <class T>
bool ReadAny(const StoredKey& key, const ValueOf<T>& value, T& to) {
  const StoredValue stored = key.Find(value.name);
  if (!Read(stored, to)) to = T();
  return static_cast<bool>(stored);
}

/// Reads a text that must have the dimension that values are written with.
/// \return false when there is none; `to` is then as it was
bool Read(const StoredKey& key, const ValueOf<COrxStringT<wchar_t>>& value,
          COrxStringT<wchar_t>& to);

/// Reads a block of exactly so many doubles, whatever its type code.
/// \return false when there is none of that size
bool ReadDoubles(const StoredKey& key, const wchar_t* name, double* to, std::size_t count);

template <std::size_t count>
bool Read(const StoredKey& key, const DoublesOf<count>& value, double (&to)[count]) {
  return ReadDoubles(key, value.name, to, count);
}

}  // namespace orx::cs::velta
