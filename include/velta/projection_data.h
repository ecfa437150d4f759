#pragma once

#include <cstdint>
#include <memory>

#include "orxutils/orx_string.h"
#include "projmath/geo_proj.h"
#include "velta/table_data.h"

namespace orx::cs::velta {

/// One map projection: its type, its parameters (degrees, metres, plain ratios), the names it
/// goes by and its plane residual grid.
struct ProjectionData {
  /// Projection types: the type codes of RTCM 3 (DF170), and one more of our own.
  enum projList {
    NONE = 0,    ///< no or unknown type
    TM = 1,      ///< Transverse Mercator
    TMS = 2,     ///< Transverse Mercator, south orientated
    LCC1SP = 3,  ///< Lambert Conic Conformal, one standard parallel; not supported
    LCC2SP = 4,  ///< Lambert Conic Conformal, two standard parallels; not supported
    LCCW = 5,    ///< Lambert Conic Conformal, west orientated; not supported
    CS = 6,      ///< Cassini-Soldner
    OM = 7,      ///< Oblique Mercator
    OS = 8,      ///< Oblique Stereographic
    MC = 9,      ///< Mercator
    PS = 10,     ///< Polar Stereographic
    DS = 11,     ///< Double Stereographic; not supported
    ROM = 100    ///< Rectified Oblique Mercator
  };

  std::uint32_t systemId = 0;         ///< System Identification Number of the message
  COrxStringT<wchar_t> prjType;       ///< "TMERC", "LC", "CASSINI", "OM", "STER", "MERCATOR", "ROM"
  COrxStringT<wchar_t> rtcmProjName;  ///< also the base name of the projection's file
  COrxStringT<wchar_t> datumName;     ///< datum that the projection belongs to
  COrxStringT<wchar_t> regionName;    ///< region of the tectonic plate
  std::unique_ptr<projmath::TGeoProj> geoProj;  ///< parameters; null when there is no projection
  TableData table;                              ///< plane residual grid of a 1024
  bool has1024 = false;                         ///< the last message came with a 1024

  ProjectionData() = default;
  ProjectionData(const ProjectionData&) = delete;
  /// Leaves the other without a projection object.
  ProjectionData(ProjectionData&&) noexcept = default;
  ~ProjectionData() = default;

  /// Copies `rtcmProjName`, `table` and the projection's state; a target without a projection
  /// object gets a plain one. The other fields stay the target's.
  ProjectionData& operator=(const ProjectionData& other) {
    if (this == &other) return *this;
    rtcmProjName = other.rtcmProjName;
    table = other.table;
    if (!other.geoProj) geoProj.reset();
    if (!geoProj) geoProj = std::make_unique<projmath::TGeoProj>();
    if (other.geoProj) geoProj->CopyGeoProj(*other.geoProj);
    return *this;
  }
};

/// Cassini-Soldner and Mercator have no scale factor among their parameters, all other types of a
/// 1025 have one.
/// \param projectionType a type code of ProjectionData::projList
constexpr bool HasScaleFactor(std::uint32_t projectionType) {
  return projectionType != ProjectionData::CS && projectionType != ProjectionData::MC;
}

/// Summary of a projection for the caller's own list of projections.
struct CustomProjectionData {
  COrxStringT<wchar_t> projectionName;     ///< name that the projection goes by
  COrxStringT<wchar_t> projectionGroup;    ///< always "RTCM"
  COrxStringT<wchar_t> transformationDll;  ///< always "RTCMGridHost.dll"
  COrxStringT<wchar_t> datumName;          ///< datum that the projection belongs to
  COrxStringT<wchar_t> projectionType;     ///< as in `ProjectionData::prjType`
  COrxStringT<wchar_t> unitName;           ///< always "Meters"
};

}  // namespace orx::cs::velta
