#include "store/stored_entries.h"

#include <algorithm>

#include "orxregistry/in_file_key.h"
#include "orxutils/file_funcs.h"
#include "store/gff_layout.h"
#include "store/registry_tree.h"
#include "store/residual_grid.h"
#include "velta/message_units.h"

namespace orx::cs::velta {
namespace {

/// Parameters without and with the rotation point.
constexpr std::size_t kHelmertParameters = 7;
constexpr std::size_t kBadekasParameters = 10;

bool ReadEllipsoid(const StoredKey& standard, const DoublesOf<2>& value,
                   projmath::Ellipsoid& ellipsoid) {
  double axes[2];
  if (!Read(standard, value, axes)) return false;
  ellipsoid = projmath::Ellipsoid::FromAxes(axes[0], axes[1]);
  return true;
}

}  // namespace

TGenericRegistryKey OpenContainer(const COrxStringT<wchar_t>& fileName) {
  if (!FileFuncs::isFileExists(fileName)) return TGenericRegistryKey(nullptr);
  return ContainerOf(TInFileKey(fileName, nullptr, nullptr, true, kRegistryFlags));
}

bool ReadValidityArea(const StoredKey& standard, projmath::TRectRgn& area) {
  double edges[4];
  if (!Read(standard, layout::kValidityArea, edges)) return false;
  area = {edges[0], edges[1] == 0.0 ? kWholeLatitude : edges[1], edges[2],
          edges[3] == 0.0 ? kWholeLongitude : edges[3]};
  return true;
}

bool ReadTransformation(const StoredKey& container, const StoredKey& standard, DatumData& datum) {
  if (!ReadEllipsoid(standard, layout::kEllipsoid, datum.targetEllipsoid)) return false;
  if (!ReadEllipsoid(standard, layout::kSourceEllipsoid, datum.sourceEllipsoid)) return false;
  double parameters[13];
  if (!Read(standard, layout::kDatumParameters, parameters)) return false;
  BinaryType<unsigned int> method = {};
  if (!ReadAny(standard, layout::kMethod, method)) return false;
  datum.computationIndicator = method.value;
  const bool hasRotationPoint = datum.computationIndicator == kMolodenskiBadekas;
  std::copy_n(parameters, hasRotationPoint ? kBadekasParameters : kHelmertParameters,
              datum.parameters);
  signed char height = 0;
  const StoredValue storedHeight = standard.Find(layout::kHeightIndicator.name);
  if (storedHeight.descriptor.dimension != kValueDimension) return false;
  if (!Read(storedHeight, height)) return false;
  datum.heightIndicator = static_cast<std::uint32_t>(height);
  return Read(standard, layout::kSourceDatumName, datum.sourceDatumName) &&
         Read(container, layout::kContainerDatum, datum.targetDatumName);
}

bool ReadDatum(const StoredKey& container, const StoredKey& entry, DatumData& datum) {
  const StoredKey standard = entry.Sub(layout::kStandardDatum);
  projmath::TRectRgn area;
  if (!ReadValidityArea(standard, area)) return false;
  if (!ReadTransformation(container, standard, datum)) return false;
  const StoredKey gridKey = entry.Sub(layout::kDatumGrid.key);
  StoredGrid grid;
  if (!ReadGridArea(gridKey, layout::kDatumGrid, grid)) return false;
  if (!ReadGridValues(gridKey, grid)) return false;
  datum.validityArea[0] = area.south;
  datum.validityArea[1] = area.northExtent;
  datum.validityArea[2] = area.west;
  datum.validityArea[3] = area.eastExtent;
  datum.validityCentre[0] = area.south + area.northExtent * 0.5;
  datum.validityCentre[1] = area.west + area.eastExtent * 0.5;
  datum.grid = grid.table;
  return true;
}

}  // namespace orx::cs::velta
