// Datum entries and the files they are kept in.

#include "ingest/record_file.h"
#include "records/comparison.h"
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

/// Around the centre, also where the extent is the whole range, whose edge `validityArea` does not
/// have.
void AddValidityArea(TGenericRegistryKey& key, const DatumData& datum) {
  const double latitudeExtent = datum.validityArea[1];
  const double longitudeExtent = datum.validityArea[3];
  const double area[] = {datum.validityCentre[0] - latitudeExtent * 0.5, latitudeExtent,
                         datum.validityCentre[1] - longitudeExtent * 0.5, longitudeExtent};
  Add(key, layout::kValidityArea, area);
}

}  // namespace

ResultCode RTCMDataSupport::InitDatumGFF(DatumData& datum) {
  const COrxStringT<wchar_t> path = GetDatumPath() + datum.targetDatumName + kDatumFiles.extension;
  const ResultCode result = EnsureFile(
      GetDatumPath(), path, [&](const auto& newFile) { return CreateNewDatumGFF(newFile, datum); });
  return result == kSuccess ? InitWithExistedDatumGFF(path) : result;
}

ResultCode RTCMDataSupport::CreateNewDatumGFF(const COrxStringT<wchar_t>& path, DatumData& datum) {
  const auto fillContainer = [&](TGenericRegistryKey& container) {
    Add(container, layout::kDatumFileName, datum.targetDatumName);
    return kSuccess;
  };
  const auto fillEntry = [&](TGenericRegistryKey& entry) { return InitDatumRegKey(entry, datum); };
  return CreateFileWithEntry(kDatumFiles, path, datum.targetDatumName, fillContainer,
                             datumEntryName_, fillEntry);
}

ResultCode RTCMDataSupport::InitWithExistedDatumGFF(const COrxStringT<wchar_t>& path) {
  return OpenShared(kDatumFiles, path);
}

ResultCode RTCMDataSupport::InitDatumRegKey(TGenericRegistryKey& entry, DatumData& datum) {
  Add(entry, layout::kVersion, layout::kEntryVersion);
  TGenericRegistryKey standard(entry, layout::kStandardDatum, 0, true);
  AddEllipsoid(standard, layout::kEllipsoid, datum.targetEllipsoid);
  Add(standard, layout::kMethod, {datum_.computationIndicator});
  Add(standard, layout::kDatumParameters, datum.parameters);
  Add(standard, layout::kSourceDatumName, datum.sourceDatumName);
  AddEllipsoid(standard, layout::kSourceEllipsoid, datum.sourceEllipsoid);
  AddValidityArea(standard, datum);
  Add(standard, layout::kHeightIndicator, static_cast<signed char>(datum.heightIndicator));
  return WriteResidualGrid(entry, layout::kDatumGrid, datum.grid);
}

ResultCode RTCMDataSupport::AddDatumToGFF(DatumData& datum) {
  if (!GFFDatumFile) return kDatumFileTrouble;
  if (!IsSameDatum(datum, datum_)) return kNotTheCurrentDescription;
  return AddEntry(kDatumFiles, datumEntryName_,
                  [&](TGenericRegistryKey& entry) { return InitDatumRegKey(entry, datum); });
}

}  // namespace orx::cs::velta
