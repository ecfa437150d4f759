// Datum entries and the files they are kept in.

#include "ingest/comparison.h"
#include "ingest/entry_file.h"
#include "store/gff_layout.h"
#include "store/residual_grid.h"
#include "velta/rtcm_data_support.h"

namespace orx::cs::velta {
namespace {

void AddEllipsoid(TGenericRegistryKey& key, const DoublesOf<2>& value,
                  const projmath::Ellipsoid& ellipsoid) {
  const double axes[] = {ellipsoid.a, ellipsoid.second};
  Add(key, value, axes);
}

/// Computed from the centre: where the extent is the whole range, `validityArea` has the centre in
/// the place of the edge.
void AddValidityArea(TGenericRegistryKey& key, const DatumData& datum) {
  const double latitudeExtent = datum.validityArea[1];
  const double longitudeExtent = datum.validityArea[3];
  const double area[] = {datum.validityCentre[0] - latitudeExtent * 0.5, latitudeExtent,
                         datum.validityCentre[1] - longitudeExtent * 0.5, longitudeExtent};
  Add(key, layout::kValidityArea, area);
}

}  // namespace

ResultCode RTCMDataSupport::InitDatumGFF(DatumData& description) {
  const COrxStringT<wchar_t> path = FileOf(kDatumFiles, datumPath, description.targetDatumName);
  const ResultCode result = EnsureFile(datumPath, path, [&](const auto& newFile) {
    return CreateNewDatumGFF(newFile, description);
  });
  return result == kSuccess ? InitWithExistedDatumGFF(path) : result;
}

ResultCode RTCMDataSupport::CreateNewDatumGFF(const COrxStringT<wchar_t>& path,
                                              DatumData& description) {
  const auto fillContainer = [&](TGenericRegistryKey& container) {
    Add(container, layout::kContainerDatum, description.targetDatumName);
    return kSuccess;
  };
  const auto fillEntry = [&](TGenericRegistryKey& entry) {
    return InitDatumRegKey(entry, description);
  };
  return CreateFileWithEntry(kDatumFiles, path, description.targetDatumName, fillContainer,
                             datumEntryName, fillEntry);
}

ResultCode RTCMDataSupport::InitWithExistedDatumGFF(const COrxStringT<wchar_t>& path) {
  return OpenShared(kDatumFiles, path);
}

ResultCode RTCMDataSupport::InitDatumRegKey(TGenericRegistryKey& entry, DatumData& description) {
  Add(entry, layout::kVersion, layout::kEntryVersion);
  TGenericRegistryKey standard(entry, layout::kStandardDatum, 0, true);
  AddEllipsoid(standard, layout::kEllipsoid, description.targetEllipsoid);
  Add(standard, layout::kMethod, {datum.computationIndicator});
  Add(standard, layout::kDatumParameters, description.parameters);
  Add(standard, layout::kSourceDatumName, description.sourceDatumName);
  AddEllipsoid(standard, layout::kSourceEllipsoid, description.sourceEllipsoid);
  AddValidityArea(standard, description);
  Add(standard, layout::kHeightIndicator, static_cast<signed char>(description.heightIndicator));
  return WriteResidualGrid(entry, layout::kDatumGrid, description.grid);
}

ResultCode RTCMDataSupport::AddDatumToGFF(DatumData& description) {
  if (!GFFDatumFile) return kDatumFileTrouble;
  if (!IsSameDatum(description, datum)) return kNotTheCurrentDescription;
  return AddEntry(kDatumFiles, datumEntryName,
                  [&](TGenericRegistryKey& entry) { return InitDatumRegKey(entry, description); });
}

}  // namespace orx::cs::velta
