#include "key_tree.h"

#include <algorithm>
#include <cstring>
#include <limits>

namespace orx {
namespace {

using record::Content;
using record::ContentBuffer;
using record::ContentWriter;
using record::KeyRecord;
using record::Part;
using record::ValueRecord;

/// How deep the entries are below the root.
constexpr int kEntryDepth = 2;
constexpr std::size_t kMaxNameBytes = std::numeric_limits<std::uint16_t>::max() * sizeof(char16_t);

bool IsSame(const record::Value& a, const record::Value& b) {
  return a.type == b.type && a.elementSize == b.elementSize && a.dimension == b.dimension &&
         a.dataSize == b.dataSize && std::memcmp(a.data, b.data, a.dataSize) == 0;
}

}  // namespace

record::Name NameOf(const TGenericRegistryKeyImp* key) { return key->name(); }

bool VisitedValues::Visit(const TGenericRegistryKeyImp& key, Part values) {
  key_ = nullptr;
  count_ = 0;
  last_ = 0;
  while (!values.shapes.empty()) {
    const ValueRecord value = record::TakeValue(values);
    if (!value || count_ == kMost) return false;
    auto* const place = std::find_if(
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

KeyTree::KeyTree(const std::u16string& description)
    : root_(Make<Key>(*this, nullptr, MakeRecord(record::Name(), 0))) {
  content_.header.description = description;
}

KeyTree::KeyTree(FileContent content)
    : error(content.error),
      position{content.stamp, content.end, content.superseded, false, {}},
      content_(std::move(content)),
      root_(Make<Key>(*this, nullptr, MakeRecord(record::Name(), 0))) {
  for (const Content& tree : content_.trees) AddLayer(*root_, tree);
}

/// For a record, in the tree's memory.
unsigned char* KeyTree::Room(std::size_t bytes) {
  return static_cast<unsigned char*>(memory_.allocate(bytes, 1));
}

KeyRecord KeyTree::MakeRecord(const record::Name& name, std::uint8_t dimension) {
  return record::MakeKey(record::WriteHead(Room(record::HeadSize(name)), dimension, name), {});
}

KeyTree::Key& KeyTree::MakeLoose(Key& above, KeyRecord record, record::Buffer memory) {
  content_.moreMemory.push_back(std::move(memory));
  return *Make<Key>(*this, &above, record);
}

void KeyTree::AddLayer(Key& key, const Content& content) {
  auto* const layer = Make<Key::Layer>(Key::Layer{content, nullptr});
  (key.last_ ? key.last_ : &key.first_)->next = layer;
  key.last_ = layer;
}

// An exception may interrupt the taking apart. To do it again adds nothing twice, so a list is
// marked whole only at the end.

NamedList<ValueRecord>& KeyTree::TakeValues(Key& key) {
  if (!key.values_) key.values_ = Make<NamedList<ValueRecord>>(&memory_);
  if (key.valuesAreWhole_) return *key.values_;
  for (const Key::Layer* layer = &key.first_; layer; layer = layer->next) {
    Part values = layer->content.values();
    while (!values.shapes.empty()) {
      const ValueRecord value = record::TakeValue(values);
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
    Part keys = layer->content.keys();
    while (!keys.shapes.empty()) {
      const KeyRecord found = record::TakeKey(keys);
      if (!found || key.depth_ == record::kMaxDepth) {
        error = kDamaged;
        break;
      }
      TakeKey(key, found);
    }
  }
  if (key.parent == root_ && &key == Container()) {
    key.keys_->Reserve(content_.entries.size());
    for (const FileContent::Entry& entry : content_.entries) TakeKey(key, entry.key);
  }
  key.keysAreWhole_ = true;
  return *key.keys_;
}

/// Lays a key over the one of its name, or puts it behind the others.
void KeyTree::TakeKey(Key& above, const KeyRecord& found) {
  const record::Name name = found.name();
  const std::size_t place = above.keys_->Find(name);
  if (place < above.keys_->items().size()) {
    AddLayer(*above.keys_->items()[place], found.content());
  } else {
    above.keys_->Append(Make<Key>(*this, &above, found));
  }
}

KeyTree::Key* KeyTree::Container() {
  const auto& keys = Keys(*root_);
  return keys.empty() ? nullptr : keys.front();
}

ValueRecord KeyTree::FindValue(Key& key, LookupName& name) {
  const bool readWhereTheyLie =
      !key.values_ && key.HasOneLayer() &&
      (visited_.IsAt(key) || visited_.Visit(key, key.first_.content.values()));
  if (readWhereTheyLie) return visited_.Find(name);
  const auto& values = TakeValues(key);
  const std::size_t place = values.Find(name);
  return place == values.items().size() ? ValueRecord() : values.items()[place];
}

const Content* KeyTree::ContentAsLoaded(const Key& key) const {
  const bool isAsLoaded = isAsLoaded_ && key.depth_ >= kEntryDepth && key.HasOneLayer();
  return isAsLoaded ? &key.first_.content : nullptr;
}

void KeyTree::LookInto(Key& key) {
  if (const Content* const content = ContentAsLoaded(key)) {
    if (!IsWhole(*content, key)) error = kDamaged;
    return;
  }
  TakeValues(key);
  for (Key* const sub : Keys(key)) LookInto(*sub);
}

KeyTree::Key* KeyTree::OpenKey(Key& key, const record::Name& name, std::uint8_t dimension) {
  if (Key* const found = FindKey(key, name)) return found;
  if (key.depth_ == record::kMaxDepth || name.bytes > kMaxNameBytes) return nullptr;
  auto* const made = Make<Key>(*this, &key, MakeRecord(name, dimension));
  MarkUnsaved(*made).isNew = true;
  try {
    TakeKeys(key).Append(made);
  } catch (...) {
    pending_.Forget(*made);
    throw;
  }
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
  const ValueRecord made = record::WriteValue(Room(record::ValueSize(value)), value);
  if (replaces) {
    if (pending.Add(place)) pending_.CountSuperseded(record::ValueSize(replaced.value()));
    values.Replace(place, made);
  } else {
    pending.Reserve(place);
    values.Append(made);
    pending.Add(place);
  }
  return true;
}

void KeyTree::DeepCopy(Key& to, Key& from) {
  if (&to == &from) return;
  KeyTree& source = *from.tree;
  const Content* const content = source.ContentAsLoaded(from);
  if (content && &source != this && to.depth_ >= kEntryDepth && to.IsBlank() &&
      source.IsWhole(*content, from) && to.depth_ <= from.depth_) {
    // As a whole, and where it lies: this is how entries are copied when files are merged.
    lenders_.insert(source.shared_from_this());
    PendingChanges::OfKey& pending = MarkUnsaved(to);
    AddLayer(to, *content);
    pending.copied = *content;
    return;
  }
  for (const ValueRecord value : source.Values(from)) SetValue(to, value.value());
  // By their places, as a target inside the source adds keys to it meanwhile.
  // NOLINTNEXTLINE(modernize-loop-convert)
  for (std::size_t i = 0; i < source.Keys(from).size(); ++i) {
    Key* const key = source.Keys(from)[i];
    if (Key* const copy = OpenKey(to, key->name(), key->dimension())) DeepCopy(*copy, *key);
  }
}

PendingChanges::OfKey& KeyTree::MarkUnsaved(const Key& key) {
  isAsLoaded_ = false;
  return pending_.Of(key);
}

const KeyTree::Key* KeyTree::FindContainer(const FileContent& file) {
  if (!file.container) return nullptr;
  const record::Name name = file.container.name();
  return FindKey(*root_, name);
}

bool KeyTree::AddsEntriesOnly(const Key& container) const {
  const PendingChanges::OfKey& ofRoot = pending_.At(*root_);
  if (!ofRoot.values.empty() || ofRoot.keys != std::vector<const Key*>{&container}) return false;
  const PendingChanges::OfKey& pending = pending_.At(container);
  return !pending.isNew && pending.values.empty() &&
         std::all_of(pending.keys.begin(), pending.keys.end(),
                     [this](const Key* entry) { return pending_.At(*entry).isNew; });
}

const std::vector<const KeyTree::Key*>& KeyTree::UnsavedIn(const Key& key) const {
  static const std::vector<const Key*> none;
  const PendingChanges::OfKey* const pending = pending_.Find(key);
  return pending ? pending->keys : none;
}

void KeyTree::WriteUnsavedTree(SegmentWriter& to, const Key* container) {
  ContentBuffer tree;
  WriteUnsaved(tree, *root_, container);
  to.AddTree(tree);
}

void KeyTree::WriteUnsavedEntries(SegmentWriter& to, const Key& container) {
  std::size_t copied = 0;
  for (const Key* const entry : UnsavedIn(container)) {
    const auto& content = pending_.At(*entry).copied;
    if (content) copied += format::EntrySize({0, entry->record_.head(), content->data()});
  }
  to.Reserve(copied);
  for (const Key* const entry : UnsavedIn(container)) {
    const PendingChanges::OfKey& pending = pending_.At(*entry);
    if (pending.copied && pending.values.empty() && pending.keys.empty()) {
      to.AddEntry(entry->record_.head(), *pending.copied);
      continue;
    }
    ContentBuffer content;
    WriteUnsaved(content, *entry, nullptr);
    to.AddEntry(entry->record_.head(), record::ContentOf(content));
  }
}

/// Writes what is not saved of a key; of the container, without its entries.
void KeyTree::WriteUnsaved(ContentBuffer& to, const Key& key, const Key* container) {
  ContentWriter writer(to);
  const PendingChanges::OfKey& pending = pending_.At(key);
  if (pending.copied) writer.Append(pending.copied->values());
  for (const std::size_t place : pending.values) writer.Append(key.values_->items()[place]);
  writer.EndValues();
  if (pending.copied) writer.Append(pending.copied->keys());
  if (&key != container) {
    for (const Key* const sub : pending.keys) {
      record::AppendBytes(to.shape, sub->record_.head());
      WriteUnsaved(to, *sub, container);
    }
  }
  writer.Close();
}

void KeyTree::WriteAll(SegmentWriter& to) {
  ContentBuffer tree;
  WriteAll(tree, *root_);
  to.AddTree(tree);
  if (!Container()) return;
  to.Reserve(content_.end);
  for (Key* const entry : Keys(*Container())) {
    const Content* const lying = ContentAsLoaded(*entry);
    if (lying && IsWhole(*lying, *entry)) {
      to.AddEntry(entry->record_.head(), *lying);
      continue;
    }
    ContentBuffer content;
    WriteAll(content, *entry);
    to.AddEntry(entry->record_.head(), record::ContentOf(content));
  }
}

/// Writes all of a key; of the container, without its entries.
void KeyTree::WriteAll(ContentBuffer& to, Key& key) {
  ContentWriter writer(to);
  for (const ValueRecord value : Values(key)) writer.Append(value);
  writer.EndValues();
  if (&key != Container()) {
    for (Key* const sub : Keys(key)) {
      record::AppendBytes(to.shape, sub->record_.head());
      WriteAll(to, *sub);
    }
  }
  writer.Close();
}

}  // namespace orx
