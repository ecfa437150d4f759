#pragma once

#include "orxutils/orx_string.h"
#include "velta/datum_data.h"
#include "velta/rtcm_messages.h"

/// From the fields of a datum message to a datum in radians and metres.
namespace orx::cs::velta {

/// A target name as a file name: what is neither letter nor digit becomes "_", then every run of
/// equal characters one character.
COrxStringT<wchar_t> CleanDatumName(const COrxStringT<char>& targetName);

/// A source name that contains WGS84, ETRS89 or ITRF becomes just that.
COrxStringT<wchar_t> NormaliseSourceName(const COrxStringT<char>& sourceName);

/// The region of a tectonic plate, empty for a number that is none.
COrxStringT<wchar_t> RegionOfPlate(std::uint32_t plateNumber);

void ConvertEllipsoids(const RtcmBasicTransformMessage& message, DatumData& datum);
void ConvertParameters(const RtcmBasicTransformMessage& message, DatumData& datum);
void ConvertRotationPoint(const Rtcm1022& message, DatumData& datum);
/// Sets the area of validity and its centre.
void ConvertValidityArea(const RtcmBasicTransformMessage& message, DatumData& datum);

/// The name of a datum's entry: one for each area of validity and residual grid.
/// \param grid null when there is none
COrxStringT<wchar_t> DatumEntryName(const RtcmBasicTransformMessage& message, const Rtcm1023* grid);

}  // namespace orx::cs::velta
