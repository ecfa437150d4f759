#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace orx {

/// Where an entry says which area it is for: a value of doubles in one of its sub-keys. The first
/// four are an edge and the extent from it along the first axis, then along the second.
struct EntryArea {
  std::u16string key;                  ///< the sub-key
  std::u16string value;                ///< the value in it
  std::uint32_t bytes = 0;             ///< the value's size, at least four doubles
  std::vector<std::u16string> needed;  ///< values without which the sub-key says nothing
  bool isZeroUnknown = false;          ///< an extent of 0 stands for something else

  /// True when all of both is the same.
  friend bool operator==(const EntryArea& a, const EntryArea& b) {
    return a.key == b.key && a.value == b.value && a.bytes == b.bytes &&
           a.isZeroUnknown == b.isZeroUnknown && a.needed == b.needed;
  }
};

/// The areas that the entries of a file's container key have, by which they can be found without
/// reading the others: at most kMaxEntryAreas. A file keeps them in its header.
using EntryAreas = std::vector<EntryArea>;

/// So many areas a file's entries can have.
inline constexpr std::size_t kMaxEntryAreas = 2;

}  // namespace orx
