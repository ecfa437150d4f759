#pragma once

#include <array>
#include <cstddef>
#include <optional>
#include <vector>

#include "orxregistry/entry_areas.h"
#include "record_format.h"

namespace orx {

/// A rectangle that holds an area, or several: its edges are rounded outward.
struct Bounds {
  float low[2];   ///< along the first axis and the second
  float high[2];  ///< the same

  void Include(const Bounds& other);
};

/// The bounds of each kind of area that entries have.
using EntryBounds = std::array<Bounds, kMaxEntryAreas>;

/// Bounds of an area that is not known: everything.
extern const Bounds kEverything;

/// Where the entries of one shape have their areas.
class AreaPlaces {
 public:
  /// \param content of an entry of that shape
  AreaPlaces(const EntryAreas& areas, const record::Content& content);

  /// False when such entries have none of the areas, or that one was damaged.
  bool HasAny() const;

  /// \param data of an entry of that shape
  EntryBounds BoundsIn(record::Bytes data) const;

 private:
  struct Place {
    std::size_t place;
    bool isZeroUnknown;
  };
  struct Text {
    std::size_t place;
    std::size_t bytes;
  };

  void FindPlace(const EntryArea& area, std::size_t number, const record::Content& content);

  /// By the areas' order; nothing for an area that such entries do not have, or not just once.
  std::array<std::optional<Place>, kMaxEntryAreas> places_;
  std::vector<Text> texts_;  ///< beside the areas; where one is damaged they may not be found
};

}  // namespace orx
