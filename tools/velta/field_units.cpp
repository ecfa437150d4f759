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
#include <vector>

#include "angle.h"
#include "conversion/message_fields.h"
#include "description.h"
#include "orxutils/orx_string.h"
#include "rtcm3/fields.h"

namespace velta_tool {
namespace rtcm3 = orx::cs::velta::rtcm3;
namespace velta = orx::cs::velta;
namespace {

constexpr double kArcSecondsPerRadian = kDegreesPerRadian * 3600;
constexpr std::string_view kDegrees = "degrees";

/// How the numbers of a scaling are shown.
struct Unit {
  const velta::Scaling* scaling;
  std::string_view name;
  const char* step;      ///< of the field, for people
  double perNumber = 1;  ///< from the unit of the description

  double Shown(double integer) const { return scaling->toNumber(integer) * perNumber; }
};
constexpr Unit kUnits[] = {
    {&velta::kAreaAngle, kDegrees, "2 arc-seconds", kDegreesPerRadian},
    {&velta::kGridAngle, kDegrees, "0.5 arc-seconds", kDegreesPerRadian},
    {&velta::kProjectionAngle, kDegrees, "1.1e-8"},
    {&velta::kGridSpacing, "arc-seconds", "0.5", kArcSecondsPerRadian},
    {&velta::kRotation, "arc-seconds", "0.00002"},
    {&velta::kMeanAngle, "arc-seconds", "0.001", kArcSecondsPerRadian},
    {&velta::kResidualAngle, "arc-seconds", "0.00003", kArcSecondsPerRadian},
    {&velta::kScaleCorrection, "ppm", "0.00001"},
    {&velta::kTranslation, "metres", "0.001"},
    {&velta::kSemiMajorAxis, "metres", "0.001 from 6370000"},
    {&velta::kSemiMinorAxis, "metres", "0.001 from 6350000"},
    {&velta::kPlaneGridLength, "metres", "10"},
    {&velta::kMeanLength, "metres", "0.01"},
    {&velta::kResidualLength, "metres", "0.001"},
    {&velta::kProjectionLength, "metres", "0.001"},
    {&velta::kScaleFactor, "factor", "1e-11 from 0.993"},
};

/// A field that is no code, count or day.
struct FieldUnit {
  std::string_view field;
  const Unit* unit;
};

/// Every scaled field once.
std::vector<FieldUnit> ScaledFields() {
  std::vector<FieldUnit> fields;
  const auto add = [&fields](std::string_view field, auto, double, const auto& scaling) {
    const auto isKnown = [&](const FieldUnit& known) { return known.field == field; };
    if (std::any_of(fields.begin(), fields.end(), isKnown)) return;
    const Unit* const unit = std::find_if(std::begin(kUnits), std::end(kUnits),
                                          [&](const Unit& u) { return u.scaling == &scaling; });
    if (unit != std::end(kUnits)) fields.push_back({field, unit});
  };
  const velta::DatumData datum;
  const velta::Rtcm1022 datumMessage;
  VisitValidityArea(datumMessage, datum, add);
  VisitParameters(datumMessage, datum, add);
  VisitRotationPoint(datumMessage, datum, add);
  VisitEllipsoids(datumMessage, datum, add);
  const auto addGrid = [&](const auto& message) {
    VisitGridCentre(message, datum.grid, add);
    VisitGridSpacing(message, datum.grid, add);
    VisitResiduals(message, datum.grid, add);
  };
  addGrid(velta::Rtcm1023());
  addGrid(velta::Rtcm1024());
  const double parameters[orx::cs::projmath::TGeoProj::kMaxParameters] = {};
  const velta::Rtcm1025 projection;
  const velta::Rtcm1026 twoParallels;
  const velta::Rtcm1027 oblique;
  VisitProjection(projection, parameters, add);
  VisitProjection(twoParallels, parameters, add);
  VisitProjection(oblique, parameters, add);
  add("diffARSG", oblique.diffARSG, 0, velta::kProjectionAngle);
  return fields;
}

const Unit* UnitOf(std::string_view field) {
  static const std::vector<FieldUnit> fields = ScaledFields();
  const auto found = std::find_if(fields.begin(), fields.end(),
                                  [&](const auto& known) { return known.field == field; });
  return found == fields.end() ? nullptr : found->unit;
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
  const double value = unit.Shown(static_cast<double>(integer));
  if (dms && unit.name == kDegrees) return nlohmann::json(DegreesMinutesSeconds(value)).dump();
  return DecimalText(value, unit.Shown(1) - unit.Shown(0));
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
  const std::vector<FieldUnit> fields = ScaledFields();
  std::string text;
  for (const Unit& unit : kUnits) {
    std::string line = "  " + std::string(unit.name) + ", steps of " + unit.step + ":";
    for (const FieldUnit& scaled : fields) {
      if (scaled.unit != &unit) continue;
      if (line.size() + scaled.field.size() > kLine) {
        text += line + '\n';
        line = "   ";
      }
      line.append(" ").append(scaled.field);
    }
    text += line + '\n';
  }
  return text;
}

}  // namespace velta_tool
