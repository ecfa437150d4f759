#pragma once

#include <cstdint>
#include <type_traits>

#include "rtcm3/message.h"

/// The fields of each message in the order in which they travel. Decoding, encoding, comparing and
/// both directions of JSON walk these lists with a visitor that has
///
///     Number(name, width, value)         an integer of `width` bits, signed as the member is
///     BitSet(name, width, value)         a set of `width` bits, of which bit 0 is sent first
///     Text(name, text, counter)          a 5-bit count of characters and the characters
///     Points(width, {name, values}...)   for each grid point one integer of every column
///
/// A name is that of the record's member; what it counts, the member's comment says.

namespace orx::cs::velta::rtcm3 {

/// The values that a field can take.
struct FieldRange {
  std::int64_t min;  ///< the smallest
  std::int64_t max;  ///< the largest

  /// Of a field of `width` bits, signed as the record's member is.
  template <class Member>
  static constexpr FieldRange Of(unsigned width) {
    const std::int64_t values = std::int64_t{1} << width;
    if constexpr (std::is_signed_v<Member>) return {-values / 2, values / 2 - 1};
    return {0, values - 1};
  }
};

/// One value of each grid point.
template <class Values>
struct Column {
  const char* name;  ///< of the field
  Values& values;    ///< an array, a value for each point
};
/// Deduces the kind of the values.
template <class Values>
Column(const char*, Values&) -> Column<Values>;

/// Hands the values of the columns to `visit.Number`, point by point as they travel.
template <class Visitor, class... Columns>
void VisitPoints(Visitor& visit, unsigned width, Columns... columns) {
  for (int i = 0; i < kResidualGridPoints; ++i) {
    (visit.Number(columns.name, width, columns.values[i]), ...);
  }
}

/// True when a record, const or not, is one of some kinds.
template <class Record, class... Kinds>
inline constexpr bool kIsOneOf = (std::is_same_v<std::remove_const_t<Record>, Kinds> || ...);

/// Hands each field of a 1021 or 1022 to the visitor.
template <class Visitor, class Record>
std::enable_if_t<kIsOneOf<Record, Rtcm1021, Rtcm1022>> VisitFields(Visitor& visit, Record& record) {
  visit.Text("sourceName", record.sourceName, record.sourceNameCounter);
  visit.Text("targetName", record.targetName, record.targetNameCounter);
  visit.Number("systemId", 8, record.systemId);
  visit.BitSet("utilizedMsgIndicator", 10, record.utilizedMsgIndicator);
  visit.Number("plateNumber", 5, record.plateNumber);
  visit.Number("computationIndicator", 4, record.computationIndicator);
  visit.Number("heightIndicator", 2, record.heightIndicator);
  visit.Number("phiV", 19, record.phiV);
  visit.Number("lambdaV", 20, record.lambdaV);
  visit.Number("dPhiV", 14, record.dPhiV);
  visit.Number("dLambdaV", 14, record.dLambdaV);
  visit.Number("dX", 23, record.dX);
  visit.Number("dY", 23, record.dY);
  visit.Number("dZ", 23, record.dZ);
  visit.Number("r1", 32, record.r1);
  visit.Number("r2", 32, record.r2);
  visit.Number("r3", 32, record.r3);
  visit.Number("dS", 25, record.dS);
  if constexpr (kIsOneOf<Record, Rtcm1022>) {
    visit.Number("xp", 35, record.xp);
    visit.Number("yp", 35, record.yp);
    visit.Number("zp", 35, record.zp);
  }
  visit.Number("addAs", 24, record.addAs);
  visit.Number("addBs", 25, record.addBs);
  visit.Number("addAt", 24, record.addAt);
  visit.Number("addBt", 25, record.addBt);
  visit.Number("horQualityIndicator", 3, record.horQualityIndicator);
  visit.Number("vertQualityIndicator", 3, record.vertQualityIndicator);
}

/// What the two residual-grid messages begin with.
template <class Visitor, class Record>
void VisitGridStart(Visitor& visit, Record& record) {
  visit.Number("systemId", 8, record.systemId);
  visit.Number("horShiftIndicator", 1, record.horShiftIndicator);
  visit.Number("vertShiftIndicator", 1, record.vertShiftIndicator);
}

/// What the two residual-grid messages end with.
template <class Visitor, class Record>
void VisitGridEnd(Visitor& visit, Record& record) {
  visit.Number("horInterpolationMethod", 2, record.horInterpolationMethod);
  visit.Number("vertInterpolationMethod", 2, record.vertInterpolationMethod);
  visit.Number("horGridQualityIndicator", 3, record.horGridQualityIndicator);
  visit.Number("vertGridQualityIndicator", 3, record.vertGridQualityIndicator);
  visit.Number("mjd", 16, record.mjd);
}

/// As above, for a 1023.
template <class Visitor, class Record>
std::enable_if_t<kIsOneOf<Record, Rtcm1023>> VisitFields(Visitor& visit, Record& record) {
  VisitGridStart(visit, record);
  visit.Number("phi0", 21, record.phi0);
  visit.Number("lambda0", 22, record.lambda0);
  visit.Number("dPhi", 12, record.dPhi);
  visit.Number("dLambda", 12, record.dLambda);
  visit.Number("meanDPhi", 8, record.meanDPhi);
  visit.Number("meanDLambda", 8, record.meanDLambda);
  visit.Number("meanDH", 15, record.meanDH);
  visit.Points(9, Column{"residualPhi", record.residualPhi},
               Column{"residualLambda", record.residualLambda},
               Column{"residualH", record.residualH});
  VisitGridEnd(visit, record);
}

/// As above, for a 1024.
template <class Visitor, class Record>
std::enable_if_t<kIsOneOf<Record, Rtcm1024>> VisitFields(Visitor& visit, Record& record) {
  VisitGridStart(visit, record);
  visit.Number("north0", 25, record.north0);
  visit.Number("east0", 26, record.east0);
  visit.Number("dN", 12, record.dN);
  visit.Number("dE", 12, record.dE);
  visit.Number("meanDN", 10, record.meanDN);
  visit.Number("meanDE", 10, record.meanDE);
  visit.Number("meanDh", 15, record.meanDh);
  visit.Points(9, Column{"residualN", record.residualN}, Column{"residualE", record.residualE},
               Column{"residualH", record.residualH});
  VisitGridEnd(visit, record);
}

/// As above, for a 1025.
template <class Visitor, class Record>
std::enable_if_t<kIsOneOf<Record, Rtcm1025>> VisitFields(Visitor& visit, Record& record) {
  visit.Number("systemId", 8, record.systemId);
  visit.Number("projectionType", 6, record.projectionType);
  visit.Number("laNO", 34, record.laNO);
  visit.Number("loNO", 35, record.loNO);
  visit.Number("addSNO", 30, record.addSNO);
  visit.Number("fe", 36, record.fe);
  visit.Number("fn", 35, record.fn);
}

/// As above, for a 1026.
template <class Visitor, class Record>
std::enable_if_t<kIsOneOf<Record, Rtcm1026>> VisitFields(Visitor& visit, Record& record) {
  visit.Number("systemId", 8, record.systemId);
  visit.Number("projectionType", 6, record.projectionType);
  visit.Number("laFO", 34, record.laFO);
  visit.Number("loFO", 35, record.loFO);
  visit.Number("laSP1", 34, record.laSP1);
  visit.Number("laSP2", 34, record.laSP2);
  visit.Number("efo", 36, record.efo);
  visit.Number("nfo", 35, record.nfo);
}

/// As above, for a 1027.
template <class Visitor, class Record>
std::enable_if_t<kIsOneOf<Record, Rtcm1027>> VisitFields(Visitor& visit, Record& record) {
  visit.Number("systemId", 8, record.systemId);
  visit.Number("projectionType", 6, record.projectionType);
  visit.Number("rectificationFlag", 1, record.rectificationFlag);
  visit.Number("laPC", 34, record.laPC);
  visit.Number("loPC", 35, record.loPC);
  visit.Number("azIL", 35, record.azIL);
  visit.Number("diffARSG", 26, record.diffARSG);
  visit.Number("addSIL", 30, record.addSIL);
  visit.Number("epc", 36, record.epc);
  visit.Number("npc", 35, record.npc);
}

}  // namespace orx::cs::velta::rtcm3
