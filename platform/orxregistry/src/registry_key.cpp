#include "orxregistry/registry_key.h"

#include <cstring>
#include <utility>

#include "key_tree.h"

namespace orx {
namespace {

/// A key of the tree that `relative` belongs to, keeping that tree alive.
TGenericRegistryKeyImpPtr Share(const TGenericRegistryKeyImpPtr& relative,
                                TGenericRegistryKeyImp* key) {
  return key ? TGenericRegistryKeyImpPtr(relative, key) : nullptr;
}

COrxStringT<wchar_t> ToWide(const record::Name& name) {
  std::u16string text(name.bytes / sizeof(char16_t), u'\0');
  std::memcpy(text.data(), name.units, name.bytes);
  return FromUtf16(text);
}

record::ValueRecord Find(const TGenericRegistryKeyImpPtr& key, std::wstring_view name) {
  if (!key) return {};
  LookupName sought(name);
  return key->tree->FindValue(*key, sought);
}

}  // namespace

TGenericRegistryKey::TGenericRegistryKey(TGenericRegistryKeyImpPtr imp) : imp_(std::move(imp)) {}

TGenericRegistryKey::TGenericRegistryKey(const TGenericRegistryKey& parent, std::wstring_view name,
                                         std::uint8_t dimension, bool create) {
  if (parent.IsNull()) return;
  KeyTree& tree = *parent.imp_->tree;
  LookupName sought(name);
  TGenericRegistryKeyImp* key = tree.FindKey(*parent.imp_, sought);
  if (!key && create) key = tree.OpenKey(*parent.imp_, sought.Units(), dimension);
  imp_ = Share(parent.imp_, key);
}

COrxStringT<wchar_t> TGenericRegistryKey::GetName() const {
  return imp_ ? ToWide(imp_->name()) : COrxStringT<wchar_t>();
}

std::uint8_t TGenericRegistryKey::GetKeyDim() const {
  return imp_ ? imp_->dimension() : std::uint8_t{0};
}

bool TGenericRegistryKey::HasKey(std::wstring_view name) const {
  LookupName sought(name);
  return imp_ && imp_->tree->FindKey(*imp_, sought);
}

void TGenericRegistryKey::DeepCopy(const TGenericRegistryKey& source) {
  if (imp_ && source.imp_) imp_->tree->DeepCopy(*imp_, *source.imp_);
}

int TGenericRegistryKey::AddValue(std::wstring_view name, const bin_value& value,
                                  std::uint8_t dimension, bool /*flag*/) {
  const void* const data = value.GetData();
  if (!imp_ || !data) return 0;
  LookupName target(name);
  record::Value stored;
  stored.type = value.GetType();
  stored.elementSize = value.GetSize();
  stored.dimension = dimension;
  stored.name = target.Units();
  stored.data = static_cast<const unsigned char*>(data);
  stored.dataSize = value.GetByteSize();
  return imp_->tree->SetValue(*imp_, stored) ? 1 : 0;
}

int TGenericRegistryKey::HasValue(std::wstring_view name) const { return Find(imp_, name) ? 1 : 0; }

std::uint32_t TGenericRegistryKey::GetValueType(std::wstring_view name) const {
  const record::ValueRecord found = Find(imp_, name);
  return found ? found.value().type : std::uint32_t{kNoValue};
}

std::uint32_t TGenericRegistryKey::GetValueSize(std::wstring_view name) const {
  const record::ValueRecord found = Find(imp_, name);
  return found ? found.value().dataSize : 0;
}

std::uint8_t TGenericRegistryKey::GetValueDim(std::wstring_view name) const {
  const record::ValueRecord found = Find(imp_, name);
  return found ? found.value().dimension : std::uint8_t{0};
}

bool TGenericRegistryKey::GetValue(std::wstring_view name, bin_value& value, int index,
                                   bool copy) const {
  const record::ValueRecord found = Find(imp_, name);
  if (!found || index != 0) return false;
  const record::Value stored = found.value();
  const ValueDescriptor descriptor{stored.type, stored.elementSize, stored.dimension};
  return value.SetFromDescriptor(descriptor, stored.data, copy) == 0;
}

void TGenericRegistryKey::LookInto() const {
  if (imp_) imp_->tree->LookInto(*imp_);
}

KeyBytes TGenericRegistryKey::GetBytes() const {
  const record::Content* const content = imp_ ? imp_->tree->ContentAsLoaded(*imp_) : nullptr;
  if (!content || !imp_->tree->IsWhole(*content, *imp_)) return {};
  return {content->shape().data(), content->data().data()};
}

std::vector<COrxStringT<wchar_t>> TGenericRegistryKey::GetValueNames() const {
  std::vector<COrxStringT<wchar_t>> names;
  if (!imp_) return names;
  for (const record::ValueRecord value : imp_->tree->Values(*imp_))
    names.push_back(ToWide(NameOf(value)));
  return names;
}

TGenRegKeyIterator::TGenRegKeyIterator(const TGenericRegistryKey& key) : parent_(key.imp_) {}

TGenRegKeyIterator::operator bool() const {
  return parent_ && next_ < parent_->tree->Keys(*parent_).size();
}

TGenericRegistryKeyImpPtr TGenRegKeyIterator::operator++(int) {
  return *this ? Share(parent_, parent_->tree->Keys(*parent_)[next_++]) : nullptr;
}

template <>
COrxStringT<wchar_t> GetRegValue(const TGenericRegistryKey& key, std::wstring_view name,
                                 const COrxStringT<wchar_t>& fallback, int index) {
  const record::ValueRecord found = index == 0 ? Find(key.imp_, name) : record::ValueRecord();
  if (!found) return fallback;
  const record::Value stored = found.value();
  if (stored.type != kWideString || stored.elementSize != 0) return fallback;
  std::size_t bytes = 0;
  while (record::Load<char16_t>(stored.data + bytes) != u'\0') bytes += sizeof(char16_t);
  return ToWide({stored.data, bytes});
}

}  // namespace orx
