#include "conversion/grid_conversion.h"

#include "conversion/conversion_visitors.h"

namespace orx::cs::velta {
namespace {

/// Whole metres in integer products of 32 bits, as other users of the files form them.
constexpr auto kToWholeMetres = [](const char*, auto integer, double& number, const Scaling&) {
  const auto product = static_cast<std::uint32_t>(integer) * kPlaneGridResolution;
  number = static_cast<decltype(integer)>(product);
};
constexpr ToInteger<&ToUint32> kToInteger;
constexpr ToInteger<&ToLow32> kToSpacing;

void CopySettings(const RtcmTableMessage& message, TableData& table) {
  table.horShift = message.horShiftIndicator;
  table.vertShift = message.vertShiftIndicator;
  table.horInterpolation = static_cast<std::int32_t>(message.horInterpolationMethod);
  table.vertInterpolation = static_cast<std::int32_t>(message.vertInterpolationMethod);
}

void CopySettings(const TableData& table, RtcmTableMessage& message) {
  message.horShiftIndicator = table.horShift;
  message.vertShiftIndicator = table.vertShift;
  message.horInterpolationMethod = static_cast<std::uint32_t>(table.horInterpolation);
  message.vertInterpolationMethod = static_cast<std::uint32_t>(table.vertInterpolation);
}

template <class Message>
void Convert(TableData table, Message& message) {
  CopySettings(table, message);
  const double(&bounds)[6] = table.bounds;
  table.centerN = bounds[0] + 0.5 * bounds[1];
  table.centerE = bounds[2] + 0.5 * bounds[3];
  VisitGridCentre(message, table, kToInteger);
  VisitGridSpacing(message, table, kToSpacing);
  VisitResiduals(message, table, kToInteger);
}

}  // namespace

void ConvertEllipsoidalGrid(const Rtcm1023& message, TableData& table) {
  CopySettings(message, table);
  VisitGridCentre(message, table, kToNumber);
  VisitGridSpacing(message, table, kToNumber);
  const double extentN = kGridSteps * message.dPhi;
  const double extentE = kGridSteps * message.dLambda;
  table.bounds[0] = kGridAngle.toNumber(message.phi0 - extentN * 0.5);
  table.bounds[1] = kGridAngle.toNumber(extentN);
  table.bounds[2] = kGridAngle.toNumber(message.lambda0 - extentE * 0.5);
  table.bounds[3] = kGridAngle.toNumber(extentE);
  VisitResiduals(message, table, kToNumber);
  table.hasTable = true;
}

void ConvertPlaneGrid(TableData& table, const Rtcm1024& message) {
  CopySettings(message, table);
  VisitGridCentre(message, table, kToWholeMetres);
  VisitGridSpacing(message, table, kToWholeMetres);
  const std::uint32_t extentN = message.dN * kPlaneGridResolution * kGridSteps;
  const std::uint32_t extentE = message.dE * kPlaneGridResolution * kGridSteps;
  table.bounds[0] = table.centerN - 0.5 * extentN;
  table.bounds[1] = extentN;
  table.bounds[2] = table.centerE - 0.5 * extentE;
  table.bounds[3] = extentE;
  VisitResiduals(message, table, kToNumber);
  table.hasTable = true;
}

void ConvertGrid(const TableData& table, Rtcm1023& message) { Convert(table, message); }

void ConvertGrid(const TableData& table, Rtcm1024& message) { Convert(table, message); }

}  // namespace orx::cs::velta
