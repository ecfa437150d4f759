#include "field_units.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <nlohmann/json.hpp>
#include <string_view>
#include <utility>
#include <variant>

#include "angle.h"
#include "orxutils/orx_string.h"
#include "records/message_units.h"
#include "rtcm3/fields.h"

namespace velta_tool {
namespace rtcm3 = orx::cs::velta::rtcm3;
namespace velta = orx::cs::velta;
namespace {

constexpr double kArcSecondsPerDegree = 3600;

/// What a field's integer stands for: (base + integer * step) * factor.
struct Unit {
  std::string_view name;
  double step;
  const char* stepText;  ///< for people
  double base = 0;
  double factor = 1;
};
constexpr std::string_view kDegrees = "degrees";
constexpr Unit kAreaAngle{kDegrees, 2 / kArcSecondsPerDegree, "2 arc-seconds"};
constexpr Unit kGridCentre{kDegrees, 0.5 / kArcSecondsPerDegree, "0.5 arc-seconds"};
constexpr Unit kProjectionAngle{kDegrees, velta::kProjectionAngleResolution, "1.1e-8"};
constexpr Unit kGridSpacing{"arc-seconds", 0.5, "0.5"};
constexpr Unit kRotation{"arc-seconds", velta::kRotationResolution, "0.00002"};
constexpr Unit kMeanAngle{"arc-seconds", velta::kMeanAngleResolution, "0.001"};
constexpr Unit kResidualAngle{"arc-seconds", velta::kResidualAngleResolution, "0.00003"};
constexpr Unit kScaleCorrection{"ppm", velta::kScaleResolution, "0.00001"};
constexpr Unit kTranslation{"metres", velta::kTranslationResolution, "0.001"};
constexpr Unit kSemiMajorAxis{"metres", velta::kAxisResolution, "0.001 from 6370000",
                              velta::kSemiMajorAxisBase};
constexpr Unit kSemiMinorAxis{"metres", velta::kAxisResolution, "0.001 from 6350000",
                              velta::kSemiMinorAxisBase};
constexpr Unit kPlaneGrid{"metres", velta::kPlaneGridResolution, "10"};
constexpr Unit kMeanLength{"metres", velta::kMeanLengthResolution, "0.01"};
constexpr Unit kResidualLength{"metres", velta::kResidualLengthResolution, "0.001"};
constexpr Unit kProjectionLength{"metres", velta::kProjectionLengthResolution, "0.001"};
constexpr Unit kScaleFactor{"factor", velta::kProjectionScaleResolution, "1e-11 from 0.993",
                            velta::kProjectionScaleBase, velta::kPpm};

/// The fields that are no codes, counts or days.
struct FieldUnit {
  std::string_view field;
  const Unit& unit;
};
constexpr FieldUnit kFields[] = {
    {"phiV", kAreaAngle},
    {"lambdaV", kAreaAngle},
    {"dPhiV", kAreaAngle},
    {"dLambdaV", kAreaAngle},
    {"phi0", kGridCentre},
    {"lambda0", kGridCentre},
    {"laNO", kProjectionAngle},
    {"loNO", kProjectionAngle},
    {"laFO", kProjectionAngle},
    {"loFO", kProjectionAngle},
    {"laSP1", kProjectionAngle},
    {"laSP2", kProjectionAngle},
    {"laPC", kProjectionAngle},
    {"loPC", kProjectionAngle},
    {"azIL", kProjectionAngle},
    {"diffARSG", kProjectionAngle},
    {"dPhi", kGridSpacing},
    {"dLambda", kGridSpacing},
    {"r1", kRotation},
    {"r2", kRotation},
    {"r3", kRotation},
    {"meanDPhi", kMeanAngle},
    {"meanDLambda", kMeanAngle},
    {"residualPhi", kResidualAngle},
    {"residualLambda", kResidualAngle},
    {"dS", kScaleCorrection},
    {"dX", kTranslation},
    {"dY", kTranslation},
    {"dZ", kTranslation},
    {"xp", kTranslation},
    {"yp", kTranslation},
    {"zp", kTranslation},
    {"addAs", kSemiMajorAxis},
    {"addAt", kSemiMajorAxis},
    {"addBs", kSemiMinorAxis},
    {"addBt", kSemiMinorAxis},
    {"north0", kPlaneGrid},
    {"east0", kPlaneGrid},
    {"dN", kPlaneGrid},
    {"dE", kPlaneGrid},
    {"meanDN", kMeanLength},
    {"meanDE", kMeanLength},
    {"meanDH", kMeanLength},
    {"meanDh", kMeanLength},
    {"residualN", kResidualLength},
    {"residualE", kResidualLength},
    {"residualH", kResidualLength},
    {"fe", kProjectionLength},
    {"fn", kProjectionLength},
    {"efo", kProjectionLength},
    {"nfo", kProjectionLength},
    {"epc", kProjectionLength},
    {"npc", kProjectionLength},
    {"addSNO", kScaleFactor},
    {"addSIL", kScaleFactor},
};

const Unit* UnitOf(std::string_view field) {
  const auto* const found = std::find_if(std::begin(kFields), std::end(kFields),
                                         [&](const auto& known) { return known.field == field; });
  return found == std::end(kFields) ? nullptr : &found->unit;
}

/// The decimal number with the fewest digits that is the same to a hundredth of the step.
std::string DecimalText(double number, double step) {
  constexpr double kShare = 0.01;
  constexpr int kMostDecimals = 15;
  std::array<char, 64> text{};
  for (int decimals = 0; decimals <= kMostDecimals; ++decimals) {
    std::snprintf(text.data(), text.size(), "%.*f", decimals, number);
    if (std::abs(std::strtod(text.data(), nullptr) - number) <= kShare * step) break;
  }
  return text.data();
}

std::string ValueText(const Unit& unit, std::int64_t integer, bool dms) {
  const double value = (unit.base + static_cast<double>(integer) * unit.step) * unit.factor;
  if (dms && unit.name == kDegrees) return nlohmann::json(DegreesMinutesSeconds(value)).dump();
  return DecimalText(value, unit.step * unit.factor);
}

/// Visits the fields of a message.
class Writer {
 public:
  Writer(bool dms, std::string& out) : dms_(dms), out_(out) {}

