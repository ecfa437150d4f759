#pragma once

/// \file
/// How datum and projection files are named, and where they are kept.
namespace orx::cs::velta {

inline constexpr const wchar_t* kDatumFileExtension = L".dff";       ///< of a datum file
inline constexpr const wchar_t* kProjectionFileExtension = L".prj";  ///< of a projection file

/// Below the user's geodetic directory: where datum files are kept unless another directory is
/// given.
inline constexpr const wchar_t* kDatumFolder = L"/datums/rtcmdata/";
/// The same for projection files.
inline constexpr const wchar_t* kProjectionFolder = L"/projections/rtcmdata/";

}  // namespace orx::cs::velta
