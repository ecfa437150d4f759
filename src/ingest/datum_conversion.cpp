#include "ingest/datum_conversion.h"

#include <algorithm>
#include <iterator>
#include <string>

#include "records/message_units.h"

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

projmath::Ellipsoid EllipsoidOf(std::uint32_t addA, std::uint32_t addB) {
  return projmath::Ellipsoid::FromAxes(addA * kAxisResolution + kSemiMajorAxisBase,
                                       addB * kAxisResolution + kSemiMinorAxisBase);
}

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
  datum.sourceEllipsoid = EllipsoidOf(message.addAs, message.addBs);
  datum.targetEllipsoid = EllipsoidOf(message.addAt, message.addBt);
}

void ConvertParameters(const RtcmBasicTransformMessage& message, DatumData& datum) {
  datum.parameters[0] = message.dX * kTranslationResolution;
  datum.parameters[1] = message.dY * kTranslationResolution;
  datum.parameters[2] = message.dZ * kTranslationResolution;
  datum.parameters[3] = message.r1 * kRotationResolution;
  datum.parameters[4] = message.r2 * kRotationResolution;
  datum.parameters[5] = message.r3 * kRotationResolution;
  datum.parameters[6] = message.dS * kScaleResolution;
}

void ConvertRotationPoint(const Rtcm1022& message, DatumData& datum) {
  datum.parameters[7] = static_cast<double>(message.xp) * kTranslationResolution;
  datum.parameters[8] = static_cast<double>(message.yp) * kTranslationResolution;
  datum.parameters[9] = static_cast<double>(message.zp) * kTranslationResolution;
}

void ConvertValidityArea(const RtcmBasicTransformMessage& message, DatumData& datum) {
  const double latitude = message.phiV;
  const double longitude = message.lambdaV;
  const double latitudeExtent = message.dPhiV;
  const double longitudeExtent = message.dLambdaV;
  datum.validityCentre[0] = latitude * kTwoArcSeconds;
  datum.validityCentre[1] = longitude * kTwoArcSeconds;
  datum.validityArea[0] = (latitude - latitudeExtent / 2) * kTwoArcSeconds;
  datum.validityArea[1] = message.dPhiV == 0 ? kWholeLatitude : latitudeExtent * kTwoArcSeconds;
  datum.validityArea[2] = (longitude - longitudeExtent / 2) * kTwoArcSeconds;
  datum.validityArea[3] =
      message.dLambdaV == 0 ? kWholeLongitude : longitudeExtent * kTwoArcSeconds;
}

COrxStringT<wchar_t> DatumEntryName(const RtcmBasicTransformMessage& message,
                                    const Rtcm1023* grid) {
  COrxStringT<wchar_t> name =
      L"S_" + std::to_wstring(message.phiV) + L"_" + std::to_wstring(message.lambdaV);
  if (grid) name += L"_T_" + std::to_wstring(grid->phi0) + L"_" + std::to_wstring(grid->lambda0);
  return name;
}

}  // namespace orx::cs::velta
