#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string_view>
#include <vector>

#include "orxregistry/bin_value.h"
#include "orxregistry/export.h"
#include "orxutils/orx_string.h"

namespace orx {

class TInKey;
class TGenericRegistryKey;
/// A key inside a tree; only the registry looks into it. The pointer keeps the tree's memory
/// alive.
class TGenericRegistryKeyImp;
/// A key that is shared by those who look at it.
using TGenericRegistryKeyImpPtr = std::shared_ptr<TGenericRegistryKeyImp>;

/// The root of a tree.
class ORXREGISTRY_EXPORT TGenericRegistryKeyPtr {
 public:
  /// The root of a tree, which may go before this does.
  explicit TGenericRegistryKeyPtr(const TInKey& tree);
  /// The root as the key's constructor takes it.
  operator TGenericRegistryKeyImpPtr() const;

 private:
  TGenericRegistryKeyImpPtr root_;
};

/// Reads a value by its C++ type.
/// \param key the key that has the value
/// \param name the value's
/// \param fallback what to return instead
/// \param index 0, the only one there is
/// \return the stored value, or `fallback` when it cannot be read
template <class T>
T GetRegValue(const TGenericRegistryKey& key, std::wstring_view name, const T& fallback, int index);

/// Reads a text; see the general form.
template <>
ORXREGISTRY_EXPORT COrxStringT<wchar_t> GetRegValue(const TGenericRegistryKey& key,
                                                    std::wstring_view name,
                                                    const COrxStringT<wchar_t>& fallback,
                                                    int index);

/// The bytes of the values in a key and below it, where they lie together as they were loaded.
struct KeyBytes {
  /// The same for keys that hold values and sub-keys of the same names, kinds and sizes, so that a
  /// value of one has the same place in its data as that of the other. Null: there are no such
  /// bytes.
  const void* shape = nullptr;
  const unsigned char* data = nullptr;  ///< as long as the key's tree lives
};

/// A key: named values and named sub-keys, both in the order in which they were first added.
/// Values and keys are looked up by their exact names. Reading takes keys apart as it goes, so
/// one tree must not be used by two threads at once, not even to read.
class ORXREGISTRY_EXPORT TGenericRegistryKey {
 public:
  /// \param imp a root, what an iterator gave, or null
  explicit TGenericRegistryKey(TGenericRegistryKeyImpPtr imp);
  /// Opens the sub-key `name` of `parent`. One that does not exist is made, with that dimension,
  /// when `create` is true, and is null otherwise.
  TGenericRegistryKey(const TGenericRegistryKey& parent, std::wstring_view name,
                      std::uint8_t dimension, bool create);

  /// True when there is no key behind this; it then has no values and no sub-keys.
  bool IsNull() const { return imp_ == nullptr; }
  /// The key's name; empty for a root and for a null key.
  COrxStringT<wchar_t> GetName() const;
  /// The dimension that the key was made with, 0 for a null key.
  std::uint8_t GetKeyDim() const;
  /// True when there is a sub-key of that name.
  bool HasKey(std::wstring_view name) const;

  /// Lays `source` over this key: its values and sub-keys, recursively. What only this key holds
  /// stays.
  void DeepCopy(const TGenericRegistryKey& source);

  /// Stores a copy of the adaptor's value.
  /// \param name replaces a value of the same name
  /// \param value the adaptor
  /// \param dimension stored with the value
  /// \param flag no meaning here
  /// \return non-zero on success; 0 when the key is null, the adaptor is empty, or the adaptor's
  ///     description and its bytes disagree
  int AddValue(std::wstring_view name, const bin_value& value, std::uint8_t dimension, bool flag);

  /// Non-zero when a value of that name exists.
  int HasValue(std::wstring_view name) const;
  /// Type code of a value, 0 when there is none.
  std::uint32_t GetValueType(std::wstring_view name) const;
  /// Bytes of a value (of a string: its text with the terminator), 0 when there is none.
  std::uint32_t GetValueSize(std::wstring_view name) const;
  /// Dimension of a value, 0 when there is none.
  std::uint8_t GetValueDim(std::wstring_view name) const;

  /// Hands a value to the adaptor.
  /// \param name the value's
  /// \param value the adaptor
  /// \param index 0, the only one there is
  /// \param copy true: the adaptor is to take a copy; false: it may refer to the tree's memory,
  ///     which lives as long as the tree and every key of it
  /// \return true when the value exists and the adaptor took it
  bool GetValue(std::wstring_view name, bin_value& value, int index, bool copy) const;

  /// Looks at everything in the key: damage shows only then, in the tree's error state.
  void LookInto() const;

  /// For an entry of a file that is whole and one record there; none for any other key, and once
  /// the tree has been changed.
  KeyBytes GetBytes() const;

  /// The names of the values, for a look at a file whose content is not known beforehand.
  std::vector<COrxStringT<wchar_t>> GetValueNames() const;

 private:
  friend class TGenRegKeyIterator;
  template <class T>
  friend T GetRegValue(const TGenericRegistryKey& key, std::wstring_view name, const T& fallback,
                       int index);

  TGenericRegistryKeyImpPtr imp_;
};

/// Walks the sub-keys of a key, which must not get new ones meanwhile.
class ORXREGISTRY_EXPORT TGenRegKeyIterator {
 public:
  /// Begins with the first sub-key of `key`.
  explicit TGenRegKeyIterator(const TGenericRegistryKey& key);

  /// True while a sub-key is left.
  explicit operator bool() const;
  /// \return the current sub-key, null when none is left; advances
  TGenericRegistryKeyImpPtr operator++(int);

 private:
  TGenericRegistryKeyImpPtr parent_;
  std::size_t next_ = 0;
};

}  // namespace orx
