#pragma once

#include <cstring>
#include <nlohmann/json.hpp>
#include <stdexcept>
#include <string>

#include "orxregistry/in_file_key.h"
#include "store/key_values.h"

namespace velta_test {

/// A registry key as JSON, to be compared and changed: a sub-key is an object, a value an array of
/// type, size, dimension and content. The content is a text or all numbers. A key's own dimension
/// is the number "dimension", left out where it is 0.
using Json = nlohmann::ordered_json;

using Dimension = std::uint8_t;
enum ValuePart { kType, kSize, kDimension, kContent };

/// Calls a function with a number of the kind that values of a size consist of.
template <class Function>
auto WithNumberOf(std::uint32_t size, const Function& function) {
  if (size == 1) return function(std::int8_t());
  if (size == 2) return function(std::uint16_t());
  return size == 4 ? function(std::int32_t()) : function(double());
}

inline Json ReadKey(const orx::TGenericRegistryKey& key) {
  Json content = Json::object();
  if (key.GetKeyDim() != 0) content["dimension"] = key.GetKeyDim();
  for (const std::wstring& name : key.GetValueNames()) {
    orx::cs::velta::TSimpleBinValue value;
    key.GetValue(name, value, 0, false);
    const std::uint32_t size = value.GetSize();
    content[orx::Narrow(name)] = {value.GetType(), size, key.GetValueDim(name),
                                  orx::Narrow(orx::GetRegValue(key, name, std::wstring(), 0))};
    if (size == 0) continue;
    WithNumberOf(size, [&](auto number) {
      std::vector<decltype(number)> numbers(size / sizeof number);
      std::memcpy(numbers.data(), value.GetData(), size);
      content[orx::Narrow(name)][kContent] = numbers;
    });
  }
  for (orx::TGenRegKeyIterator walk(key); walk;) {
    const orx::TGenericRegistryKey sub(walk++);
    content[orx::Narrow(sub.GetName())] = ReadKey(sub);
  }
  return content;
}

inline void FillKey(orx::TGenericRegistryKey key, const Json& content) {
  for (const auto& [name, item] : content.items()) {
    const std::wstring wide = orx::Widen(name);
    if (item.is_object()) FillKey({key, wide, item.value("dimension", Dimension()), true}, item);
    if (!item.is_array()) continue;
    const Json& held = item[kContent];
    const auto add = [&, &value = item](const auto* bytes) {
      const orx::cs::velta::TSimpleBinValue adaptor(value[kType], bytes, value[kSize]);
      key.AddValue(wide, adaptor, value[kDimension], true);
    };
    if (item[kSize] == 0) {
      add(orx::ToUtf16(orx::Widen(held.get<std::string>())).c_str());
    } else {
      WithNumberOf(item[kSize],
                   [&](auto number) { add(held.get<std::vector<decltype(number)>>().data()); });
    }
  }
}

inline Json ReadGff(const std::filesystem::path& path) {
  const orx::TInFileKey tree(path.wstring(), nullptr, nullptr, true, orx::kRegistryFlags);
  if (tree.GetErrorState() != 0) throw std::runtime_error("unreadable: " + path.string());
  return ReadKey(orx::TGenericRegistryKey(orx::TGenericRegistryKeyPtr(tree)));
}

/// Puts a new file in the place of one.
inline void WriteGff(const std::filesystem::path& path, const Json& root) {
  std::filesystem::remove(path);
  orx::TInFileKey tree(L"", L"test", nullptr, false, orx::kRegistryFlags);
  FillKey(orx::TGenericRegistryKey(orx::TGenericRegistryKeyPtr(tree)), root);
  if (!tree.Save(path.wstring(), false, orx::kRegistryVersion))
    throw std::runtime_error("unwritable");
}

}  // namespace velta_test
