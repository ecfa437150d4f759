#pragma once

#include <cstddef>

#include "orxregistry/area_walk.h"
#include "orxregistry/registry_key.h"
#include "orxutils/orx_string.h"
#include "projmath/rect_rgn.h"

/// Finding the entry for a position.
namespace orx::cs::velta {

/// The areas that the entries of a datum file have: that of validity and that of the grid.
const EntryAreas& DatumAreas();
/// The area that the entries of a projection file have: that of the grid.
const EntryAreas& ProjectionAreas();

/// An area that positions are looked for in.
struct SearchedArea {
  const EntryAreas& (*ofFile)();  ///< the areas that entries of its files have
  std::size_t place;              ///< which of them it is
  bool isPlane;                   ///< as TRectRgn::Inside() takes it
};
inline constexpr SearchedArea kSearchedValidity{&DatumAreas, 0, false};
inline constexpr SearchedArea kSearchedDatumGrid{&DatumAreas, 1, false};
inline constexpr SearchedArea kSearchedProjectionGrid{&ProjectionAreas, 0, true};

/// The entries of a file whose area may hold a position, and those whose area is not known.
/// \param north latitude, radians, or northing, metres
/// \param east longitude or easting
TAreaWalk EntriesAround(const COrxStringT<wchar_t>& fileName, const SearchedArea& area,
                        double north, double east);

/// All entries of a file.
TAreaWalk AllEntries(const COrxStringT<wchar_t>& fileName, const SearchedArea& area);

/// The first entry whose area holds a position. An entry in front of it whose area cannot be
/// read ends the search.
/// \param walk as EntriesAround() gives it
/// \param plane as TRectRgn::Inside() takes it, and so `north` and `east`
/// \param areaOf reads the area of an entry: (entry, area) to true when it can be read
/// \return null when there is none
template <class AreaOf>
TGenericRegistryKey FirstHolding(TAreaWalk& walk, double north, double east, bool plane,
                                 const AreaOf& areaOf) {
  for (TGenericRegistryKey entry = walk.Next(); !entry.IsNull(); entry = walk.Next()) {
    projmath::TRectRgn area;
    if (!areaOf(entry, area)) break;
    if (area.Inside(north, east, plane)) return entry;
  }
  return TGenericRegistryKey(nullptr);
}

}  // namespace orx::cs::velta
