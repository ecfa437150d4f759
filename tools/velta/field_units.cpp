#include "field_units.h"

#include <algorithm>
#include <array>
#include <cstdio>
#include <nlohmann/json.hpp>
#include <string_view>
#include <utility>
#include <variant>
#include <vector>

#include "angle.h"
#include "conversion/message_fields.h"
#include "decimal.h"
#include "description.h"
#include "orxutils/orx_string.h"
#include "rtcm3/fields.h"

namespace velta_tool {
namespace rtcm3 = orx::cs::velta::rtcm3;
namespace velta = orx::cs::velta;
namespace {

/// How the numbers of a scaling are shown.
struct Unit {
  const velta::Scaling* scaling;
  std::string_view name;
  double perNumber = 1;  ///< from the unit of the description

  double Shown(double integer) const { return scaling->toNumber(integer) * perNumber; }
  double Step() const { return Shown(1) - Shown(0); }
};
constexpr Unit kUnits[] = {
    {&velta::kAreaAngle, kDegrees, kDegreesPerRadian},
    {&velta::kGridAngle, kDegrees, kDegreesPerRadian},
    {&velta::kProjectionAngle, kDegrees},
    {&velta::kGridSpacing, "arc-seconds", kArcSecondsPerRadian},
    {&velta::kRotation, "arc-seconds"},
    {&velta::kMeanAngle, "arc-seconds", kArcSecondsPerRadian},
    {&velta::kResidualAngle, "arc-seconds", kArcSecondsPerRadian},
    {&velta::kScaleCorrection, "ppm"},
    {&velta::kTranslation, "metres"},
    {&velta::kSemiMajorAxis, "metres"},
    {&velta::kSemiMinorAxis, "metres"},
    {&velta::kPlaneGridLength, "metres"},
    {&velta::kMeanLength, "metres"},
    {&velta::kResidualLength, "metres"},
    {&velta::kProjectionLength, "metres"},
    {&velta::kScaleFactor, "factor"},
};

/// The step of a unit, and what its integers are added to.
std::string StepText(const Unit& unit) {
  constexpr int kDigits = 7;
  std::array<char, 64> text;
  std::snprintf(text.data(), text.size(), "%.*g", kDigits, unit.Step());
  std::string step = text.data();
  if (unit.Shown(0) == 0) return step;
  std::snprintf(text.data(), text.size(), "%.*g", kDigits, unit.Shown(0));
  return step + " from " + text.data();
}

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

std::string ValueText(const Unit& unit, std::int64_t integer, bool dms) {
  const double value = unit.Shown(static_cast<double>(integer));
  if (dms && unit.name == kDegrees) return nlohmann::json(DegreesMinutesSeconds(value)).dump();
  return ShortestText(value, unit.Step());
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
    std::string line = "  " + std::string(unit.name) + ", steps of " + StepText(unit) + ":";
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
