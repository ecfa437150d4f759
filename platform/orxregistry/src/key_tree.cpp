#include "key_tree.h"

#include <algorithm>
#include <cstring>
#include <limits>

namespace orx {
namespace {

using record::ValueRecord;

constexpr std::size_t kMaxNameBytes = std::numeric_limits<std::uint16_t>::max() * sizeof(char16_t);

bool IsSame(const record::Value& a, const record::Value& b) {
  return a.type == b.type && a.elementSize == b.elementSize && a.dimension == b.dimension &&
         a.dataSize == b.dataSize && std::memcmp(a.data, b.data, a.dataSize) == 0;
}

}  // namespace

record::Name NameOf(const TGenericRegistryKeyImp* key) { return key->name(); }

bool VisitedValues::Visit(const TGenericRegistryKeyImp& key, record::KeyRecord record) {
  key_ = nullptr;
  count_ = 0;
  last_ = 0;
  record::Bytes bytes = record.values();
  while (!bytes.empty()) {
    const ValueRecord value = record::TakeValue(bytes);
    if (!value || count_ == kMost) return false;
    const auto place = std::find_if(
        values_, values_ + count_, [&](ValueRecord other) { return other.name() == value.name(); });
    *place = value;  // of several of one name the last counts
    if (place == values_ + count_) ++count_;
  }
  key_ = &key;
  return true;
}

ValueRecord VisitedValues::Find(LookupName& name) {
  for (std::size_t i = 0; i < count_; ++i) {
    if (name == values_[last_].name()) return values_[last_];
    last_ = last_ + 1 == count_ ? 0 : last_ + 1;
  }
  return {};
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
    const record::KeyRecord root = record::TakeKey(segment);
    if (!root || !segment.empty()) {
      error = kDamaged;
      return;
    }
    AddLayer(*root_, root);
  }
}

/// For a record, in the tree's memory.
unsigned char* KeyTree::Room(std::size_t bytes) {
  return static_cast<unsigned char*>(memory_.allocate(bytes, 1));
}

record::KeyRecord KeyTree::MakeRecord(const record::Name& name, std::uint8_t dimension) {
  return record::WriteEmptyKey(Room(record::EmptyKeySize(name)), dimension, name);
}

void KeyTree::AddLayer(Key& key, record::KeyRecord record) {
  auto* const layer = Make<Key::Layer>(Key::Layer{record, nullptr});
  (key.last_ ? key.last_ : &key.first_)->next = layer;
  key.last_ = layer;
}

// An exception may interrupt the taking apart. To do it again adds nothing twice, so a list is
// marked whole only at the end.

NamedList<ValueRecord>& KeyTree::TakeValues(Key& key) {
  if (!key.values_) key.values_ = Make<NamedList<ValueRecord>>(&memory_);
  if (key.valuesAreWhole_) return *key.values_;
  for (const Key::Layer* layer = &key.first_; layer; layer = layer->next) {
    record::Bytes bytes = layer->record.values();
    while (!bytes.empty()) {
      const ValueRecord value = record::TakeValue(bytes);
      if (!value) {
        error = kDamaged;
        break;
      }
      key.values_->Put(value.name(), value);
    }
  }
  key.valuesAreWhole_ = true;
  return *key.values_;
}

NamedList<KeyTree::Key*>& KeyTree::TakeKeys(Key& key) {
  if (!key.keys_) key.keys_ = Make<NamedList<Key*>>(&memory_);
  if (key.keysAreWhole_) return *key.keys_;
  for (const Key::Layer* layer = &key.first_; layer; layer = layer->next) {
    record::Bytes bytes = layer->record.keys();
    while (!bytes.empty()) {
      const record::KeyRecord found = record::TakeKey(bytes);
      if (!found || key.depth_ == record::kMaxDepth) {
        error = kDamaged;
        break;
      }
      const record::Name name = found.name();
      const std::size_t place = key.keys_->Find(name);
      if (place < key.keys_->items().size()) {
        AddLayer(*key.keys_->items()[place], found);
      } else {
        key.keys_->Append(Make<Key>(*this, &key, found));
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
  return place == values.items().size() ? ValueRecord() : values.items()[place];
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
  const ValueRecord replaced = replaces ? values.items()[place] : ValueRecord();
  if (replaces && IsSame(replaced.value(), value)) return true;

  PendingChanges::OfKey& pending = MarkUnsaved(key);
  const std::size_t size = record::ValueRecordSize(value);
  const ValueRecord made = record::WriteValue(Room(size), value);
  if (replaces) {
    if (pending.Add(place)) pending_.CountSuperseded(replaced.bytes().size());
    values.Replace(place, made);
  } else {
    pending.Reserve(place);
    values.Append(made);
    pending.Add(place);
  }
  pending_.CountBytes(size);
  return true;
}

void KeyTree::DeepCopy(Key& to, Key& from) {
  if (&to == &from) return;
  KeyTree& source = *from.tree;
  if (&source != this && source.isAsLoaded_ && from.HasOneLayer() && to.IsBlank()) {
    // As a whole, and where it lies: this is how entries are copied when files are merged.
    const record::KeyRecord record = from.first_.record;
    if (record::IsWhole(record.bytes(), record::kMaxDepth - to.depth_)) {
      lenders_.insert(source.shared_from_this());
      PendingChanges::OfKey& pending = MarkUnsaved(to);
      AddLayer(to, record);
      pending.copied = record;
      pending_.CountBytes(record.bytes().size());
      return;
    }
  }
  for (const ValueRecord value : source.Values(from)) SetValue(to, value.value());
  // By their places, as a target inside the source adds keys to it meanwhile.
  for (std::size_t i = 0; i < source.Keys(from).size(); ++i) {
    Key* const key = source.Keys(from)[i];
    if (Key* const copy = OpenKey(to, key->name(), key->dimension())) DeepCopy(*copy, *key);
  }
}

PendingChanges::OfKey& KeyTree::MarkUnsaved(const Key& key) {
  isAsLoaded_ = false;
  return pending_.Of(key);
}

void KeyTree::WriteUnsaved(record::Buffer& to) {
  to.reserve(to.size() + pending_.bytes());
  WriteUnsaved(to, *root_);
}

void KeyTree::WriteUnsaved(record::Buffer& to, const Key& key) {
  record::KeyWriter writer(to, key.dimension(), key.name());
  const PendingChanges::OfKey& pending = pending_.At(key);
  if (pending.copied) record::AppendBytes(to, pending.copied.values());
  for (const std::size_t place : pending.values) {
    record::AppendBytes(to, key.values_->items()[place].bytes());
  }
  writer.EndValues();
  if (pending.copied) record::AppendBytes(to, pending.copied.keys());
  for (const Key* const sub : pending.keys) WriteUnsaved(to, *sub);
  writer.Close();
}

void KeyTree::WriteAll(record::Buffer& to, Key& key) {
  record::KeyWriter writer(to, key.dimension(), key.name());
  for (const ValueRecord value : Values(key)) record::AppendBytes(to, value.bytes());
  writer.EndValues();
  for (Key* const sub : Keys(key)) WriteAll(to, *sub);
  writer.Close();
}

}  // namespace orx
