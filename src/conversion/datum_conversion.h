#pragma once

#include "orxutils/orx_string.h"
#include "projmath/rect_rgn.h"
#include "velta/datum_data.h"
#include "velta/rtcm_messages.h"

/// Between the fields of a datum message and a datum in radians and metres.
namespace orx::cs::velta {

/// A target name as a file name: what is neither letter nor digit becomes "_", then every run of
/// equal characters one character.
COrxStringT<wchar_t> CleanDatumName(const COrxStringT<char>& targetName);

/// A source name that contains WGS84, ETRS89 or ITRF becomes just that.
COrxStringT<wchar_t> NormaliseSourceName(const COrxStringT<char>& sourceName);

/// The region of a tectonic plate, empty for a number that is none.
COrxStringT<wchar_t> RegionOfPlate(std::uint32_t plateNumber);

/// Each conversion, then its reverse, in which numbers become integers toward zero.
void ConvertEllipsoids(const RtcmBasicTransformMessage& message, DatumData& datum);
void ConvertEllipsoids(const DatumData& datum, RtcmBasicTransformMessage& message);
void ConvertParameters(const RtcmBasicTransformMessage& message, DatumData& datum);
void ConvertParameters(const DatumData& datum, RtcmBasicTransformMessage& message);
void ConvertRotationPoint(const Rtcm1022& message, DatumData& datum);
void ConvertRotationPoint(const DatumData& datum, Rtcm1022& message);
/// The area of validity; into a datum, its centre, too.
void ConvertValidityArea(const RtcmBasicTransformMessage& message, DatumData& datum);
void ConvertValidityArea(const projmath::TRectRgn& area, RtcmBasicTransformMessage& message);

/// The name of a datum's entry: one for each area of validity and residual grid.
/// \param grid null when there is none
COrxStringT<wchar_t> DatumEntryName(const RtcmBasicTransformMessage& message, const Rtcm1023* grid);

}  // namespace orx::cs::velta
