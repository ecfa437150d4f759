#include "geodesy/residuals.h"

#include <algorithm>
#include <array>
#include <cmath>

#include "description.h"

namespace velta_tool {
namespace {

/// How much each of the points in a row or a column counts.
using Weights = std::array<double, kGridPoints>;

/// The place of a position between the points, and which it is between.
struct Place {
  std::size_t cell;  ///< number of the point in front
  double share;      ///< of the way to the next, 0 to 1
};

Place PlaceOf(double steps) {
  const double inside = std::clamp(steps, 0.0, double{kGridPoints - 1});
  const double cell = std::min(std::floor(inside), double{kGridPoints - 2});
  return {static_cast<std::size_t>(cell), inside - cell};
}

Weights Bilinear(const Place& place) {
  Weights weights = {};
  weights[place.cell] = 1 - place.share;
  weights[place.cell + 1] = place.share;
  return weights;
}

/// The parabola through the nearest three points.
Weights Biquadratic(const Place& place) {
  const double steps = static_cast<double>(place.cell) + place.share;
  const std::size_t middle = std::clamp(steps, 1.0, 2.0) < 1.5 ? 1 : 2;
  const double t = steps - static_cast<double>(middle);
  Weights weights = {};
  weights[middle - 1] = t * (t - 1) / 2;
  weights[middle] = 1 - t * t;
  weights[middle + 1] = t * (t + 1) / 2;
  return weights;
}

/// The natural cubic spline: its second derivatives, 0 at the ends, are the solutions of
/// 4 m1 + m2 = 6 (y0 - 2 y1 + y2) and m1 + 4 m2 = 6 (y1 - 2 y2 + y3).
Weights Spline(const Place& place) {
  const double t = place.share;
  const double inFront = ((1 - t) * (1 - t) * (1 - t) - (1 - t)) / 6;
  const double behind = (t * t * t - t) / 6;
  Weights weights = Bilinear(place);
  for (std::size_t i = 0; i < weights.size(); ++i) {
    Weights y = {};
    y[i] = 1;
    const double first = 6 * (y[0] - 2 * y[1] + y[2]);
    const double second = 6 * (y[1] - 2 * y[2] + y[3]);
    const Weights derivatives = {0, (4 * first - second) / 15, (4 * second - first) / 15, 0};
    weights[i] += inFront * derivatives[place.cell] + behind * derivatives[place.cell + 1];
  }
  return weights;
}

Weights WeightsOf(int method, const Place& place) {
  if (method == kBiquadratic) return Biquadratic(place);
  return method == kSpline ? Spline(place) : Bilinear(place);
}

/// A part of a grid, interpolated.
double Sum(const ResidualGrid::Points& points, const Weights& rows, const Weights& columns) {
  double sum = 0;
  for (std::size_t row = 0; row < rows.size(); ++row) {
    double sumOfRow = 0;
    for (std::size_t column = 0; column < columns.size(); ++column) {
      sumOfRow += columns[column] * points[row * kGridPoints + column];
    }
    sum += rows[row] * sumOfRow;
  }
  return sum;
}

}  // namespace

Residuals Interpolate(const ResidualGrid& grid, double north, double east, bool isPlane) {
  constexpr double kFullTurn = 2 * kPi;
  const auto& [south, northExtent, west, eastExtent] = grid.area;
  const double middle = eastExtent / 2;
  double fromMiddle = east - (west + middle);
  if (!isPlane) fromMiddle = std::remainder(fromMiddle, kFullTurn);
  const Place row = PlaceOf((south + northExtent - north) / grid.NorthStep());
  const Place column = PlaceOf((fromMiddle + middle) / grid.EastStep());
  Residuals residuals;
  if (grid.horShift) {
    const Weights rows = WeightsOf(grid.horInterpolation, row);
    const Weights columns = WeightsOf(grid.horInterpolation, column);
    residuals.north = Sum(grid.north, rows, columns);
    residuals.east = Sum(grid.east, rows, columns);
  }
  if (grid.vertShift) {
    residuals.height = Sum(grid.height, WeightsOf(grid.vertInterpolation, row),
                           WeightsOf(grid.vertInterpolation, column));
  }
  return residuals;
}

}  // namespace velta_tool
