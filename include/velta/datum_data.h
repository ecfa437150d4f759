#pragma once

#include <cstddef>
#include <cstdint>

#include "orxutils/orx_string.h"
#include "projmath/ellipsoid.h"
#include "velta/table_data.h"

namespace orx::cs::velta {

/// A datum transformation in physical units: angles in radians, lengths in metres.
struct DatumData {
  projmath::Ellipsoid sourceEllipsoid = projmath::Ellipsoid::Wgs84();  ///< of the source system
  projmath::Ellipsoid targetEllipsoid = projmath::Ellipsoid::Wgs84();  ///< of the target system
  COrxStringT<wchar_t> targetDatumName;  ///< also the base name of the datum's file
  COrxStringT<wchar_t> sourceDatumName;  ///< "WGS84", "ETRS89", "ITRF", or as received
  /// dX, dY, dZ (m); R1, R2, R3 (arc-seconds); dS (ppm); XP, YP, ZP of the rotation point (m);
  /// three that are always 0.
  double parameters[13] = {};
  /// Southern latitude, extent in latitude, western longitude, extent in longitude.
  double validityArea[4] = {};
  double validityCentre[2] = {};           ///< latitude, longitude
  std::uint32_t computationIndicator = 0;  ///< method, 0 to 3; 3 is Molodenski-Badekas
  std::uint32_t heightIndicator = 0;       ///< height indicator code, as received
  TableData grid;                          ///< ellipsoidal residual grid of a 1023
  /// Name under which the caller knows the datum's ellipsoid; empty until the caller sets it.
  COrxStringT<wchar_t> ellipsoidName;

  DatumData() = default;
  DatumData(const DatumData&) = default;
  DatumData(DatumData&&) noexcept = default;
  ~DatumData() = default;

  /// Copies every field but `ellipsoidName`, which the target keeps. Each ellipsoid is rebuilt
  /// from its two defining values with kind 0, of an assignment to itself, too.
  DatumData& operator=(const DatumData& other) {
    sourceEllipsoid = projmath::Ellipsoid::FromInverseFlattening(other.sourceEllipsoid.a,
                                                                 other.sourceEllipsoid.second);
    targetEllipsoid = projmath::Ellipsoid::FromInverseFlattening(other.targetEllipsoid.a,
                                                                 other.targetEllipsoid.second);
    targetDatumName = other.targetDatumName;
    sourceDatumName = other.sourceDatumName;
    CopyArray(parameters, other.parameters);
    CopyArray(validityArea, other.validityArea);
    CopyArray(validityCentre, other.validityCentre);
    computationIndicator = other.computationIndicator;
    heightIndicator = other.heightIndicator;
    grid = other.grid;
    return *this;
  }

 private:
  template <std::size_t N>
  static void CopyArray(double (&to)[N], const double (&from)[N]) {
    for (std::size_t i = 0; i < N; ++i) to[i] = from[i];
  }
};

/// Summary of a datum for the caller's own list of datums.
struct CustomDatumData {
  COrxStringT<wchar_t> ellipsoidName;      ///< as the caller named it; empty before
  COrxStringT<wchar_t> datumName;          ///< name of the target datum
  COrxStringT<wchar_t> datumGroup;         ///< always "RTCM"
  COrxStringT<wchar_t> transformationDll;  ///< always "RTCMGridHost.dll"
};

}  // namespace orx::cs::velta
