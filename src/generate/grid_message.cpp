// From a stored residual grid to the record of its 1023 or 1024.

#include "generate/make_record.h"
#include "projmath/rect_rgn.h"
#include "records/message_units.h"
#include "records/truncation.h"
#include "store/residual_grid.h"
#include "store/stored_entries.h"
#include "velta/rtcm_generator.h"

namespace orx::cs::velta {
namespace {

double CentreOf(double edge, double extent) { return edge + 0.5 * extent; }

std::int32_t MeanAngle(double radians) { return ToInt32(radians * kMeanAngleUnits / kArcSecond); }
std::int32_t MeanLength(double metres) { return ToInt32(metres / kMeanLengthResolution); }
std::int32_t ResidualAngle(double radians) {
  return ToInt32(radians / kResidualAngleResolution / kArcSecond);
}
std::int32_t ResidualLength(double metres) { return ToInt32(metres / kResidualLengthResolution); }

void Convert(const TableData& table, Rtcm1023& message) {
  const double(&bounds)[6] = table.bounds;
  message.phi0 = ToInt32(CentreOf(bounds[0], bounds[1]) / kHalfArcSecond);
  message.lambda0 = ToInt32(CentreOf(bounds[2], bounds[3]) / kHalfArcSecond);
  message.dPhi = ToLow32(bounds[4] / kHalfArcSecond);
  message.dLambda = ToLow32(bounds[5] / kHalfArcSecond);
  message.meanDPhi = MeanAngle(table.meanValue[0]);
  message.meanDLambda = MeanAngle(table.meanValue[1]);
  message.meanDH = MeanLength(table.meanValue[2]);
  for (int i = 0; i < kResidualGridPoints; ++i) {
    message.residualPhi[i] = ResidualAngle(table.dNdLatData[i]);
    message.residualLambda[i] = ResidualAngle(table.dEdLonData[i]);
    message.residualH[i] = ResidualLength(table.dHData[i]);
  }
}

void Convert(const TableData& table, Rtcm1024& message) {
  const double(&bounds)[6] = table.bounds;
  message.north0 = ToInt32(CentreOf(bounds[0], bounds[1]) / kPlaneGridResolution);
  message.east0 = ToUint32(CentreOf(bounds[2], bounds[3]) / kPlaneGridResolution);
  message.dN = ToLow32(bounds[4] / kPlaneGridResolution);
  message.dE = ToLow32(bounds[5] / kPlaneGridResolution);
  message.meanDN = MeanLength(table.meanValue[0]);
  message.meanDE = MeanLength(table.meanValue[1]);
  message.meanDh = MeanLength(table.meanValue[2]);
  for (int i = 0; i < kResidualGridPoints; ++i) {
    message.residualN[i] = ResidualLength(table.dNdLatData[i]);
    message.residualE[i] = ResidualLength(table.dEdLonData[i]);
    message.residualH[i] = ResidualLength(table.dHData[i]);
  }
}

/// What differs between the two grids.
struct GridKind {
  const layout::ResidualGrid& layout;
  bool isPlane;
};
constexpr GridKind kEllipsoidal{layout::kDatumGrid, false};
constexpr GridKind kPlane{layout::kProjectionGrid, true};

/// The record of the first entry whose grid holds the position. An entry in front of it that cannot
/// be searched ends the search.
template <class Message>
boost::shared_ptr<Message> FindGrid(const COrxStringT<wchar_t>& fileName, const GridKind& kind,
                                    double north, double east, std::int32_t systemId) {
  const TGenericRegistryKey container = OpenContainer(fileName);
  for (TGenRegKeyIterator walk(container); walk;) {
    const TGenericRegistryKey gridKey = OpenExisting(TGenericRegistryKey(walk++), kind.layout.key);
    StoredGrid grid;
    if (!ReadGridArea(gridKey, kind.layout, grid)) return nullptr;
    const TableData& table = grid.table;
    const projmath::TRectRgn area{table.bounds[0], table.bounds[1], table.bounds[2],
                                  table.bounds[3]};
    if (!area.Inside(north, east, kind.isPlane)) continue;
    // A single row or column has no step.
    if (grid.rows == 1 || grid.columns == 1 || !ReadGridValues(gridKey, grid)) return nullptr;
    Message message;
    message.systemId = static_cast<std::uint32_t>(systemId);
    message.horShiftIndicator = table.horShift;
    message.vertShiftIndicator = table.vertShift;
    message.horInterpolationMethod = static_cast<std::uint32_t>(table.horInterpolation);
    message.vertInterpolationMethod = static_cast<std::uint32_t>(table.vertInterpolation);
    Convert(table, message);
    return MakeRecord(message);
  }
  return nullptr;
}

}  // namespace

boost::shared_ptr<Rtcm1023> RTCMGenerator::get1023(double latitude, double longitude,
                                                   double /*height*/) const {
  return FindGrid<Rtcm1023>(datumFile, kEllipsoidal, latitude, longitude, systemId);
}

boost::shared_ptr<Rtcm1024> RTCMGenerator::get1024(double northing, double easting,
                                                   double /*height*/) const {
  return FindGrid<Rtcm1024>(projFile, kPlane, northing, easting, systemId);
}

}  // namespace orx::cs::velta