  template <class Member>
  void Number(const char* name, unsigned, Member value) {
    Name(name);
    out_ += Text(name, value);
  }

  void BitSet(const char* name, unsigned width, std::uint32_t value) { Number(name, width, value); }

  void Text(const char* name, const std::string& text, std::uint32_t) {
    Name(name);
    out_ += nlohmann::json(orx::ToUtf8(orx::Widen(text))).dump();
  }

  template <class... Columns>
  void Points(unsigned, Columns... columns) {
    (Array(columns), ...);
  }

 private:
  void Name(const char* name) { out_.append(", \"").append(name).append("\": "); }

  template <class Values>
  void Array(const rtcm3::Column<Values>& column) {
    Name(column.name);
    std::string separator = "[";
    for (const auto value : column.values) {
      out_ += std::exchange(separator, ", ") + Text(column.name, value);
    }
    out_ += ']';
  }

  template <class Member>
  std::string Text(const char* name, Member value) const {
    const auto integer = static_cast<std::int64_t>(value);
    const Unit* const unit = UnitOf(name);
    return unit ? ValueText(*unit, integer, dms_) : std::to_string(integer);
  }

  bool dms_;
  std::string& out_;
};

}  // namespace

void AppendJsonLineInUnits(const rtcm3::Message& message, bool dms, std::string& out) {
  out += "{\"message\": " + std::to_string(rtcm3::NumberOf(message));
  Writer writer(dms, out);
  std::visit([&](const auto& record) { rtcm3::VisitFields(writer, record); }, message);
  out += "}\n";
}

std::string FieldsByUnit() {
  constexpr std::size_t kLine = 96;
  std::string text;
  const Unit* last = nullptr;
  std::size_t lineStart = 0;
  for (const auto& [field, unit] : kFields) {
    if (&unit != last) {
      if (last) text += '\n';
      lineStart = text.size();
      text += "  " + std::string(unit.name) + ", steps of " + unit.stepText + ":";
      last = &unit;
    } else if (text.size() - lineStart + field.size() > kLine) {
      text += "\n   ";
      lineStart = text.size();
    }
    text += ' ';
    text += field;
  }
  return text + '\n';
}

}  // namespace velta_tool
