#pragma once

#include <functional>
#include <optional>
#include <string>
#include <string_view>

#include "geodesy/definition.h"

/// A definition in the forms of other programs.
namespace velta_tool {

/// False in a build that writes only what PROJ has no part in: no WKT and no GeoTIFF.
extern const bool kHasProj;

/// Tells what a form cannot say, by name.
using TellLeftOut = std::function<void(std::string_view what)>;

/// The names under which PROJ finds grids; empty: none.
struct GridFiles {
  std::string horizontal;
  std::string vertical;
};

/// A pipeline for cct and every user of PROJ, a step a line: latitude, longitude in degrees and
/// height in, easting, northing and height out, or longitude and latitude.
/// \param shift index of the one that is meant
std::string ProjPipeline(const Definition& definition, std::size_t shift, const GridFiles& grids,
                         const TellLeftOut& tell);

/// Areas, grids and their points, by RFC 7946.
std::string GeoJson(const Definition& definition, const TellLeftOut& tell);

/// A bound or a projected coordinate reference system in WKT 2 of 2019.
std::string Wkt(const Definition& definition, std::size_t shift, const TellLeftOut& tell);

/// The residual grids as GeoTIFF grids of PROJ, joined where they share points.
struct GridTiffs {
  std::string horizontal;  ///< the bytes of a file; empty when no grid applies horizontally
  std::string vertical;    ///< likewise
};
GridTiffs MakeGridTiffs(const Definition& definition, const TellLeftOut& tell);

}  // namespace velta_tool
