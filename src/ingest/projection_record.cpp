// Projection entries and the files they are kept in.

#include <algorithm>

#include "ingest/record_file.h"
#include "records/comparison.h"
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

ResultCode RTCMDataSupport::InitProjectionGFF(ProjectionData& projection) {
  const COrxStringT<wchar_t> path =
      GetProjectionPath() + projection.rtcmProjName + kProjectionFiles.extension;
  const ResultCode result = EnsureFile(GetProjectionPath(), path, [&](const auto& newFile) {
    return CreateNewPrjGFF(newFile, projection);
  });
  return result == kSuccess ? InitWithExistedPrjGFF(path) : result;
}

ResultCode RTCMDataSupport::CreateNewPrjGFF(const COrxStringT<wchar_t>& path,
                                            ProjectionData& projection) {
  const auto fillContainer = [&](TGenericRegistryKey& container) {
    Add(container, layout::kProjectionFileName, projection.rtcmProjName);
    Add(container, layout::kSystemId, projection.systemId);
    return kSuccess;
  };
  const auto fillEntry = [&](TGenericRegistryKey& entry) {
    return InitPrjRegKey(entry, projection);
  };
  return CreateFileWithEntry(kProjectionFiles, path, projection.rtcmProjName, fillContainer,
                             projectionEntryName_, fillEntry);
}

ResultCode RTCMDataSupport::InitWithExistedPrjGFF(const COrxStringT<wchar_t>& path) {
  return OpenShared(kProjectionFiles, path);
}

ResultCode RTCMDataSupport::InitPrjRegKey(TGenericRegistryKey& entry, ProjectionData& projection) {
  Add(entry, layout::kVersion, layout::kEntryVersion);
  TGenericRegistryKey standard(entry, layout::kStandardProjection, 0, true);
  Add(standard, layout::kProjectionName, projection.rtcmProjName);
  Add(standard, layout::kDatumName, datum_.targetDatumName);
  AddEllipsoid(standard, *projection.geoProj);
  Add(standard, layout::kProjectionType, projection.prjType);
  AddParameters(standard, *projection.geoProj);
  return WriteResidualGrid(entry, layout::kProjectionGrid, projection.table);
}

ResultCode RTCMDataSupport::AddProjectionToGFF(ProjectionData& projection) {
  if (!GFFProjectionFile) return kProjectionFileTrouble;
  if (!ProjectionEquals(projection, projection_)) return kNotTheCurrentDescription;
  return AddEntry(kProjectionFiles, projectionEntryName_,
                  [&](TGenericRegistryKey& entry) { return InitPrjRegKey(entry, projection); });
}

}  // namespace orx::cs::velta
