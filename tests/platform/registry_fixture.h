#pragma once

#include <cstdint>
#include <string>

#include "orxregistry/in_file_key.h"
#include "support/file_bytes.h"
#include "support/temporary_directory.h"

namespace velta_test {

/// A value of any description, as a caller hands it to a key or takes it from one.
class RawValue : public orx::bin_value {
 public:
  RawValue() = default;
  RawValue(std::uint32_t type, std::uint32_t elementSize, std::string bytes)
      : type_(type), size_(elementSize), bytes_(std::move(bytes)) {}
  static RawValue Block(std::string bytes) {
    const auto size = static_cast<std::uint32_t>(bytes.size());
    return {orx::kByteBlock, size, std::move(bytes)};
  }
  static RawValue Text(const std::wstring& text) {
    const std::u16string units = orx::ToUtf16(text) + u'\0';
    return {orx::kWideString, 0,
            std::string(reinterpret_cast<const char*>(units.data()), units.size() * 2)};
  }

  std::int32_t SetFromDescriptor(const orx::ValueDescriptor& descriptor, const void* data,
                                 bool) override {
    type_ = descriptor.type;
    size_ = descriptor.size;
    bytes_.assign(static_cast<const char*>(data), size_);
    return 0;
  }
  orx::ValueDescriptor GetDescriptor() const override { return {type_, size_, 1}; }
  const void* GetRawData() const override { return GetData(); }
  std::uint32_t GetByteSize() const override { return static_cast<std::uint32_t>(bytes_.size()); }
  std::uint32_t GetType() const override { return type_; }
  const void* GetData() const override { return type_ == 0 ? nullptr : bytes_.data(); }
  std::uint32_t GetSize() const override { return size_; }

 private:
  std::uint32_t type_ = 0;
  std::uint32_t size_ = 0;
  std::string bytes_;
};

inline orx::TGenericRegistryKey RootOf(const orx::TInFileKey& tree) {
  return orx::TGenericRegistryKey(orx::TGenericRegistryKeyPtr(tree));
}

/// The whole of a key as text: names, dimensions, types, bytes, in their order.
inline std::string Describe(const orx::TGenericRegistryKey& key) {
  std::string text = "(" + std::to_string(key.GetKeyDim());
  for (const std::wstring& name : key.GetValueNames()) {
    RawValue value;
    const bool isText = key.GetValueType(name) == orx::kWideString;
    if (!isText) key.GetValue(name, value, 0, false);
    text += " " + orx::Narrow(name) + "=" + std::to_string(key.GetValueType(name)) + ":" +
            std::to_string(key.GetValueDim(name)) + ":";
    text += isText ? orx::Narrow(orx::GetRegValue<std::wstring>(key, name, L"", 0))
                   : std::string(static_cast<const char*>(value.GetData()), value.GetByteSize());
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
class RegistryFile {
 public:
  explicit RegistryFile(const std::string& name = "tree.dff") : path(directory / name) {}

  static orx::TCSInFileKey New() { return {L"", L"a description", nullptr, false, 97}; }
  orx::TCSInFileKey Load() const { return {path.wstring(), nullptr, nullptr, true, 97}; }
  /// Makes the file with a container that holds one value.
  void Create(const std::string& value = "first") const {
    orx::TCSInFileKey tree = New();
    AddEntry(tree, L"S_0", value);
    tree.Save(path.wstring(), false, 512);
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
    return tree.Save(false, 512);
  }
  std::string Bytes() const { return ReadBytes(path); }
  void SetBytes(const std::string& bytes) const { WriteBytes(path, bytes); }

  TemporaryDirectory directory;
  std::filesystem::path path;
};

}  // namespace velta_test
