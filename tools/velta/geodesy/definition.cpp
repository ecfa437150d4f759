#include "geodesy/definition.h"

#include <algorithm>
#include <cmath>
#include <iterator>
#include <string_view>
#include <utility>

#include "conversion/message_fields.h"
#include "conversion/projection_conversion.h"
#include "conversion/projection_types.h"
#include "orxutils/orx_string.h"

namespace velta_tool {
namespace {

namespace velta = orx::cs::velta;

constexpr std::pair<std::string_view, double Projection::*> kFields[] = {
    {"laNO", &Projection::latitude},       {"laFO", &Projection::latitude},
    {"laPC", &Projection::latitude},       {"loNO", &Projection::longitude},
    {"loFO", &Projection::longitude},      {"loPC", &Projection::longitude},
    {"addSNO", &Projection::scale},        {"addSIL", &Projection::scale},
    {"fe", &Projection::falseEasting},     {"efo", &Projection::falseEasting},
    {"epc", &Projection::falseEasting},    {"fn", &Projection::falseNorthing},
    {"nfo", &Projection::falseNorthing},   {"npc", &Projection::falseNorthing},
    {"laSP1", &Projection::firstParallel}, {"laSP2", &Projection::secondParallel},
    {"azIL", &Projection::azimuth},
};

/// Sets the parameter that a message's field is.
void Set(Projection& projection, std::string_view field, double value) {
  const auto* const found = std::find_if(std::begin(kFields), std::end(kFields),
                                         [=](const auto& known) { return known.first == field; });
  projection.*found->second = value;
}

/// Sets the parameters that a message has.
template <class Message>
Projection FromMessage(const Message& message, std::uint32_t type) {
  Projection projection;
  projection.type = static_cast<ProjectionType>(type);
  double numbers[orx::cs::projmath::TGeoProj::kMaxParameters] = {};
  VisitProjection(message, numbers,
                  [&](const char* field, auto integer, double, const velta::Scaling& scaling) {
                    Set(projection, field, scaling.toNumber(static_cast<double>(integer)));
                  });
  return projection;
}

/// Sets the parameters that an entry has.
/// \param kind a message of the projection's type
/// \return the stored parameter behind the last
template <class Message>
const double* SetStored(Projection& projection, const Message& kind, const double* parameters) {
  return VisitProjection(kind, parameters,
                         [&](const char* field, auto, double number, const velta::Scaling&) {
                           Set(projection, field, number);
                         });
}

/// A message has not the fields that another's types need.
void RefuseType(Projection& projection, unsigned message) {
  projection.problem =
      "projection type " + std::to_string(projection.type) + " in a " + std::to_string(message);
}

/// What is wrong with the settings of a grid; empty when nothing is.
std::string ProblemOf(const ResidualGrid& grid) {
  const auto isKnown = [](int method) { return method >= kBilinear && method <= kSpline; };
  const auto reserved = [](int method) {
    return "interpolation method " + std::to_string(method) + " is reserved";
  };
  if (grid.horShift && !isKnown(grid.horInterpolation)) return reserved(grid.horInterpolation);
  if (grid.vertShift && !isKnown(grid.vertInterpolation)) return reserved(grid.vertInterpolation);
  const bool isApplied = grid.horShift || grid.vertShift;
  const bool hasExtent = grid.area.northExtent > 0 && grid.area.eastExtent > 0;
  return isApplied && !hasExtent ? "a grid without extent" : "";
}

}  // namespace

bool IsBounded(const Definition& definition) {
  return std::any_of(definition.areas.begin(), definition.areas.end(), [](const DatumArea& held) {
    return held.area.northExtent < velta::kWholeLatitude ||
           held.area.eastExtent < velta::kWholeLongitude;
  });
}

std::size_t AddShift(const velta::DatumData& datum, std::vector<DatumShift>& shifts) {
  DatumShift shift{{datum.sourceEllipsoid.a, datum.sourceEllipsoid.second},
                   {datum.targetEllipsoid.a, datum.targetEllipsoid.second},
                   {},
                   datum.computationIndicator,
                   datum.heightIndicator};
  std::copy_n(datum.parameters, shift.parameters.size(), shift.parameters.begin());
  // Mostly the one that came last.
  const auto known = std::find(shifts.rbegin(), shifts.rend(), shift);
  if (known != shifts.rend()) return static_cast<std::size_t>(shifts.rend() - known) - 1;
  shifts.push_back(shift);
  return shifts.size() - 1;
}

ResidualGrid MakeGrid(std::string entry, const velta::TableData& table) {
  const double(&bounds)[6] = table.bounds;
  ResidualGrid grid{std::move(entry),
                    "",
                    {bounds[0], bounds[1], bounds[2], bounds[3]},
                    table.horShift,
                    table.vertShift,
                    table.horInterpolation,
                    table.vertInterpolation,
                    {},
                    {},
                    {},
                    {table.meanValue[0], table.meanValue[1], table.meanValue[2]}};
  for (std::size_t i = 0; i < grid.north.size(); ++i) {
    grid.north[i] = table.meanValue[0] + table.dNdLatData[i];
    grid.east[i] = table.meanValue[1] + table.dEdLonData[i];
    grid.height[i] = table.meanValue[2] + table.dHData[i];
  }
  grid.problem = ProblemOf(grid);
  return grid;
}

Projection ProjectionOf(const velta::Rtcm1025& message) {
  Projection projection = FromMessage(message, message.projectionType);
  const bool isOfOthers =
      projection.type == ProjectionType::LCC2SP || projection.type == ProjectionType::OM;
  if (isOfOthers) RefuseType(projection, 1025);
  if (projection.type == ProjectionType::MC) {
    projection.scale = velta::kScaleFactor.toNumber(static_cast<double>(message.addSNO));
  }
  return projection;
}

Projection ProjectionOf(const velta::Rtcm1026& message) {
  Projection projection = FromMessage(message, message.projectionType);
  if (projection.type != ProjectionType::LCC2SP) RefuseType(projection, 1026);
  return projection;
}

Projection ProjectionOf(const velta::Rtcm1027& message) {
  Projection projection = FromMessage(message, velta::TypeCodeOf(message));
  if (message.projectionType != ProjectionType::OM) RefuseType(projection, 1027);
  projection.skew =
      projection.azimuth + velta::kProjectionAngle.toNumber(static_cast<double>(message.diffARSG));
  return projection;
}

Projection StoredProjectionOf(const std::wstring& type, const double* parameters) {
  Projection projection;
  projection.type = velta::FirstCodeOf(type);
  switch (projection.type) {
    case ProjectionType::NONE:
    case ProjectionType::LCC1SP:
      projection.problem = "the type \"" + orx::ToUtf8(type) + "\" is not kept in files";
      return projection;
    case ProjectionType::OM:
    case ProjectionType::ROM: {
      const double* const end = SetStored(projection, velta::Rtcm1027(), parameters);
      if (projection.type == ProjectionType::ROM) projection.skew = *end;
      return projection;
    }
    default: {
      velta::Rtcm1025 kind;
      kind.projectionType = projection.type;
      SetStored(projection, kind, parameters);
      return projection;
    }
  }
}

}  // namespace velta_tool
