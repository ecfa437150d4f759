// From a stored residual grid to the record of its 1023 or 1024.

#include "conversion/grid_conversion.h"
#include "generate/make_record.h"
#include "projmath/rect_rgn.h"
#include "store/area_search.h"
#include "store/residual_grid.h"
#include "velta/rtcm_generator.h"

namespace orx::cs::velta {
namespace {

/// What differs between the two grids.
struct GridKind {
  const layout::ResidualGrid& layout;
  const SearchedArea& area;
};
constexpr GridKind kEllipsoidal{layout::kDatumGrid, kSearchedDatumGrid};
constexpr GridKind kPlane{layout::kProjectionGrid, kSearchedProjectionGrid};

/// The record of the first entry whose grid holds the position.
template <class Message>
boost::shared_ptr<Message> FindGrid(const COrxStringT<wchar_t>& fileName, const GridKind& kind,
                                    double north, double east, std::int32_t systemId) {
  TAreaWalk walk = EntriesAround(fileName, kind.area, north, east);
  ShapeMemory memory;
  const StoredKey gridKey(memory, kind.layout.key);  // of the entry that is looked at
  StoredGrid grid;
  const auto areaOf = [&](const TGenericRegistryKey& entry, projmath::TRectRgn& area) {
    memory.GoTo(entry);
    if (!ReadGridArea(gridKey, kind.layout, grid)) return false;
    area = AreaOf(grid);
    return true;
  };
  if (FirstHolding(walk, north, east, kind.area.isPlane, areaOf).IsNull()) return nullptr;
  // A single row or column has no step.
  if (grid.rows == 1 || grid.columns == 1 || !ReadGridValues(gridKey, grid)) return nullptr;
  Message message;
  message.systemId = static_cast<std::uint32_t>(systemId);
  ConvertGrid(grid.table, message);
  return MakeRecord(message);
}

}  // namespace

boost::shared_ptr<Rtcm1023> RTCMGenerator::get1023(double latitude, double longitude,
                                                   double /*height*/) const {
  return FindGrid<Rtcm1023>(datumFile_, kEllipsoidal, latitude, longitude, systemId_);
}

boost::shared_ptr<Rtcm1024> RTCMGenerator::get1024(double northing, double easting,
                                                   double /*height*/) const {
  return FindGrid<Rtcm1024>(projFile_, kPlane, northing, easting, systemId_);
}

}  // namespace orx::cs::velta
