#include "key_tree.h"

#include <algorithm>
#include <cstring>
#include <limits>

namespace orx {
namespace {

constexpr std::size_t kMaxNameBytes = std::numeric_limits<std::uint16_t>::max() * sizeof(char16_t);

bool IsSame(const record::Value& a, const record::Value& b) {
  return a.type == b.type && a.elementSize == b.elementSize && a.dimension == b.dimension &&
         a.dataSize == b.dataSize && std::memcmp(a.data, b.data, a.dataSize) == 0;
}

void AppendRecord(record::Buffer& to, ValueRecord value) {
  record::AppendBytes(to, {value, record::ValueRecordSize(record::ValueAt(value))});
}

}  // namespace

record::Name NameOf(const TGenericRegistryKeyImp* key) { return key->name(); }

bool VisitedValues::Visit(const TGenericRegistryKeyImp& key, const unsigned char* record) {
  key_ = nullptr;
  count_ = 0;
  last_ = 0;
  record::Bytes bytes = record::KeyAt(record).values;
  while (!bytes.empty()) {
    const ValueRecord start = bytes.data();
    const std::optional<record::Value> value = record::TakeValue(bytes);
    if (!value || count_ == kMost) return false;
    const auto place = std::find_if(
        values_, values_ + count_, [&](ValueRecord other) { return NameOf(other) == value->name; });
    *place = start;  // of several of one name the last counts
    if (place == values_ + count_) ++count_;
  }
  key_ = &key;
  return true;
}

ValueRecord VisitedValues::Find(LookupName& name) {
  for (std::size_t i = 0; i < count_; ++i) {
    if (name == NameOf(values_[last_])) return values_[last_];
    last_ = last_ + 1 == count_ ? 0 : last_ + 1;
  }
  return nullptr;
}

KeyTree::KeyTree(std::u16string text)
    : description(std::move(text)),
      root_(Make<Key>(*this, nullptr, MakeRecord(record::Name(), 0))) {}

KeyTree::KeyTree(FileContent content)
    : error(content.error),
      description(std::move(content.description)),
      position{content.stamp, content.end, content.superseded, false},
      file_(std::move(content.memory)),
      root_(Make<Key>(*this, nullptr, MakeRecord(record::Name(), 0))) {
  for (record::Bytes segment : content.segments) {
    const unsigned char* const start = segment.data();
    if (!record::TakeKey(segment) || !segment.empty()) {
      error = kDamaged;
      return;
    }
    AddLayer(*root_, start);
  }
}

/// A copy in the tree's memory.
const unsigned char* KeyTree::Keep(record::Bytes bytes) {
  auto* const kept = static_cast<unsigned char*>(memory_.allocate(bytes.size(), 1));
  std::copy(bytes.begin(), bytes.end(), kept);
  return kept;
}

const unsigned char* KeyTree::MakeRecord(const record::Name& name, std::uint8_t dimension) {
  record::Buffer bytes;
  record::KeyWriter(bytes, dimension, name).Close();
  return Keep({bytes.data(), bytes.size()});
}

void KeyTree::AddLayer(Key& key, const unsigned char* record) {
  auto* const layer = Make<Key::Layer>(Key::Layer{record, nullptr});
  (key.last_ ? key.last_ : &key.first_)->next = layer;
  key.last_ = layer;
}

// Taking a layer apart twice is the same as once, so a list counts as whole only when all of it is
// done, whatever interrupts that.

NamedList<ValueRecord>& KeyTree::TakeValues(Key& key) {
  if (!key.values_) key.values_ = Make<NamedList<ValueRecord>>(&memory_);
  if (key.valuesAreWhole_) return *key.values_;
  for (const Key::Layer* layer = &key.first_; layer; layer = layer->next) {
    record::Bytes bytes = record::KeyAt(layer->record).values;
    while (!bytes.empty()) {
      const ValueRecord start = bytes.data();
      const std::optional<record::Value> value = record::TakeValue(bytes);
      if (!value) {
        error = kDamaged;
        break;
      }
      key.values_->Put(value->name, start);
    }
  }
  key.valuesAreWhole_ = true;
  return *key.values_;
}

NamedList<KeyTree::Key*>& KeyTree::TakeKeys(Key& key) {
  if (!key.keys_) key.keys_ = Make<NamedList<Key*>>(&memory_);
  if (key.keysAreWhole_) return *key.keys_;
  for (const Key::Layer* layer = &key.first_; layer; layer = layer->next) {
    record::Bytes bytes = record::KeyAt(layer->record).keys;
    while (!bytes.empty()) {
      const unsigned char* const start = bytes.data();
      const std::optional<record::Key> found = record::TakeKey(bytes);
      if (!found || key.depth_ == record::kMaxDepth) {
        error = kDamaged;
        break;
      }
      const std::size_t place = key.keys_->Find(found->name);
      if (place < key.keys_->items().size()) {
        AddLayer(*key.keys_->items()[place], start);
      } else {
        key.keys_->Append(Make<Key>(*this, &key, start));
      }
    }
  }
  key.keysAreWhole_ = true;
  return *key.keys_;
}

ValueRecord KeyTree::FindValue(Key& key, LookupName& name) {
  const bool readWhereTheyLie = !key.values_ && key.HasOneLayer() &&
                                (visited_.IsAt(key) || visited_.Visit(key, key.first_.record));
  if (readWhereTheyLie) return visited_.Find(name);
  const auto& values = TakeValues(key);
  const std::size_t place = values.Find(name);
  return place == values.items().size() ? nullptr : values.items()[place];
}

KeyTree::Key* KeyTree::OpenKey(Key& key, const record::Name& name, std::uint8_t dimension) {
  if (Key* const found = FindKey(key, name)) return found;
  if (key.depth_ == record::kMaxDepth || name.bytes > kMaxNameBytes) return nullptr;
  auto* const made = Make<Key>(*this, &key, MakeRecord(name, dimension));
  MarkUnsaved(*made);
  TakeKeys(key).Append(made);
  return made;
}

bool KeyTree::SetValue(Key& key, const record::Value& value) {
  if (!record::IsConsistent(value)) return false;
  NamedList<ValueRecord>& values = TakeValues(key);
  const std::size_t place = values.Find(value.name);
  const bool replaces = place < values.items().size();
  const ValueRecord replaced = replaces ? values.items()[place] : nullptr;
  if (replaces && IsSame(record::ValueAt(replaced), value)) return true;

  Unsaved& unsaved = MarkUnsaved(key);
  record::Buffer bytes;
  record::AppendValue(bytes, value);
  const ValueRecord made = Keep({bytes.data(), bytes.size()});
  unsavedBytes_ += bytes.size();
  if (!replaces) {
    unsaved.values.push_back(made);
    values.Append(made);
    return true;
  }
  const auto pending = std::find(unsaved.values.begin(), unsaved.values.end(), replaced);
  if (pending != unsaved.values.end()) {
    *pending = made;
  } else {
    unsaved.values.push_back(made);
    superseded_ += record::ValueRecordSize(record::ValueAt(replaced));
  }
  values.Replace(place, made);
  return true;
}

void KeyTree::DeepCopy(Key& to, Key& from) {
  if (&to == &from) return;
  KeyTree& source = *from.tree;
  if (&source != this && source.isAsLoaded_ && from.HasOneLayer() && to.IsBlank()) {
    // As a whole, and where it lies: this is how entries are copied when files are merged.
    const unsigned char* const record = from.first_.record;
    const std::size_t size = record::KeyRecordSize(record);
    if (record::IsWhole({record, size}, record::kMaxDepth - to.depth_)) {
      lenders_.insert(source.shared_from_this());
      Unsaved& unsaved = MarkUnsaved(to);
      AddLayer(to, record);
      unsaved.copied = record;
      unsavedBytes_ += size;
      return;
    }
  }
  for (const ValueRecord value : source.Values(from)) SetValue(to, record::ValueAt(value));
  // By their places, as a target inside the source adds keys to it meanwhile.
  for (std::size_t i = 0; i < source.Keys(from).size(); ++i) {
    Key* const key = source.Keys(from)[i];
    if (Key* const copy = OpenKey(to, key->name(), key->dimension())) DeepCopy(*copy, *key);
  }
}

KeyTree::Unsaved& KeyTree::MarkUnsaved(Key& key) {
  changed_ = true;
  isAsLoaded_ = false;
  const auto [entry, isNew] = unsaved_.try_emplace(&key);
  Unsaved& unsaved = entry->second;
  if (isNew && key.parent) {
    try {
      MarkUnsaved(*key.parent).keys.push_back(&key);
    } catch (...) {
      unsaved_.erase(&key);  // nobody would come to it
      throw;
    }
  }
  return unsaved;
}

void KeyTree::WriteUnsaved(record::Buffer& to) {
  to.reserve(to.size() + unsavedBytes_);
  WriteUnsaved(to, *root_);
}

void KeyTree::WriteUnsaved(record::Buffer& to, const Key& key) {
  record::KeyWriter writer(to, key.dimension(), key.name());
  const Unsaved& unsaved = unsaved_[&key];
  const record::Key copied = unsaved.copied ? record::KeyAt(unsaved.copied) : record::Key();
  record::AppendBytes(to, copied.values);
  for (const ValueRecord value : unsaved.values) AppendRecord(to, value);
  writer.EndValues();
  record::AppendBytes(to, copied.keys);
  for (const Key* const sub : unsaved.keys) WriteUnsaved(to, *sub);
  writer.Close();
}

void KeyTree::WriteAll(record::Buffer& to, Key& key) {
  record::KeyWriter writer(to, key.dimension(), key.name());
  for (const ValueRecord value : Values(key)) AppendRecord(to, value);
  writer.EndValues();
  for (Key* const sub : Keys(key)) WriteAll(to, *sub);
  writer.Close();
}

void KeyTree::MarkSaved() {
  changed_ = false;
  superseded_ = 0;
  unsavedBytes_ = 0;
  unsaved_.clear();
}

}  // namespace orx
