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

/// The UTF-16 form of a name that is looked up; a plain one needs no memory of its own.
class LookupName {
 public:
  explicit LookupName(std::wstring_view name) {
    if (name.size() <= kPlain && std::all_of(name.begin(), name.end(), IsOneUnit)) {
      std::transform(name.begin(), name.end(), plain_,
                     [](wchar_t c) { return static_cast<char16_t>(c); });
      name_ = {reinterpret_cast<const unsigned char*>(plain_), name.size() * sizeof(char16_t)};
    } else {
      other_ = ToUtf16(name);
      name_ = {reinterpret_cast<const unsigned char*>(other_.data()),
               other_.size() * sizeof(char16_t)};
    }
  }
  LookupName(const LookupName&) = delete;
  LookupName& operator=(const LookupName&) = delete;

  const record::Name& Get() const { return name_; }

 private:
  static constexpr std::size_t kPlain = 64;
  static bool IsOneUnit(wchar_t c) { return static_cast<char32_t>(c) < 0xD800; }

  char16_t plain_[kPlain];
  std::u16string other_;
  record::Name name_;
};

/// A value in memory: its record, in the file's bytes or in the tree's memory.
using ValueRecord = const unsigned char*;

inline record::Name NameOf(ValueRecord value) { return record::ValueAt(value).name; }
record::Name NameOf(const TGenericRegistryKeyImp* key);

/// Things with names, in the order in which they were added. Finding one does not get slower with
/// their number.
template <class Item>
class NamedList {
 public:
  explicit NamedList(std::pmr::memory_resource* memory) : items_(memory) {}

  const std::pmr::vector<Item>& items() const { return items_; }

  /// \return the place of the item of that name in `items()`, or their number
  std::size_t Find(const record::Name& name) const {
    if (index_) {
      const auto found = index_->find(name);
      return found == index_->end() ? items_.size() : *found;
    }
    std::size_t place = 0;
    while (place < items_.size() && !(NameOf(items_[place]) == name)) ++place;
    return place;
  }

  void Append(Item item) {
    items_.push_back(item);
    if (index_) {
      index_->insert(items_.size() - 1);
    } else if (items_.size() > kLinear) {
      MakeIndex();
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
    std::size_t operator()(const record::Name& name) const {
      return std::hash<std::string_view>()({reinterpret_cast<const char*>(name.units), name.bytes});
    }
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
