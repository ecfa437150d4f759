#pragma once

#include "orxregistry/registry_key.h"
#include "projmath/rect_rgn.h"
#include "store/gff_layout.h"
#include "velta/result_codes.h"
#include "velta/table_data.h"

namespace orx::cs::velta {

/// Writes a grid into the sub-key that the layout names. The boundaries are those of a 4 by 4 grid
/// around the table's centre.
/// \return 0, or kEntryNotWritten when a shift flag or an interpolation code was not taken; what
///     comes after it is then missing
ResultCode WriteResidualGrid(const TGenericRegistryKey& entry, const layout::ResidualGrid& grid,
                             const TableData& table);

/// A grid as it is stored.
struct StoredGrid {
  int rows = 0;
  int columns = 0;
  /// The centre and `hasTable` are not stored. Of `bounds` the steps are those that follow from the
  /// extents; they are not finite when there is but one row or column.
  TableData table;
};

/// The area that a grid covers, by its `bounds`.
inline projmath::TRectRgn AreaOf(const StoredGrid& stored) {
  const double(&bounds)[6] = stored.table.bounds;
  return {bounds[0], bounds[1], bounds[2], bounds[3]};
}

/// Reads what a search needs: the counts and `bounds`.
/// \return false when one of them is missing
bool ReadGridArea(const StoredKey& gridKey, const layout::ResidualGrid& grid, StoredGrid& stored);

/// Reads the rest.
/// \return false when a value is missing, has another size or kind, or when there are fewer than 1
///     or more than 16 points
bool ReadGridValues(const StoredKey& gridKey, StoredGrid& stored);

}  // namespace orx::cs::velta
