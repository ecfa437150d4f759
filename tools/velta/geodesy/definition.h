#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "projmath/rect_rgn.h"
#include "velta/datum_data.h"
#include "velta/projection_data.h"
#include "velta/rtcm_messages.h"

/// What a transformation is made of, in physical values: the entries of files, or message sets.
namespace velta_tool {

using orx::cs::projmath::TRectRgn;
using ProjectionType = orx::cs::velta::ProjectionData::projList;

/// How a position of the source system becomes one of the target system, residuals apart.
struct DatumShift {
  std::array<double, 2> sourceAxes;  ///< semi-major and semi-minor axis, metres
  std::array<double, 2> targetAxes;
  /// As in DatumData: metres, arc-seconds, ppm, metres.
  std::array<double, 10> parameters;
  std::uint32_t computationIndicator;
  std::uint32_t heightIndicator;

  bool operator==(const DatumShift&) const = default;
};

/// Computation indicators; the fourth is kMolodenskiBadekas.
inline constexpr std::uint32_t kLinearHelmert = 0;
inline constexpr std::uint32_t kStrictHelmert = 1;
inline constexpr std::uint32_t kAbridgedMolodenski = 2;

/// Height indicators: what the target's heights are, and what the residual is taken off.
inline constexpr std::uint32_t kGeometricHeight = 0;
inline constexpr std::uint32_t kPhysicalOfTarget = 1;
inline constexpr std::uint32_t kPhysicalOfSource = 2;

/// Where a datum shift is valid.
struct DatumArea {
  std::string entry;  ///< name of the entry that has it
  TRectRgn area;      ///< radians
  /// Index in Definition::shifts; nothing when the entry cannot be used.
  std::optional<std::size_t> shift;
};

/// The rows and columns of a residual grid.
inline constexpr int kGridPoints = 4;

/// A residual grid: 4 rows from north to south, each of 4 points from west to east.
struct ResidualGrid {
  using Points = std::array<double, std::size_t{kGridPoints} * kGridPoints>;

  std::string entry;    ///< name of the entry that has it
  std::string problem;  ///< why it cannot be used; empty when it can
  TRectRgn area;        ///< radians, of a plane grid metres
  bool horShift;        ///< horizontal residuals apply
  bool vertShift;       ///< height residuals apply
  int horInterpolation;
  int vertInterpolation;
  Points north;   ///< mean and residual, radians or metres
  Points east;    ///< likewise
  Points height;  ///< likewise, metres
  /// Of the north, east and height residuals; the points have them in.
  std::array<double, 3> means = {};

  double NorthStep() const { return area.northExtent / (kGridPoints - 1); }
  double EastStep() const { return area.eastExtent / (kGridPoints - 1); }
};

/// Interpolation indicators.
inline constexpr int kBilinear = 0;
inline constexpr int kBiquadratic = 1;
inline constexpr int kSpline = 2;

/// A map projection. Angles in degrees, lengths in metres; what the type does not have is 0.
struct Projection {
  std::string entry;    ///< name of the entry that has it
  std::string problem;  ///< why it cannot be used; empty when it can
  ProjectionType type = ProjectionType::NONE;
  double latitude = 0;   ///< of the natural or false origin, or of the centre
  double longitude = 0;  ///< likewise
  double scale = 1;
  double falseEasting = 0;  ///< at the natural or false origin, or at the centre
  double falseNorthing = 0;
  double firstParallel = 0;
  double secondParallel = 0;
  double azimuth = 0;  ///< of the initial line
  double skew = 0;     ///< angle from the rectified to the skew grid

  bool operator==(const Projection&) const = default;
};

/// The entries of files or message sets, in their order. Each list ends where the library ends its
/// search: in front of an entry whose area cannot be read.
struct Definition {
  std::string sourceName;  ///< of the system that positions are given in
  std::string targetName;
  std::vector<DatumShift> shifts;  ///< different from one another
  std::vector<DatumArea> areas;
  std::vector<ResidualGrid> grids;
  std::vector<ResidualGrid> planeGrids;
  std::optional<Projection> projection;
};

/// True when there are positions outside an area of validity.
bool IsBounded(const Definition& definition);

/// Adds a datum's shift, unless it is there.
/// \return its index in `shifts`
std::size_t AddShift(const orx::cs::velta::DatumData& datum, std::vector<DatumShift>& shifts);

/// A residual grid, with what is wrong with its settings as its problem.
/// \param entry name of its entry
ResidualGrid MakeGrid(std::string entry, const orx::cs::velta::TableData& table);

/// What a message describes.
Projection ProjectionOf(const orx::cs::velta::Rtcm1025& message);
Projection ProjectionOf(const orx::cs::velta::Rtcm1026& message);
Projection ProjectionOf(const orx::cs::velta::Rtcm1027& message);

/// What is stored in an entry.
/// \param type type string
/// \param parameters 16 of them
Projection StoredProjectionOf(const std::wstring& type, const double* parameters);

}  // namespace velta_tool
