#include "ingest/projection_conversion.h"

#include <string>

#include "records/message_units.h"
#include "records/projection_types.h"

namespace orx::cs::velta {
namespace {

template <class Integer>
double Degrees(Integer angle) {
  return static_cast<double>(angle) * kProjectionAngleResolution;
}

template <class Integer>
double Metres(Integer length) {
  return static_cast<double>(length) * kProjectionLengthResolution;
}

template <class Integer>
double ScaleFactor(Integer addition) {
  return (static_cast<double>(addition) * kProjectionScaleResolution + kProjectionScaleBase) * kPpm;
}

COrxStringT<wchar_t> EntryName(std::int64_t latitude, std::int64_t longitude,
                               const Rtcm1024* grid) {
  COrxStringT<wchar_t> name = L"S_" + std::to_wstring(latitude) + L"_" + std::to_wstring(longitude);
  if (grid) name += L"_T_" + std::to_wstring(grid->north0) + L"_" + std::to_wstring(grid->east0);
  return name;
}

}  // namespace

std::unique_ptr<projmath::TGeoProj> CreateProjection(ProjectionData& projection, int typeCode,
                                                     double a, double second) {
  const ProjectionType* const type = FindProjectionType(typeCode);
  if (!type) return nullptr;
  projection.prjType = type->name;
  return type->make ? type->make(a, second) : nullptr;
}

std::vector<double> ParametersOf(const Rtcm1025& message) {
  std::vector<double> parameters = {Degrees(message.loNO)};
  if (HasScaleFactor(message.projectionType)) parameters.push_back(ScaleFactor(message.addSNO));
  parameters.insert(parameters.end(),
                    {Degrees(message.laNO), Metres(message.fe), Metres(message.fn)});
  return parameters;
}

std::vector<double> ParametersOf(const Rtcm1027& message) {
  std::vector<double> parameters = {Degrees(message.azIL), ScaleFactor(message.addSIL),
                                    Degrees(message.loPC), Degrees(message.laPC),
                                    Metres(message.epc),   Metres(message.npc)};
  if (message.rectificationFlag) {
    parameters.push_back(Degrees(message.azIL) + Degrees(message.diffARSG));
  }
  return parameters;
}

COrxStringT<wchar_t> ProjectionEntryName(const Rtcm1025& message, const Rtcm1024* grid) {
  return EntryName(message.laNO, message.loNO, grid);
}

COrxStringT<wchar_t> ProjectionEntryName(const Rtcm1027& message, const Rtcm1024* grid) {
  return EntryName(message.laPC, message.loPC, grid);
}

}  // namespace orx::cs::velta
