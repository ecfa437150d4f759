#include "conversion/datum_conversion.h"

#include <algorithm>
#include <iterator>
#include <string>

#include "conversion/conversion_visitors.h"
#include "conversion/entry_name.h"

namespace orx::cs::velta {
namespace {

/// In the order in which they are looked for.
constexpr const wchar_t* kKnownSources[] = {L"WGS84", L"ETRS89", L"ITRF"};

/// By plate number; 0 is no plate.
constexpr const wchar_t* kRegions[] = {
    L"",         L"Africa",  L"Antarctica",    L"Arabia",       L"Australia",
    L"Caribbea", L"Cocos",   L"Europe",        L"India",        L"North America",
    L"Nazca",    L"Pacific", L"South America", L"Juan de Fuca", L"Philippine",
    L"Rivera",   L"Scotia"};

constexpr ToInteger<&ToUint32> kToInteger;

}  // namespace

COrxStringT<wchar_t> CleanDatumName(const COrxStringT<char>& targetName) {
  COrxStringT<wchar_t> name = Widen(targetName);
  std::replace_if(
      name.begin(), name.end(), [](wchar_t c) { return !IsLetterOrDigit(c); }, L'_');
  name.erase(std::unique(name.begin(), name.end()), name.end());
  return name;
}

COrxStringT<wchar_t> NormaliseSourceName(const COrxStringT<char>& sourceName) {
  COrxStringT<wchar_t> name = Widen(sourceName);
  for (const wchar_t* const known : kKnownSources) {
    if (name.find(known) != name.npos) return known;
  }
  return name;
}

COrxStringT<wchar_t> RegionOfPlate(std::uint32_t plateNumber) {
  return plateNumber < std::size(kRegions) ? kRegions[plateNumber] : L"";
}

void ConvertEllipsoids(const RtcmBasicTransformMessage& message, DatumData& datum) {
  VisitEllipsoids(message, datum, kToNumber);
  for (projmath::Ellipsoid* const ellipsoid : {&datum.sourceEllipsoid, &datum.targetEllipsoid}) {
    *ellipsoid = projmath::Ellipsoid::FromAxes(ellipsoid->a, ellipsoid->second);
  }
}

void ConvertEllipsoids(const DatumData& datum, RtcmBasicTransformMessage& message) {
  VisitEllipsoids(message, datum, kToInteger);
}

void ConvertParameters(const RtcmBasicTransformMessage& message, DatumData& datum) {
  VisitParameters(message, datum, kToNumber);
}

void ConvertParameters(const DatumData& datum, RtcmBasicTransformMessage& message) {
  VisitParameters(message, datum, kToInteger);
}

void ConvertRotationPoint(const Rtcm1022& message, DatumData& datum) {
  VisitRotationPoint(message, datum, kToNumber);
}

void ConvertRotationPoint(const DatumData& datum, Rtcm1022& message) {
  VisitRotationPoint(message, datum, kToInteger);
}

void ConvertValidityArea(const RtcmBasicTransformMessage& message, DatumData& datum) {
  VisitValidityArea(message, datum, kToNumber);
  const auto edge = [](double centre, double extent) {
    return kAreaAngle.toNumber(centre - extent / 2);
  };
  datum.validityArea[0] = edge(message.phiV, message.dPhiV);
  datum.validityArea[2] = edge(message.lambdaV, message.dLambdaV);
  if (message.dPhiV == 0) datum.validityArea[1] = kWholeLatitude;
  if (message.dLambdaV == 0) datum.validityArea[3] = kWholeLongitude;
}

void ConvertValidityArea(const projmath::TRectRgn& area, RtcmBasicTransformMessage& message) {
  const struct {
    double validityCentre[2];
    double validityArea[4];
  } place = {{area.south + area.northExtent * 0.5, area.west + area.eastExtent * 0.5},
             {area.south, area.northExtent, area.west, area.eastExtent}};
  VisitValidityArea(message, place, kToInteger);
  for (std::uint32_t* const extent : {&message.dPhiV, &message.dLambdaV}) {
    if (*extent > kLargestExtent) *extent = 0;
  }
}

COrxStringT<wchar_t> DatumEntryName(const RtcmBasicTransformMessage& message,
                                    const Rtcm1023* grid) {
  const COrxStringT<wchar_t> name = EntryName(message.phiV, message.lambdaV);
  return grid ? WithGrid(name, grid->phi0, grid->lambda0) : name;
}

}  // namespace orx::cs::velta
