#include "conversion/projection_conversion.h"

#include "conversion/conversion_visitors.h"
#include "conversion/entry_name.h"
#include "conversion/projection_types.h"

namespace orx::cs::velta {
namespace {

constexpr int kMaxParameters = projmath::TGeoProj::kMaxParameters;

constexpr ToInteger<&ToLow32> kToInteger;

}  // namespace

std::unique_ptr<projmath::TGeoProj> CreateProjection(ProjectionData& projection, int typeCode,
                                                     double a, double second) {
  const ProjectionType* const type = FindProjectionType(typeCode);
  if (!type) return nullptr;
  projection.prjType = type->name;
  return type->make ? type->make(a, second) : nullptr;
}

std::uint32_t TypeCodeOf(const Rtcm1027& message) {
  const bool isRectified =
      message.rectificationFlag && message.projectionType == ProjectionData::OM;
  return isRectified ? std::uint32_t{ProjectionData::ROM} : message.projectionType;
}

std::vector<double> ParametersOf(const Rtcm1025& message) {
  double parameters[kMaxParameters];
  double* const end = VisitProjection(message, parameters, kToNumber);
  return std::vector<double>(parameters, end);
}

std::vector<double> ParametersOf(const Rtcm1027& message) {
  double parameters[kMaxParameters];
  double* end = VisitProjection(message, parameters, kToNumber);
  if (message.rectificationFlag) {
    *end++ = kProjectionAngle.toNumber(static_cast<double>(message.azIL)) +
             kProjectionAngle.toNumber(message.diffARSG);
  }
  return std::vector<double>(parameters, end);
}

void SetParameters(const double (&parameters)[16], Rtcm1025& message) {
  VisitProjection(message, parameters, kToInteger);
}

void SetParameters(const double (&parameters)[16], Rtcm1027& message) {
  const double* const end = VisitProjection(message, parameters, kToInteger);
  if (message.rectificationFlag) {
    message.diffARSG = ToInt32(kProjectionAngle.toInteger(*end - parameters[0]));
  }
}

COrxStringT<wchar_t> ProjectionEntryName(const Rtcm1025& message, const Rtcm1024* grid) {
  const COrxStringT<wchar_t> name = EntryName(message.laNO, message.loNO);
  return grid ? WithGrid(name, grid->north0, grid->east0) : name;
}

COrxStringT<wchar_t> ProjectionEntryName(const Rtcm1027& message, const Rtcm1024* grid) {
  const COrxStringT<wchar_t> name = EntryName(message.laPC, message.loPC);
  return grid ? WithGrid(name, grid->north0, grid->east0) : name;
}

}  // namespace orx::cs::velta
