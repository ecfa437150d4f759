#pragma once

#include <type_traits>

#include "velta/message_units.h"
#include "velta/projection_data.h"
#include "velta/rtcm_messages.h"

/// The scaled fields of the messages: which number of a description each is, and how it is scaled.
/// Ingestion, generation and whoever shows messages walk these lists with a visitor
///
///     visit(name, integer, number, scaling)
///
/// of which `integer` is the record's member of that name. Numbers are stored as the description
/// has them: angles in radians, but rotations in arc-seconds and those of projections in degrees.
namespace orx::cs::velta {

/// How a field is scaled, both ways. The steps of each formula are evaluated in their order, which
/// is binding to the last bit.
struct Scaling {
  double (*toNumber)(double integer);
  double (*toInteger)(double number);  ///< not yet truncated
};

// Radians. The mean angles have other formulas than the residuals.
inline constexpr Scaling kAreaAngle{[](double n) { return n * kTwoArcSeconds; },
                                    [](double angle) { return angle / kTwoArcSeconds; }};
inline constexpr Scaling kGridAngle{[](double n) { return n * kHalfArcSecond; },
                                    [](double angle) { return angle / kHalfArcSecond; }};
inline constexpr Scaling kGridSpacing = kGridAngle;
inline constexpr Scaling kMeanAngle{
    [](double n) { return n * kArcSecond * kMeanAngleResolution; },
    [](double angle) { return angle * kMeanAngleUnits / kArcSecond; }};
inline constexpr Scaling kResidualAngle{
    [](double n) { return n * kResidualAngleResolution * kArcSecond; },
    [](double angle) { return angle / kResidualAngleResolution / kArcSecond; }};

// Metres.
inline constexpr Scaling kSemiMajorAxis{
    [](double n) { return n * kAxisResolution + kSemiMajorAxisBase; },
    [](double axis) { return (axis - kSemiMajorAxisBase) / kAxisResolution; }};
inline constexpr Scaling kSemiMinorAxis{
    [](double n) { return n * kAxisResolution + kSemiMinorAxisBase; },
    [](double axis) { return (axis - kSemiMinorAxisBase) / kAxisResolution; }};
inline constexpr Scaling kTranslation{
    [](double n) { return n * kTranslationResolution; },
    [](double length) { return length / kTranslationResolution; }};
inline constexpr Scaling kPlaneGridLength{
    [](double n) { return n * kPlaneGridResolution; },
    [](double length) { return length / kPlaneGridResolution; }};
inline constexpr Scaling kMeanLength{[](double n) { return n * kMeanLengthResolution; },
                                     [](double length) { return length / kMeanLengthResolution; }};
inline constexpr Scaling kResidualLength{
    [](double n) { return n * kResidualLengthResolution; },
    [](double length) { return length / kResidualLengthResolution; }};
inline constexpr Scaling kProjectionLength{
    [](double n) { return n * kProjectionLengthResolution; },
    [](double length) { return length / kProjectionLengthResolution; }};

// Arc-seconds, ppm, degrees, a plain ratio.
inline constexpr Scaling kRotation{[](double n) { return n * kRotationResolution; },
                                   [](double rotation) { return rotation / kRotationResolution; }};
inline constexpr Scaling kScaleCorrection{[](double n) { return n * kScaleResolution; },
                                          [](double scale) { return scale / kScaleResolution; }};
inline constexpr Scaling kProjectionAngle{
    [](double n) { return n * kProjectionAngleResolution; },
    [](double angle) { return angle / kProjectionAngleResolution; }};
inline constexpr Scaling kScaleFactor{
    [](double n) { return (n * kProjectionScaleResolution + kProjectionScaleBase) * kPpm; },
    [](double factor) {
      return (factor / kPpm - kProjectionScaleBase) / kProjectionScaleResolution;
    }};

/// A record of a message, const or not.
template <class Record, class Kind>
concept RecordOf = std::is_same_v<std::remove_const_t<Record>, Kind>;

/// The ellipsoids of a datum message, by their semi-axes.
template <class Message, class Datum, class Visit>
void VisitEllipsoids(Message& message, Datum& datum, const Visit& visit) {
  visit("addAs", message.addAs, datum.sourceEllipsoid.a, kSemiMajorAxis);
  visit("addBs", message.addBs, datum.sourceEllipsoid.second, kSemiMinorAxis);
  visit("addAt", message.addAt, datum.targetEllipsoid.a, kSemiMajorAxis);
  visit("addBt", message.addBt, datum.targetEllipsoid.second, kSemiMinorAxis);
}

/// The parameters that 1021 and 1022 share.
template <class Message, class Datum, class Visit>
void VisitParameters(Message& message, Datum& datum, const Visit& visit) {
  auto& parameters = datum.parameters;
  visit("dX", message.dX, parameters[0], kTranslation);
  visit("dY", message.dY, parameters[1], kTranslation);
  visit("dZ", message.dZ, parameters[2], kTranslation);
  visit("r1", message.r1, parameters[3], kRotation);
  visit("r2", message.r2, parameters[4], kRotation);
  visit("r3", message.r3, parameters[5], kRotation);
  visit("dS", message.dS, parameters[6], kScaleCorrection);
}

/// The rotation point of a 1022.
template <class Message, class Datum, class Visit>
void VisitRotationPoint(Message& message, Datum& datum, const Visit& visit) {
  visit("xp", message.xp, datum.parameters[7], kTranslation);
  visit("yp", message.yp, datum.parameters[8], kTranslation);
  visit("zp", message.zp, datum.parameters[9], kTranslation);
}

/// The area of validity: its centre and its extents, of which 0 is the whole range.
template <class Message, class Datum, class Visit>
void VisitValidityArea(Message& message, Datum& datum, const Visit& visit) {
  visit("phiV", message.phiV, datum.validityCentre[0], kAreaAngle);
  visit("lambdaV", message.lambdaV, datum.validityCentre[1], kAreaAngle);
  visit("dPhiV", message.dPhiV, datum.validityArea[1], kAreaAngle);
  visit("dLambdaV", message.dLambdaV, datum.validityArea[3], kAreaAngle);
}

/// The centre of a residual grid.
template <RecordOf<Rtcm1023> Message, class Table, class Visit>
void VisitGridCentre(Message& message, Table& table, const Visit& visit) {
  visit("phi0", message.phi0, table.centerN, kGridAngle);
  visit("lambda0", message.lambda0, table.centerE, kGridAngle);
}
template <RecordOf<Rtcm1024> Message, class Table, class Visit>
void VisitGridCentre(Message& message, Table& table, const Visit& visit) {
  visit("north0", message.north0, table.centerN, kPlaneGridLength);
  visit("east0", message.east0, table.centerE, kPlaneGridLength);
}

/// The distances between the points of a residual grid.
template <RecordOf<Rtcm1023> Message, class Table, class Visit>
void VisitGridSpacing(Message& message, Table& table, const Visit& visit) {
  visit("dPhi", message.dPhi, table.bounds[4], kGridSpacing);
  visit("dLambda", message.dLambda, table.bounds[5], kGridSpacing);
}
template <RecordOf<Rtcm1024> Message, class Table, class Visit>
void VisitGridSpacing(Message& message, Table& table, const Visit& visit) {
  visit("dN", message.dN, table.bounds[4], kPlaneGridLength);
  visit("dE", message.dE, table.bounds[5], kPlaneGridLength);
}

/// The residuals of a grid and their means.
template <RecordOf<Rtcm1023> Message, class Table, class Visit>
void VisitResiduals(Message& message, Table& table, const Visit& visit) {
  visit("meanDPhi", message.meanDPhi, table.meanValue[0], kMeanAngle);
  visit("meanDLambda", message.meanDLambda, table.meanValue[1], kMeanAngle);
  visit("meanDH", message.meanDH, table.meanValue[2], kMeanLength);
  for (int i = 0; i < kResidualGridPoints; ++i) {
    visit("residualPhi", message.residualPhi[i], table.dNdLatData[i], kResidualAngle);
    visit("residualLambda", message.residualLambda[i], table.dEdLonData[i], kResidualAngle);
    visit("residualH", message.residualH[i], table.dHData[i], kResidualLength);
  }
}
template <RecordOf<Rtcm1024> Message, class Table, class Visit>
void VisitResiduals(Message& message, Table& table, const Visit& visit) {
  visit("meanDN", message.meanDN, table.meanValue[0], kMeanLength);
  visit("meanDE", message.meanDE, table.meanValue[1], kMeanLength);
  visit("meanDh", message.meanDh, table.meanValue[2], kMeanLength);
  for (int i = 0; i < kResidualGridPoints; ++i) {
    visit("residualN", message.residualN[i], table.dNdLatData[i], kResidualLength);
    visit("residualE", message.residualE[i], table.dEdLonData[i], kResidualLength);
    visit("residualH", message.residualH[i], table.dHData[i], kResidualLength);
  }
}

/// The parameters of a projection in the order in which a projection object has them.
/// \param message has its `projectionType`, which says whether there is a scale
/// \param parameters the first of them
/// \return the one behind the last
template <RecordOf<Rtcm1025> Message, class Number, class Visit>
Number* VisitProjection(Message& message, Number* parameters, const Visit& visit) {
  visit("loNO", message.loNO, *parameters++, kProjectionAngle);
  if (HasScaleFactor(message.projectionType)) {
    visit("addSNO", message.addSNO, *parameters++, kScaleFactor);
  }
  visit("laNO", message.laNO, *parameters++, kProjectionAngle);
  visit("fe", message.fe, *parameters++, kProjectionLength);
  visit("fn", message.fn, *parameters++, kProjectionLength);
  return parameters;
}
template <RecordOf<Rtcm1026> Message, class Number, class Visit>
Number* VisitProjection(Message& message, Number* parameters, const Visit& visit) {
  visit("loFO", message.loFO, *parameters++, kProjectionAngle);
  visit("laFO", message.laFO, *parameters++, kProjectionAngle);
  visit("laSP1", message.laSP1, *parameters++, kProjectionAngle);
  visit("laSP2", message.laSP2, *parameters++, kProjectionAngle);
  visit("efo", message.efo, *parameters++, kProjectionLength);
  visit("nfo", message.nfo, *parameters++, kProjectionLength);
  return parameters;
}
/// What is rectified has one more: the sum of `azIL` and `diffARSG`, degrees.
template <RecordOf<Rtcm1027> Message, class Number, class Visit>
Number* VisitProjection(Message& message, Number* parameters, const Visit& visit) {
  visit("azIL", message.azIL, *parameters++, kProjectionAngle);
  visit("addSIL", message.addSIL, *parameters++, kScaleFactor);
  visit("loPC", message.loPC, *parameters++, kProjectionAngle);
  visit("laPC", message.laPC, *parameters++, kProjectionAngle);
  visit("epc", message.epc, *parameters++, kProjectionLength);
  visit("npc", message.npc, *parameters++, kProjectionLength);
  return parameters;
}

}  // namespace orx::cs::velta
