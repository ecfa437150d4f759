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
/// A name is that of the record's member; what it counts, the member's comment says. The numbers
/// behind are those of the data fields in the standard, RTCM 10403.

/// \file
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
  visit.Text("sourceName", record.sourceName,
             record.sourceNameCounter);  // DF143, the count, and DF144
  visit.Text("targetName", record.targetName, record.targetNameCounter);  // DF145, DF146
  visit.Number("systemId", 8, record.systemId);                           // DF147
  visit.BitSet("utilizedMsgIndicator", 10, record.utilizedMsgIndicator);  // DF148
  visit.Number("plateNumber", 5, record.plateNumber);                     // DF149
  visit.Number("computationIndicator", 4, record.computationIndicator);   // DF150
  visit.Number("heightIndicator", 2, record.heightIndicator);             // DF151
  visit.Number("phiV", 19, record.phiV);                                  // DF152
  visit.Number("lambdaV", 20, record.lambdaV);                            // DF153
  visit.Number("dPhiV", 14, record.dPhiV);                                // DF154
  visit.Number("dLambdaV", 14, record.dLambdaV);                          // DF155
  visit.Number("dX", 23, record.dX);                                      // DF156
  visit.Number("dY", 23, record.dY);                                      // DF157
  visit.Number("dZ", 23, record.dZ);                                      // DF158
  visit.Number("r1", 32, record.r1);                                      // DF159
  visit.Number("r2", 32, record.r2);                                      // DF160
  visit.Number("r3", 32, record.r3);                                      // DF161
  visit.Number("dS", 25, record.dS);                                      // DF162
  if constexpr (kIsOneOf<Record, Rtcm1022>) {
    visit.Number("xp", 35, record.xp);  // DF163
    visit.Number("yp", 35, record.yp);  // DF164
    visit.Number("zp", 35, record.zp);  // DF165
  }
  visit.Number("addAs", 24, record.addAs);                               // DF166
  visit.Number("addBs", 25, record.addBs);                               // DF167
  visit.Number("addAt", 24, record.addAt);                               // DF168
  visit.Number("addBt", 25, record.addBt);                               // DF169
  visit.Number("horQualityIndicator", 3, record.horQualityIndicator);    // DF214
  visit.Number("vertQualityIndicator", 3, record.vertQualityIndicator);  // DF215
}

/// What the two residual-grid messages begin with.
template <class Visitor, class Record>
void VisitGridStart(Visitor& visit, Record& record) {
  visit.Number("systemId", 8, record.systemId);                      // DF147
  visit.Number("horShiftIndicator", 1, record.horShiftIndicator);    // DF190
  visit.Number("vertShiftIndicator", 1, record.vertShiftIndicator);  // DF191
}

/// What the two residual-grid messages end with.
template <class Visitor, class Record>
void VisitGridEnd(Visitor& visit, Record& record) {
  visit.Number("horInterpolationMethod", 2, record.horInterpolationMethod);      // DF212
  visit.Number("vertInterpolationMethod", 2, record.vertInterpolationMethod);    // DF213
  visit.Number("horGridQualityIndicator", 3, record.horGridQualityIndicator);    // DF216
  visit.Number("vertGridQualityIndicator", 3, record.vertGridQualityIndicator);  // DF217
  visit.Number("mjd", 16, record.mjd);                                           // DF051
}

/// As above, for a 1023.
template <class Visitor, class Record>
std::enable_if_t<kIsOneOf<Record, Rtcm1023>> VisitFields(Visitor& visit, Record& record) {
  VisitGridStart(visit, record);
  visit.Number("phi0", 21, record.phi0);               // DF192
  visit.Number("lambda0", 22, record.lambda0);         // DF193
  visit.Number("dPhi", 12, record.dPhi);               // DF194
  visit.Number("dLambda", 12, record.dLambda);         // DF195
  visit.Number("meanDPhi", 8, record.meanDPhi);        // DF196
  visit.Number("meanDLambda", 8, record.meanDLambda);  // DF197
  visit.Number("meanDH", 15, record.meanDH);           // DF198
  visit.Points(9, Column{"residualPhi", record.residualPhi},
               Column{"residualLambda", record.residualLambda},
               Column{"residualH", record.residualH});  // DF199 to DF201
  VisitGridEnd(visit, record);
}

/// As above, for a 1024.
template <class Visitor, class Record>
std::enable_if_t<kIsOneOf<Record, Rtcm1024>> VisitFields(Visitor& visit, Record& record) {
  VisitGridStart(visit, record);
  visit.Number("north0", 25, record.north0);  // DF202
  visit.Number("east0", 26, record.east0);    // DF203
  visit.Number("dN", 12, record.dN);          // DF204
  visit.Number("dE", 12, record.dE);          // DF205
  visit.Number("meanDN", 10, record.meanDN);  // DF206
  visit.Number("meanDE", 10, record.meanDE);  // DF207
  visit.Number("meanDh", 15, record.meanDh);  // DF208
  visit.Points(9, Column{"residualN", record.residualN}, Column{"residualE", record.residualE},
               Column{"residualH", record.residualH});  // DF209 to DF211
  VisitGridEnd(visit, record);
}

/// As above, for a 1025.
template <class Visitor, class Record>
std::enable_if_t<kIsOneOf<Record, Rtcm1025>> VisitFields(Visitor& visit, Record& record) {
  visit.Number("systemId", 8, record.systemId);              // DF147
  visit.Number("projectionType", 6, record.projectionType);  // DF170
  visit.Number("laNO", 34, record.laNO);                     // DF171
  visit.Number("loNO", 35, record.loNO);                     // DF172
  visit.Number("addSNO", 30, record.addSNO);                 // DF173
  visit.Number("fe", 36, record.fe);                         // DF174
  visit.Number("fn", 35, record.fn);                         // DF175
}

/// As above, for a 1026.
template <class Visitor, class Record>
std::enable_if_t<kIsOneOf<Record, Rtcm1026>> VisitFields(Visitor& visit, Record& record) {
  visit.Number("systemId", 8, record.systemId);              // DF147
  visit.Number("projectionType", 6, record.projectionType);  // DF170
  visit.Number("laFO", 34, record.laFO);                     // DF176
  visit.Number("loFO", 35, record.loFO);                     // DF177
  visit.Number("laSP1", 34, record.laSP1);                   // DF178
  visit.Number("laSP2", 34, record.laSP2);                   // DF179
  visit.Number("efo", 36, record.efo);                       // DF180
  visit.Number("nfo", 35, record.nfo);                       // DF181
}

/// As above, for a 1027.
template <class Visitor, class Record>
std::enable_if_t<kIsOneOf<Record, Rtcm1027>> VisitFields(Visitor& visit, Record& record) {
  visit.Number("systemId", 8, record.systemId);                    // DF147
  visit.Number("projectionType", 6, record.projectionType);        // DF170
  visit.Number("rectificationFlag", 1, record.rectificationFlag);  // DF182
  visit.Number("laPC", 34, record.laPC);                           // DF183
  visit.Number("loPC", 35, record.loPC);                           // DF184
  visit.Number("azIL", 35, record.azIL);                           // DF185
  visit.Number("diffARSG", 26, record.diffARSG);                   // DF186
  visit.Number("addSIL", 30, record.addSIL);                       // DF187
  visit.Number("epc", 36, record.epc);                             // DF188
  visit.Number("npc", 35, record.npc);                             // DF189
}

}  // namespace orx::cs::velta::rtcm3
