// Projection entries and the files they are kept in.

#include <algorithm>

#include "ingest/comparison.h"
#include "ingest/entry_file.h"
#include "store/gff_layout.h"
#include "store/residual_grid.h"
#include "velta/rtcm_data_support.h"

namespace orx::cs::velta {
namespace {

void AddEllipsoid(TGenericRegistryKey& key, const projmath::TGeoProj& projection) {
  const double numbers[] = {projection.semiMajorAxis, projection.ellipsoidSecond};
  Add(key, layout::kEllipsoid, numbers);
}

void AddParameters(TGenericRegistryKey& key, const projmath::TGeoProj& projection) {
  double parameters[projmath::TGeoProj::kMaxParameters] = {};
  const int count = std::min(projection.parameterCount, projmath::TGeoProj::kMaxParameters);
  for (int i = 0; i < count; ++i) {
    parameters[i] = projection.GetParam(i, projmath::kDegreesMetresRatios);
  }
  Add(key, layout::kProjectionParameters, parameters);
}

}  // namespace

ResultCode RTCMDataSupport::InitProjectionGFF(ProjectionData& description) {
  const COrxStringT<wchar_t> path =
      FileOf(kProjectionFiles, projectionPath, description.rtcmProjName);
  const ResultCode result = EnsureFile(projectionPath, path, [&](const auto& newFile) {
    return CreateNewPrjGFF(newFile, description);
  });
  return result == kSuccess ? InitWithExistedPrjGFF(path) : result;
}

ResultCode RTCMDataSupport::CreateNewPrjGFF(const COrxStringT<wchar_t>& path,
                                            ProjectionData& description) {
  const auto fillContainer = [&](TGenericRegistryKey& container) {
    Add(container, layout::kContainerProjection, description.rtcmProjName);
    Add(container, layout::kSystemId, description.systemId);
    return kSuccess;
  };
  const auto fillEntry = [&](TGenericRegistryKey& entry) {
    return InitPrjRegKey(entry, description);
  };
  return CreateFileWithEntry(kProjectionFiles, path, description.rtcmProjName, fillContainer,
                             projectionEntryName, fillEntry);
}

ResultCode RTCMDataSupport::InitWithExistedPrjGFF(const COrxStringT<wchar_t>& path) {
  return OpenShared(kProjectionFiles, path);
}

ResultCode RTCMDataSupport::InitPrjRegKey(TGenericRegistryKey& entry, ProjectionData& description) {
  Add(entry, layout::kVersion, layout::kEntryVersion);
  TGenericRegistryKey standard(entry, layout::kStandardProjection, 0, true);
  Add(standard, layout::kProjectionName, description.rtcmProjName);
  Add(standard, layout::kDatumName, datum.targetDatumName);
  AddEllipsoid(standard, *description.geoProj);
  Add(standard, layout::kProjectionType, description.prjType);
  AddParameters(standard, *description.geoProj);
  return WriteResidualGrid(entry, layout::kProjectionGrid, description.table);
}

ResultCode RTCMDataSupport::AddProjectionToGFF(ProjectionData& description) {
  if (!GFFProjectionFile) return kProjectionFileTrouble;
  if (!ProjectionEquals(description, projection)) return kNotTheCurrentDescription;
  return AddEntry(kProjectionFiles, projectionEntryName,
                  [&](TGenericRegistryKey& entry) { return InitPrjRegKey(entry, description); });
}

}  // namespace orx::cs::velta
