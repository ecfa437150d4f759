#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "fuzz/record_tree.h"
#include "orxregistry/area_walk.h"
#include "orxregistry/in_file_key.h"
#include "orxutils/path.h"
#include "support/file_bytes.h"
#include "support/temporary_directory.h"

namespace velta_test {

/// A value of any description, as a caller hands it to a key or takes it from one.
class RawValue : public orx::bin_value {
 public:
  explicit RawValue(std::uint32_t type = 0, std::uint32_t elementSize = 0, std::string bytes = "")
      : descriptor_{type, elementSize, 1}, bytes_(std::move(bytes)) {}
  static RawValue Block(const std::string& bytes) {
    return RawValue(orx::kByteBlock, static_cast<std::uint32_t>(bytes.size()), bytes);
  }

  std::int32_t SetFromDescriptor(const orx::ValueDescriptor& descriptor, const void* data,
                                 bool) override {
    descriptor_ = descriptor;
    bytes_.assign(static_cast<const char*>(data), descriptor.size);
    return 0;
  }
  orx::ValueDescriptor GetDescriptor() const override { return descriptor_; }
  const void* GetRawData() const override { return descriptor_.type ? bytes_.data() : nullptr; }
  std::uint32_t GetByteSize() const override { return static_cast<std::uint32_t>(bytes_.size()); }
  std::uint32_t GetType() const override { return descriptor_.type; }
  const void* GetData() const override { return GetRawData(); }
  std::uint32_t GetSize() const override { return descriptor_.size; }
  const std::string& bytes() const { return bytes_; }

 private:
  orx::ValueDescriptor descriptor_;
  std::string bytes_;
};

/// Text as it is stored.
inline std::string Units(std::u16string_view text) {
  return {reinterpret_cast<const char*>(text.data()), text.size() * 2};
}

inline orx::TGenericRegistryKey RootOf(const orx::TInFileKey& tree) {
  return orx::TGenericRegistryKey(orx::TGenericRegistryKeyPtr(tree));
}

/// The whole of a key as text: names, dimensions, types, bytes, in their order.
inline std::string Describe(const orx::TGenericRegistryKey& key) {
  std::string text = "(" + std::to_string(key.GetKeyDim());
  for (const std::wstring& name : key.GetValueNames()) {
    RawValue value;
    key.GetValue(name, value, 0, false);
    text += " " + orx::Narrow(name) + "=" + std::to_string(key.GetValueType(name)) + ":" +
            std::to_string(key.GetValueDim(name)) + ":" + value.bytes() +
            orx::Narrow(orx::GetRegValue<std::wstring>(key, name, L"", 0));
  }
  for (orx::TGenRegKeyIterator walk(key); walk;) {
    const orx::TGenericRegistryKey sub(walk++);
    text += " " + orx::Narrow(sub.GetName()) + Describe(sub);
  }
  return text + ")";
}

inline std::string Describe(const orx::TInFileKey& tree) { return Describe(RootOf(tree)); }

inline orx::TGenericRegistryKey Open(const orx::TGenericRegistryKey& parent,
                                     const std::wstring& name) {
  return {parent, name, 0, true};
}

/// A registry file in a directory of its own.
struct RegistryFile {
  static orx::TCSInFileKey New() {
    return {L"", L"a description", nullptr, false, orx::kRegistryFlags};
  }
  std::wstring Name() const { return orx::ToName(path); }
  orx::TCSInFileKey Load() const { return {Name(), nullptr, nullptr, true, orx::kRegistryFlags}; }
  /// Makes the file with a container that holds one value. It has an index, of small nodes.
  void Create(const std::string& value = "first") const {
    orx::TCSInFileKey tree = New();
    tree.IndexBy(Areas());
    AddEntry(tree, L"S_0", value);
    tree.Save(Name(), false, orx::kRegistryVersion);
    SetBytes(velta_fuzz::WithFanOut(2, Bytes()));
  }
  static orx::EntryAreas Areas() { return {{u"where", u"area", 32, {}, false}}; }
  /// The tree as Describe() has it, by the entries that the index leads to and those behind them.
  std::string Walked() const {
    orx::TAreaWalk walk(Name(), Areas(), 0, [](const orx::AreaBounds&) { return true; });
    std::string entries;
    for (auto entry = walk.Next(); !entry.IsNull(); entry = walk.Next()) {
      const std::string described = " " + orx::Narrow(entry.GetName()) + Describe(entry);
      if (entries.find(described) == entries.npos) entries += described;
    }
    return "(0 container(0" + entries + "))";
  }
  /// Adds an entry with one value to the container of a tree.
  static void AddEntry(const orx::TInFileKey& tree, const std::wstring& entry,
                       const std::string& value) {
    Open(Open(RootOf(tree), L"container"), entry)
        .AddValue(L"value", RawValue::Block(value), 1, true);
  }
  /// Adds an entry and saves, as one ingestion does.
  bool Append(const std::wstring& entry, const std::string& value) const {
    orx::TCSInFileKey tree = Load();
    AddEntry(tree, entry, value);
    return tree.Save(false, orx::kRegistryVersion);
  }
  std::string Bytes() const { return ReadBytes(path); }
  void SetBytes(const std::string& bytes) const { WriteBytes(path, bytes); }

  TemporaryDirectory directory;
  std::filesystem::path path = directory / "tree.dff";
};

}  // namespace velta_test
