#pragma once

#include <functional>
#include <memory>

#include "orxregistry/entry_areas.h"
#include "orxregistry/export.h"
#include "orxregistry/registry_key.h"
#include "orxutils/orx_string.h"

namespace orx {

/// A rectangle around areas, as EntryArea describes them. Its edges are infinite where an area is
/// not known.
struct AreaBounds {
  double low[2];   ///< along the first axis and the second
  double high[2];  ///< the same
};

/// Walks those entries of a file that may have an area of interest, in their order, by the index
/// that the file carries: only what may be of interest is read. Where the file has no index for
/// these areas, or it is not right, the walk is that over all entries, which is always a right
/// answer: every entry whose area is not known is among those that are given.
class ORXREGISTRY_EXPORT TAreaWalk {
 public:
  /// \param bounds of one entry's area, or around the areas of several
  /// \return false when none of them can be of interest
  using MayHold = std::function<bool(const AreaBounds& bounds)>;

  /// \param fileName the file; one that cannot be read has no entries
  /// \param areas those that its entries should have
  /// \param area which of them `mayHold` is asked about, below their number
  /// \param mayHold asked about each item of the index that is come upon
  TAreaWalk(const COrxStringT<wchar_t>& fileName, const EntryAreas& areas, std::size_t area,
            MayHold mayHold);
  TAreaWalk(const TAreaWalk&) = delete;
  TAreaWalk& operator=(const TAreaWalk&) = delete;
  ~TAreaWalk();

  /// The key that the entries are sub-keys of, with its values; not all of its sub-keys are there.
  /// \return null when there is none
  TGenericRegistryKey Container() const;

  /// Where the index turns out not to be right the walk begins again, with all entries.
  /// \return the next entry, null when none is left
  TGenericRegistryKey Next();

 private:
  class Walk;
  std::unique_ptr<Walk> walk_;
};

}  // namespace orx
