#pragma once

#include <memory>
#include <vector>

#include "orxutils/orx_string.h"
#include "velta/projection_data.h"
#include "velta/rtcm_messages.h"

/// Between the fields of a projection message and a projection in degrees and metres.
namespace orx::cs::velta {

/// Makes the projection object of a type and sets `prjType` where the type has a type string.
/// \param a semi-major axis of the ellipsoid, metres
/// \param second the ellipsoid's second defining value
/// \return null for a type that is not supported, and when memory is out
std::unique_ptr<projmath::TGeoProj> CreateProjection(ProjectionData& projection, int typeCode,
                                                     double a, double second);

/// The type code of what a 1027 describes: the oblique Mercator may be the rectified one.
std::uint32_t TypeCodeOf(const Rtcm1027& message);

/// The parameters by index: degrees, metres, plain ratios.
std::vector<double> ParametersOf(const Rtcm1025& message);
std::vector<double> ParametersOf(const Rtcm1027& message);

/// Sets the fields of a message from all parameters by index, toward zero.
/// \param message has its type, or its rectification flag
void SetParameters(const double (&parameters)[16], Rtcm1025& message);
void SetParameters(const double (&parameters)[16], Rtcm1027& message);

/// The name of a projection's entry: one for each origin and plane grid.
/// \param grid null when there is none
COrxStringT<wchar_t> ProjectionEntryName(const Rtcm1025& message, const Rtcm1024* grid);
COrxStringT<wchar_t> ProjectionEntryName(const Rtcm1027& message, const Rtcm1024* grid);

}  // namespace orx::cs::velta
