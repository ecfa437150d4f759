#pragma once

#include "orxutils/orx_string.h"
#include "store/key_values.h"

/// What RTCM datum and projection files hold: the names, kinds and sizes of their values, each once
/// for writers and readers. A file's root holds one container key, which holds the entries.
namespace orx::cs::velta::layout {

using Text = ValueOf<COrxStringT<wchar_t>>;

// Container key of a datum file.
inline constexpr Text kContainerDatum{L"rtcm_datumName"};

// Container key of a projection file.
inline constexpr Text kContainerProjection{L"rtcm_projectionName"};
inline constexpr ValueOf<unsigned int> kSystemId{L"system_identification_number"};

// Entry.
inline constexpr ValueOf<unsigned short> kVersion{L"Version"};
inline constexpr unsigned short kEntryVersion = 256;

// Sub-key of a datum entry.
inline constexpr const wchar_t* kStandardDatum = L"StandardDatum";
/// Semi-major and semi-minor axis, metres; of the target system in a datum entry. In "StandardPrj"
/// the two numbers of the projection's ellipsoid.
inline constexpr DoublesOf<2> kEllipsoid{L"Ellipsoid"};
inline constexpr ValueOf<BinaryType<unsigned int>> kMethod{L"StandardMethod"};
/// As in DatumData.
inline constexpr DoublesOf<13> kDatumParameters{L"DatumStandardParameters"};
inline constexpr Text kSourceDatumName{L"RTCMRefDatumName"};
inline constexpr DoublesOf<2> kSourceEllipsoid{L"RefEllipsoid"};
/// South edge, extent in latitude, west edge, extent in longitude, radians.
inline constexpr DoublesOf<4> kValidityArea{L"BoundariesStandardDatum"};
inline constexpr ValueOf<signed char> kHeightIndicator{L"HtIndicator"};

// Sub-key of a projection entry.
inline constexpr const wchar_t* kStandardProjection = L"StandardPrj";
inline constexpr Text kProjectionName{L"RTCMProjName"};
inline constexpr Text kDatumName{L"DatumName"};
inline constexpr Text kProjectionType{L"PrjType"};
inline constexpr DoublesOf<16> kProjectionParameters{L"PrjStandardParameters"};

/// Sub-key of an entry with its residual grid: what differs between the two files.
struct ResidualGrid {
  const wchar_t* key;
  /// South edge, north extent, west edge, east extent, north step, east step.
  DoublesOf<6> boundaries;
};
inline constexpr ResidualGrid kDatumGrid{L"TargetDatum", {L"BoundariesTargetDatum"}};   // radians
inline constexpr ResidualGrid kProjectionGrid{L"TableProj", {L"BoundariesTableProj"}};  // metres

inline constexpr ValueOf<int> kRows{L"NRowsT"};
inline constexpr ValueOf<int> kColumns{L"NColsT"};
inline constexpr ValueOf<bool> kHorShift{L"DoApplyHorShiftsForAreaIndex"};
inline constexpr ValueOf<bool> kVertShift{L"DoApplyVertShiftsForAreaIndex"};
inline constexpr ValueOf<signed char> kHorInterpolation{L"HorInterpolationForAreaIndex"};
inline constexpr ValueOf<signed char> kVertInterpolation{L"VertInterpolationForAreaIndex"};
inline constexpr DoublesOf<3> kMeans{L"dMeanValue"};
/// As many as there are points; 16 are written.
inline constexpr DoublesOf<16> kNorthResiduals{L"dNdLatData"};
inline constexpr DoublesOf<16> kEastResiduals{L"dEdLonData"};
inline constexpr DoublesOf<16> kHeightResiduals{L"dHData"};

}  // namespace orx::cs::velta::layout
