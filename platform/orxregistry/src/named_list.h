#pragma once

#include <algorithm>
#include <cstddef>
#include <functional>
#include <memory_resource>
#include <string>
#include <string_view>
#include <unordered_set>
#include <vector>

#include "orxutils/orx_string.h"
#include "record_format.h"

namespace orx {

class TGenericRegistryKeyImp;

/// A name that is looked up. It is compared where it lies; only what needs its UTF-16 form makes
/// it.
class LookupName {
 public:
  /// The text must outlive the object.
  explicit LookupName(std::wstring_view name) : name_(name) {
    char32_t bits = 0;  // of all characters: no branch in the loop
    for (const wchar_t c : name) bits |= static_cast<char32_t>(c);
    isOneUnitEach_ = bits < kFirstSurrogate;
  }

  bool operator==(const record::Name& stored) {
    if (!isOneUnitEach_) return Units() == stored;
    if (stored.bytes != name_.size() * sizeof(char16_t)) return false;
    char32_t difference = 0;
    for (std::size_t i = 0; i < name_.size(); ++i) {
      const auto unit = record::Load<char16_t>(stored.units + i * sizeof(char16_t));
      difference |= static_cast<char32_t>(name_[i]) ^ unit;
    }
    return difference == 0;
  }

  /// The UTF-16 form, which lives as long as this.
  record::Name Units() {
    if (units_.empty()) units_ = ToUtf16(name_);
    return {reinterpret_cast<const unsigned char*>(units_.data()),
            units_.size() * sizeof(char16_t)};
  }

 private:
  static constexpr char32_t kFirstSurrogate = 0xD800;

  std::wstring_view name_;
  bool isOneUnitEach_;
  std::u16string units_;
};

inline record::Name UnitsOf(const record::Name& name) { return name; }
inline record::Name UnitsOf(LookupName& name) { return name.Units(); }

inline record::Name NameOf(record::ValueRecord value) { return value.name(); }
record::Name NameOf(const TGenericRegistryKeyImp* key);

/// Things with names, in the order in which they were added. Finding one does not get slower with
/// their number.
template <class Item>
class NamedList {
 public:
  explicit NamedList(std::pmr::memory_resource* memory) : items_(memory) {}

  const std::pmr::vector<Item>& items() const { return items_; }

  /// \param name a record::Name or a LookupName
  /// \return the place of the item of that name in `items()`, or their number
  template <class AnyName>
  std::size_t Find(AnyName& name) const {
    if (index_) {
      const auto found = index_->find(UnitsOf(name));
      return found == index_->end() ? items_.size() : *found;
    }
    std::size_t place = 0;
    while (place < items_.size() && !(name == NameOf(items_[place]))) ++place;
    return place;
  }

  /// Makes room for so many items.
  void Reserve(std::size_t items) {
    items_.reserve(items);
    if (items > kLinear && !index_) MakeIndex();
    if (index_) index_->reserve(items);
  }

  void Append(Item item) {
    items_.push_back(item);
    try {
      if (index_) {
        index_->insert(items_.size() - 1);
      } else if (items_.size() > kLinear) {
        MakeIndex();
      }
    } catch (...) {
      items_.pop_back();
      throw;
    }
  }

  /// Puts another item of the same name in the place of one.
  void Replace(std::size_t place, Item item) { items_[place] = item; }

  /// Puts an item in the place of the one of its name, or behind the others.
  void Put(const record::Name& name, Item item) {
    const std::size_t place = Find(name);
    if (place < items_.size()) {
      Replace(place, item);
    } else {
      Append(item);
    }
  }

 private:
  /// Up to this many items a look at each is faster than an index.
  static constexpr std::size_t kLinear = 12;

  struct Hash {
    using is_transparent = void;
    const NamedList* list;
    std::size_t operator()(const record::Name& name) const { return record::HashOf(name); }
    std::size_t operator()(std::size_t place) const { return (*this)(NameOf(list->items_[place])); }
  };
  struct Equal {
    using is_transparent = void;
    const NamedList* list;
    record::Name Get(const record::Name& name) const { return name; }
    record::Name Get(std::size_t place) const { return NameOf(list->items_[place]); }
    template <class A, class B>
    bool operator()(const A& a, const B& b) const {
      return Get(a) == Get(b);
    }
  };
  using Index = std::pmr::unordered_set<std::size_t, Hash, Equal>;

  void MakeIndex() {
    std::pmr::polymorphic_allocator<> memory(items_.get_allocator().resource());
    auto* const index = memory.new_object<Index>(4 * kLinear, Hash{this}, Equal{this});
    for (std::size_t place = 0; place < items_.size(); ++place) index->insert(place);
    index_ = index;
  }

  std::pmr::vector<Item> items_;
  Index* index_ = nullptr;  ///< in the memory of `items_`
};

}  // namespace orx
