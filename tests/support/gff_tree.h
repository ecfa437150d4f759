#pragma once

#include <charconv>
#include <cstdint>
#include <cstring>
#include <filesystem>
#include <stdexcept>
#include <string>
#include <vector>

#include "orxregistry/in_file_key.h"
#include "orxregistry/registry_key.h"
#include "store/simple_value.h"

namespace velta_test {

struct GffValue {
  std::wstring name;
  std::uint32_t type = 0;
  std::uint32_t size = 0;  ///< 0: text
  std::uint8_t dimension = 1;
  std::string bytes = {};

  bool operator==(const GffValue&) const = default;
  /// Text, an integer, or doubles: of more than 13 the first three and the last.
  std::string Content() const {
    if (size == 0) {
      std::u16string units(bytes.size() / 2 - 1, u'\0');
      std::memcpy(units.data(), bytes.data(), units.size() * 2);
      return " " + orx::Narrow(orx::FromUtf16(units));
    }
    if (size == 1) return Numbers<std::int8_t>();
    return size == 2 ? Numbers<std::int16_t>() : size == 4 ? Numbers<int>() : Numbers<double>();
  }

 private:
  template <class T>
  std::string Numbers() const {
    std::vector<T> numbers(bytes.size() / sizeof(T));
    std::memcpy(numbers.data(), bytes.data(), bytes.size());
    if (numbers.size() > 13) numbers.erase(numbers.begin() + 3, numbers.end() - 1);
    std::string all;
    for (const T number : numbers) {
      char text[32] = {};
      std::to_chars(std::begin(text), std::end(text), number);
      all += std::string(" ") + text;
    }
    return all;
  }
};

/// A key of a registry file, to be looked at and changed.
struct GffKey {
  std::wstring name = {};
  std::uint8_t dimension = 0;
  std::vector<GffValue> values = {};
  std::vector<GffKey> keys = {};

  bool operator==(const GffKey&) const = default;
  GffKey& operator[](const std::wstring& sub) { return Find(keys, sub); }
  GffValue& Value(const std::wstring& value) { return Find(values, value); }
  /// Of the root of an RTCM file.
  GffKey& Container() { return keys.at(0); }
  GffKey& Entry(std::size_t place = 0) { return Container().keys.at(place); }

  void Remove(const std::wstring& item) {
    const auto isIt = [&](const auto& candidate) { return candidate.name == item; };
    if (std::erase_if(values, isIt) + std::erase_if(keys, isIt) != 1) throw std::out_of_range("?");
  }
  template <class T>
  void Set(const std::wstring& value, const std::vector<T>& content) {
    GffValue& changed = Value(value);
    changed.bytes.assign(reinterpret_cast<const char*>(content.data()), content.size() * sizeof(T));
    if (changed.size != 0) changed.size = static_cast<std::uint32_t>(changed.bytes.size());
  }
  /// All there is below: a key in brackets, a value as "name type size dimension content".
  std::string Dump() const {
    std::string text;
    for (const GffValue& value : values) {
      text += orx::Narrow(value.name);
      for (const std::uint32_t number : {value.type, value.size, std::uint32_t{value.dimension}}) {
        text += " " + std::to_string(number);
      }
      text += value.Content() + "\n";
    }
    for (const GffKey& key : keys) text += "[" + orx::Narrow(key.name) + "]\n" + key.Dump();
    return text;
  }

 private:
  template <class Item>
  static Item& Find(std::vector<Item>& items, const std::wstring& sought) {
    for (Item& item : items) {
      if (item.name == sought) return item;
    }
    throw std::out_of_range(orx::Narrow(sought));
  }
};

inline orx::TGenericRegistryKey RootOf(const orx::TInKey& tree) {
  return orx::TGenericRegistryKey(orx::TGenericRegistryKeyPtr(tree));
}

inline GffKey ReadKey(const orx::TGenericRegistryKey& key) {
  GffKey content{key.GetName(), key.GetKeyDim()};
  for (const std::wstring& name : key.GetValueNames()) {
    orx::cs::velta::TSimpleBinValue value;
    key.GetValue(name, value, 0, false);
    content.values.push_back({name,
                              value.GetType(),
                              value.GetSize(),
                              key.GetValueDim(name),
                              {static_cast<const char*>(value.GetData()), value.GetByteSize()}});
  }
  for (orx::TGenRegKeyIterator walk(key); walk;) {
    content.keys.push_back(ReadKey(orx::TGenericRegistryKey(walk++)));
  }
  return content;
}

inline void FillKey(orx::TGenericRegistryKey key, const GffKey& content) {
  for (const auto& [name, type, size, dimension, bytes] : content.values) {
    const orx::cs::velta::TSimpleBinValue value(static_cast<std::uint8_t>(type), bytes.data(),
                                                size);
    if (!key.AddValue(name, value, dimension, true)) throw std::runtime_error("no such value");
  }
  for (const GffKey& sub : content.keys) FillKey({key, sub.name, sub.dimension, true}, sub);
}

inline GffKey ReadGff(const std::filesystem::path& path) {
  const orx::TInFileKey tree(path.wstring(), nullptr, nullptr, true, 97);
  if (tree.GetErrorState() != 0) throw std::runtime_error("unreadable: " + path.string());
  return ReadKey(RootOf(tree));
}

/// Puts a new file in the place of one.
inline void WriteGff(const std::filesystem::path& path, const GffKey& root) {
  std::filesystem::remove(path);
  orx::TInFileKey tree(L"", L"test", nullptr, false, 97);
  FillKey(RootOf(tree), root);
  if (!tree.Save(path.wstring(), false, 512)) throw std::runtime_error("unwritable");
}

}  // namespace velta_test
