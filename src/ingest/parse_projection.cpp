// From a projection message to an entry of its datum's projection file.

#include "conversion/grid_conversion.h"
#include "conversion/projection_conversion.h"
#include "ingest/entry_file.h"
#include "velta/rtcm_data_support.h"

namespace orx::cs::velta {

ResultCode RTCMDataSupport::ParseProjectionMessages(const Rtcm1025& message, const Rtcm1024* grid) {
  return ParseProjection(message, message.projectionType, grid);
}

ResultCode RTCMDataSupport::ParseProjectionMessages(const Rtcm1026& /*message*/,
                                                    const Rtcm1024* /*grid*/) {
  return kUnsupportedProjection;
}

ResultCode RTCMDataSupport::ParseProjectionMessages(const Rtcm1027& message, const Rtcm1024* grid) {
  return ParseProjection(message, TypeCodeOf(message), grid);
}

template <class Message>
ResultCode RTCMDataSupport::ParseProjection(const Message& message, std::uint32_t typeCode,
                                            const Rtcm1024* grid) {
  projection.datumName = datum.targetDatumName;
  if (projection.datumName.empty()) return kNoDatumName;
  projection.has1024 = grid != nullptr;
  // An entry without a grid must not carry the one of another projection.
  projection.table = TableData();
  if (grid) ConvertPlaneGrid(projection.table, *grid);
  projection.regionName = regionName;
  projection.systemId = message.systemId;
  projection.rtcmProjName = projection.datumName;
  projection.geoProj = CreateProjection(projection, static_cast<int>(typeCode),
                                        datum.targetEllipsoid.a, datum.targetEllipsoid.second);
  if (!projection.geoProj) return kUnsupportedProjection;
  int index = 0;
  for (const double parameter : ParametersOf(message)) {
    projection.geoProj->SetParam(parameter, index++, projmath::kDegreesMetresRatios);
  }
  projectionEntryName = ProjectionEntryName(message, grid);

  // Before the file is obtained, so that no exception comes between that and giving it back.
  const COrxStringT<wchar_t> path =
      FileOf(kProjectionFiles, projectionPath, projection.rtcmProjName);
  const ResultCode result = InitProjectionGFF(projection);
  if (result != kSuccess) return result;
  return AddAndGiveBack(kProjectionFiles, path, [this] { return AddProjectionToGFF(projection); });
}

}  // namespace orx::cs::velta
