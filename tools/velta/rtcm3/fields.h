#pragma once

#include <concepts>
#include <cstdint>
#include <limits>
#include <stdexcept>
#include <string>
#include <string_view>
#include <type_traits>
#include <utility>

#include "rtcm3/message.h"

/// The fields of each message in the order in which they travel. Decoding, encoding and both
/// directions of JSON walk these lists with a visitor that has
///
///     Number(name, width, value)         an integer of `width` bits, signed as the member is
///     Text(name, text, counter)          a 5-bit count of characters and the characters
///     Points(width, {name, values}...)   for each grid point one integer of every column

namespace velta_tool::rtcm3 {

/// Bits of a text's count of characters.
inline constexpr unsigned kTextCounterWidth = 5;
/// The most characters that a text can have.
inline constexpr std::size_t kMaxTextLength = (1U << kTextCounterWidth) - 1;

/// A field holds, or is given, what the message cannot carry; the text names field and range.
struct FieldError : std::runtime_error {
  using std::runtime_error::runtime_error;
};

/// The values that a field can take.
struct FieldRange {
  std::int64_t min;
  std::int64_t max;

  template <class Member>
  static constexpr FieldRange Of(unsigned width) {
    const std::int64_t values = std::int64_t{1} << width;
    if constexpr (std::is_signed_v<Member>) return {-values / 2, values / 2 - 1};
    return {0, values - 1};
  }

  template <class Integer>
  constexpr bool Holds(Integer value) const {
    return std::cmp_greater_equal(value, min) && std::cmp_less_equal(value, max);
  }

  /// The error that a field's value is outside.
  FieldError Error(std::string_view field, const std::string& value) const {
    return FieldError(std::string(field) + " must be an integer from " + std::to_string(min) +
                      " to " + std::to_string(max) + ", not " + value);
  }
};

/// The error that a text is too long or has characters that do not travel.
inline FieldError TextError(std::string_view field) {
  return FieldError(std::string(field) + " must be a text of at most " +
                    std::to_string(kMaxTextLength) + " ISO 8859-1 characters");
}

/// One value of each grid point.
template <class Values>
struct Column {
  const char* name;
  Values& values;
};
template <class Values>
Column(const char*, Values&) -> Column<Values>;

/// Hands the values of the columns to `visit.Number`, point by point as they travel.
template <class Visitor, class... Columns>
void VisitPoints(Visitor& visit, unsigned width, Columns... columns) {
  for (int i = 0; i < orx::cs::velta::kResidualGridPoints; ++i) {
    (visit.Number(columns.name, width, columns.values[i]), ...);
  }
}

template <class Record, class Plain>
concept Is = std::same_as<std::remove_const_t<Record>, Plain>;

template <class Visitor, class Record>
requires Is<Record, Rtcm1021> || Is<Record, Rtcm1022>
void VisitFields(Visitor& visit, Record& record) {
  visit.Text("sourceName", record.sourceName, record.sourceNameCounter);
  visit.Text("targetName", record.targetName, record.targetNameCounter);
  visit.Number("systemId", 8, record.systemId);
  visit.Number("utilizedMsgIndicator", 10, record.utilizedMsgIndicator);
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
  if constexpr (Is<Record, Rtcm1022>) {
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

template <class Visitor, class Record>
requires Is<Record, Rtcm1023>
void VisitFields(Visitor& visit, Record& record) {
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

template <class Visitor, class Record>
requires Is<Record, Rtcm1024>
void VisitFields(Visitor& visit, Record& record) {
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

template <class Visitor, class Record>
requires Is<Record, Rtcm1025>
void VisitFields(Visitor& visit, Record& record) {
  visit.Number("systemId", 8, record.systemId);
  visit.Number("projectionType", 6, record.projectionType);
  visit.Number("laNO", 34, record.laNO);
  visit.Number("loNO", 35, record.loNO);
  visit.Number("addSNO", 30, record.addSNO);
  visit.Number("fe", 36, record.fe);
  visit.Number("fn", 35, record.fn);
}

template <class Visitor, class Record>
requires Is<Record, Rtcm1026>
void VisitFields(Visitor& visit, Record& record) {
  visit.Number("systemId", 8, record.systemId);
  visit.Number("projectionType", 6, record.projectionType);
  visit.Number("laFO", 34, record.laFO);
  visit.Number("loFO", 35, record.loFO);
  visit.Number("laSP1", 34, record.laSP1);
  visit.Number("laSP2", 34, record.laSP2);
  visit.Number("efo", 36, record.efo);
  visit.Number("nfo", 35, record.nfo);
}

template <class Visitor, class Record>
requires Is<Record, Rtcm1027>
void VisitFields(Visitor& visit, Record& record) {
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

}  // namespace velta_tool::rtcm3
