#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

#include "orxregistry/registry_key.h"
#include "store/simple_value.h"
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
  if (!parent.HasKey(name)) return TGenericRegistryKey(TGenericRegistryKeyImpPtr());
  return {parent, name, 0, true};
}

template <class T>
bool Has(const TGenericRegistryKey& key, const ValueOf<T>& value) {
  return key.HasValue(value.name) != 0;
}

/// \return the stored value, `T()` when there is none of that kind
template <class T>
T Read(const TGenericRegistryKey& key, const ValueOf<T>& value) {
  TBinValue<T> stored{T()};
  return key.GetValue(value.name, stored, 0, false) ? stored.GetTypedValue() : T();
}

/// Reads a value that must have the type code and the size of its kind.
/// \return false when there is none; `to` is then as it was
template <class T>
bool Read(const TGenericRegistryKey& key, const ValueOf<T>& value, T& to) {
  TBinValue<T> stored{T()};
  if (!key.GetValue(value.name, stored, 0, false)) return false;
  to = stored.GetTypedValue();
  return true;
}

/// Reads a text that must have the dimension that values are written with.
/// \return false when there is none; `to` is then as it was
inline bool Read(const TGenericRegistryKey& key, const ValueOf<COrxStringT<wchar_t>>& value,
                 COrxStringT<wchar_t>& to) {
  const bool isText =
      key.GetValueType(value.name) == kWideString && key.GetValueDim(value.name) == kValueDimension;
  if (isText) to = GetRegValue<COrxStringT<wchar_t>>(key, value.name, {}, 0);
  return isText;
}

/// Reads a block of exactly so many doubles, whatever its type code.
/// \return false when there is none of that size
bool ReadDoubles(const TGenericRegistryKey& key, const wchar_t* name, double* to,
                 std::size_t count);

template <std::size_t count>
bool Read(const TGenericRegistryKey& key, const DoublesOf<count>& value, double (&to)[count]) {
  return ReadDoubles(key, value.name, to, count);
}

}  // namespace orx::cs::velta
