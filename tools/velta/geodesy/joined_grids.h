#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "geodesy/definition.h"

/// Residual grids of a file made into fewer and larger ones. Grids of the same steps, the points of
/// which fall on one another, are of one lattice; the others keep to themselves.
namespace velta_tool {

/// What of residual grids is joined: the residuals in the plane, or the heights.
struct GridPart {
  bool ResidualGrid::*applies;
  std::vector<ResidualGrid::Points ResidualGrid::*> values;
  double step;  ///< of a residual in a message: by so much values of the same point may differ
};

/// A point of one of the grids.
struct GridPoint {
  std::uint32_t grid;
  std::uint32_t point;
};

/// A rectangle of points, rows from north to south, each from west to east.
struct JoinedGrid {
  double north;  ///< of the first row, degrees
  double west;   ///< of the first column, degrees, within half a turn of 0
  double northStep;
  double eastStep;
  std::size_t columns;
  std::uint32_t firstGrid;  ///< of those that it is made of
  std::vector<GridPoint> points;
};

/// Two values of the same point.
struct Difference {
  GridPoint used;
  GridPoint other;
  double amount;  ///< of the values that differ most, in their unit
};

struct JoinedGrids {
  /// Of one lattice no two have a cell in common. In the order of their first grids.
  std::vector<JoinedGrid> grids;
  std::vector<Difference> differences;  ///< larger than a step
  std::size_t roundings = 0;            ///< points with differences up to a step
  double largestRounding = 0;
};

/// Joins what applies of a part. As in a transformation, a grid that holds a position ends the
/// search also when the part does not apply in it. Grids with a problem are passed over.
JoinedGrids JoinGrids(const std::vector<ResidualGrid>& grids, const GridPart& part);

/// The grids that have a part of their area in common with one of another lattice.
std::vector<std::uint32_t> GridsAcrossOthers(const std::vector<ResidualGrid>& grids);

}  // namespace velta_tool
