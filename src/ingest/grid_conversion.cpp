#include "ingest/grid_conversion.h"

#include "records/message_units.h"

namespace orx::cs::velta {
namespace {

void CopySettings(const RtcmTableMessage& message, TableData& table) {
  table.horShift = message.horShiftIndicator;
  table.vertShift = message.vertShiftIndicator;
  table.horInterpolation = static_cast<std::int32_t>(message.horInterpolationMethod);
  table.vertInterpolation = static_cast<std::int32_t>(message.vertInterpolationMethod);
}

}  // namespace

void ConvertEllipsoidalGrid(const Rtcm1023& message, TableData& table) {
  CopySettings(message, table);

  const double centerN = message.phi0;
  const double centerE = message.lambda0;
  const double extentN = kGridSteps * message.dPhi;
  const double extentE = kGridSteps * message.dLambda;
  table.centerN = centerN * kHalfArcSecond;
  table.centerE = centerE * kHalfArcSecond;
  table.bounds[0] = (centerN - extentN * 0.5) * kHalfArcSecond;
  table.bounds[1] = extentN * kHalfArcSecond;
  table.bounds[2] = (centerE - extentE * 0.5) * kHalfArcSecond;
  table.bounds[3] = extentE * kHalfArcSecond;
  table.bounds[4] = message.dPhi * kHalfArcSecond;
  table.bounds[5] = message.dLambda * kHalfArcSecond;

  table.meanValue[0] = message.meanDPhi * kArcSecond * kMeanAngleResolution;
  table.meanValue[1] = message.meanDLambda * kArcSecond * kMeanAngleResolution;
  table.meanValue[2] = message.meanDH * kMeanLengthResolution;
  for (int i = 0; i < kResidualGridPoints; ++i) {
    table.dNdLatData[i] = message.residualPhi[i] * kResidualAngleResolution * kArcSecond;
    table.dEdLonData[i] = message.residualLambda[i] * kResidualAngleResolution * kArcSecond;
    table.dHData[i] = message.residualH[i] * kResidualLengthResolution;
  }
  table.hasTable = true;
}

void ConvertPlaneGrid(TableData& table, const Rtcm1024& message) {
  CopySettings(message, table);

  // Integer products of 32 bits, as other users of the files form them.
  const std::uint32_t stepN = message.dN * kPlaneGridResolution;
  const std::uint32_t stepE = message.dE * kPlaneGridResolution;
  const std::uint32_t extentN = stepN * kGridSteps;
  const std::uint32_t extentE = stepE * kGridSteps;
  const auto north0 = static_cast<std::uint32_t>(message.north0);
  table.centerN = static_cast<std::int32_t>(north0 * kPlaneGridResolution);
  table.centerE = message.east0 * kPlaneGridResolution;
  table.bounds[0] = table.centerN - 0.5 * extentN;
  table.bounds[1] = extentN;
  table.bounds[2] = table.centerE - 0.5 * extentE;
  table.bounds[3] = extentE;
  table.bounds[4] = stepN;
  table.bounds[5] = stepE;

  table.meanValue[0] = message.meanDN * kMeanLengthResolution;
  table.meanValue[1] = message.meanDE * kMeanLengthResolution;
  table.meanValue[2] = message.meanDh * kMeanLengthResolution;
  for (int i = 0; i < kResidualGridPoints; ++i) {
    table.dNdLatData[i] = message.residualN[i] * kResidualLengthResolution;
    table.dEdLonData[i] = message.residualE[i] * kResidualLengthResolution;
    table.dHData[i] = message.residualH[i] * kResidualLengthResolution;
  }
  table.hasTable = true;
}

}  // namespace orx::cs::velta
