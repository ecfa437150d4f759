#pragma once

#include <cstdint>

/// \file
/// The units of the messages' integers (RTCM 10403, data fields 152 to 211), in the units of the
/// descriptions. Their digits are binding: results agree with other users of the files to the last
/// bit.
namespace orx::cs::velta {

// Angles of datums and grids.
inline constexpr double kTwoArcSeconds = 9.69627362219072e-06;  ///< radians
inline constexpr double kArcSecond = 4.84813681109536e-06;      ///< radians
inline constexpr double kHalfArcSecond = 2.42406840554768e-06;  ///< radians

// Datum messages.
inline constexpr double kAxisResolution = 0.001;         ///< of a semi-axis, metres
inline constexpr double kSemiMajorAxisBase = 6370000.0;  ///< what is added to `addAs`, metres
inline constexpr double kSemiMinorAxisBase = 6350000.0;  ///< what is added to `addBs`, metres
inline constexpr double kTranslationResolution = 0.001;  ///< also of the rotation point, metres
inline constexpr double kRotationResolution = 0.00002;   ///< arc-seconds
inline constexpr double kScaleResolution = 0.00001;      ///< ppm

/// The whole range of latitude, radians: what an extent of 0 means, and one that is too large for a
/// message.
inline constexpr double kWholeLatitude = 3.141592653589793;
inline constexpr double kWholeLongitude = 6.283185307179586;  ///< the same for longitudes, radians
inline constexpr std::uint32_t kLargestExtent = 32766;  ///< that a message can hold, 2 arc-seconds

// Residual grids.
inline constexpr double kMeanAngleResolution = 0.001;        ///< arc-seconds
inline constexpr double kMeanAngleUnits = 1000.0;            ///< of them in an arc-second
inline constexpr double kResidualAngleResolution = 0.00003;  ///< arc-seconds
inline constexpr double kMeanLengthResolution = 0.01;        ///< metres
inline constexpr double kResidualLengthResolution = 0.001;   ///< metres
inline constexpr std::uint32_t kPlaneGridResolution = 10;    ///< metres
/// Steps from the first to the last of the 4 points in a row.
inline constexpr std::uint32_t kGridSteps = 3;

// Projection messages.
inline constexpr double kProjectionAngleResolution = 1.1e-8;   ///< degrees
inline constexpr double kProjectionLengthResolution = 0.001;   ///< metres
inline constexpr double kProjectionScaleResolution = 0.00001;  ///< ppm
inline constexpr double kProjectionScaleBase = 993000.0;       ///< what is added to a scale, ppm
inline constexpr double kPpm = 0.000001;                       ///< as a ratio

/// Computation indicator of Molodenski-Badekas, the last one there is.
inline constexpr std::uint32_t kMolodenskiBadekas = 3;

}  // namespace orx::cs::velta
