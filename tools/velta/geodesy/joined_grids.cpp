#include "geodesy/joined_grids.h"

#include <algorithm>
#include <boost/geometry/geometries/box.hpp>
#include <boost/geometry/geometries/point.hpp>
#include <boost/geometry/index/rtree.hpp>
#include <cmath>
#include <tuple>
#include <utility>

#include "description.h"

namespace velta_tool {
namespace {

/// Messages have their points on multiples of it, so that sums of these units are exact.
constexpr double kUnitsPerDegree = 4 * 3600;
constexpr double kUnitsPerRadian = kUnitsPerDegree * kDegreesPerRadian;
constexpr double kTurn = 360 * kUnitsPerDegree;
constexpr std::int64_t kCells = kGridPoints - 1;  // in a row or a column

/// The lines of points that a grid's are among.
struct Lattice {
  double northStep;  ///< units
  double eastStep;
  double north;  ///< from the equator to the next row in the north
  double east;   ///< from the meridian of Greenwich to the next column in the east

  bool operator==(const Lattice&) const = default;
  bool operator<(const Lattice& other) const {
    return std::tie(northStep, eastStep, north, east) <
           std::tie(other.northStep, other.eastStep, other.north, other.east);
  }
};

/// A grid's place in its lattice.
struct Window {
  Lattice lattice;
  std::int64_t row;  ///< of the first point, counted to the south
  std::int64_t column;
  std::uint32_t grid;
};

/// A point, or the cell to the south-east of it.
struct Node {
  std::int64_t row;
  std::int64_t column;
  GridPoint of;
};
using Nodes = std::vector<Node>;

auto PlaceOf(const Node& node) { return std::pair(node.row, node.column); }

bool IsInFront(const Node& a, const Node& b) {
  return std::tuple(a.row, a.column, a.of.grid) < std::tuple(b.row, b.column, b.of.grid);
}

/// An angle in units; whole where it is so but for the rounding of its computation.
double Units(double radians) {
  constexpr double kRounding = 1e-6;
  const double units = radians * kUnitsPerRadian;
  const double whole = std::round(units);
  return std::abs(units - whole) < kRounding ? whole : units;
}

double Turned(double longitude, double from) {
  return longitude - std::floor((longitude - from) / kTurn) * kTurn;
}

/// Edges in units.
struct Extent {
  double north;
  double west;
  double northStep;
  double eastStep;
  std::uint32_t grid;
};

/// The grids that have an extent, with their western edges less than a turn behind a meridian that
/// none crosses: where grids lie all around, they are not joined across it.
std::vector<Extent> ExtentsOf(const std::vector<ResidualGrid>& grids) {
  std::vector<Extent> extents;
  for (std::size_t i = 0; i < grids.size(); ++i) {
    const auto& [south, northExtent, west, eastExtent] = grids[i].area;
    const bool isArea = northExtent > 0 && eastExtent > 0 && std::isfinite(south + northExtent) &&
                        std::isfinite(west + eastExtent);
    if (!isArea || !grids[i].problem.empty()) continue;
    extents.push_back({Units(south + northExtent), Turned(Units(west), 0),
                       Units(grids[i].NorthStep()), Units(grids[i].EastStep()),
                       static_cast<std::uint32_t>(i)});
  }
  std::vector<std::pair<double, double>> ranges;
  ranges.reserve(extents.size());
  for (const Extent& extent : extents) {
    ranges.emplace_back(extent.west, extent.west + kCells * extent.eastStep);
  }
  std::sort(ranges.begin(), ranges.end());
  double end = -kTurn;
  for (const auto& range : ranges) end = std::max(end, range.second - kTurn);
  double widest = -kTurn;
  double from = 0;
  for (const auto& [west, east] : ranges) {
    if (west - end > widest) {
      widest = west - end;
      from = west;
    }
    end = std::max(end, east);
  }
  for (Extent& extent : extents) extent.west = Turned(extent.west, from);
  return extents;
}

Window WindowOf(const Extent& extent) {
  constexpr double kMost = 1e9;  // units, more than any message has
  const auto& [north, west, northStep, eastStep, grid] = extent;
  const auto isWhole = [](double units) {
    return std::abs(units) < kMost && units == std::round(units);
  };
  const bool isOnUnits = isWhole(north) && isWhole(west) && isWhole(northStep) &&
                         isWhole(eastStep) && northStep > 0 && eastStep > 0;
  if (!isOnUnits) return {{northStep, eastStep, north, west}, 0, 0, grid};
  const double row = -std::floor(north / northStep);
  const double column = std::floor(west / eastStep);
  return {{northStep, eastStep, north + row * northStep, west - column * eastStep},
          static_cast<std::int64_t>(row),
          static_cast<std::int64_t>(column),
          grid};
}

/// In the order of their lattices, those of one in the order of the grids.
std::vector<Window> WindowsOf(const std::vector<ResidualGrid>& grids) {
  std::vector<Window> windows;
  for (const Extent& extent : ExtentsOf(grids)) windows.push_back(WindowOf(extent));
  std::stable_sort(windows.begin(), windows.end(),
                   [](const Window& a, const Window& b) { return a.lattice < b.lattice; });
  return windows;
}

/// Appends the first so many points of each row and column of a window.
void AddNodes(const Window& window, std::int64_t side, Nodes& nodes) {
  for (std::int64_t row = 0; row < side; ++row) {
    for (std::int64_t column = 0; column < side; ++column) {
      const auto point = static_cast<std::uint32_t>(row * kGridPoints + column);
      nodes.push_back({window.row + row, window.column + column, {window.grid, point}});
    }
  }
}

/// The windows of one lattice, being joined.
class LatticeJoiner {
 public:
  using Windows = std::vector<Window>::const_iterator;

  LatticeJoiner(const std::vector<ResidualGrid>& grids, const GridPart& part, Windows first,
                Windows last, JoinedGrids& joined)
      : grids_(grids), part_(part), joined_(joined), lattice_(first->lattice) {
    for (; first != last; ++first) {
      if (grids[first->grid].*part.applies) AddNodes(*first, kGridPoints, points_);
      AddNodes(*first, kCells, cells_);
    }
    std::sort(points_.begin(), points_.end(), IsInFront);
    std::sort(cells_.begin(), cells_.end(), IsInFront);
  }

  void Join() {
    KeepFirstPoints();
    KeepFirstCells();
    isTaken_.assign(cells_.size(), false);
    for (std::size_t cell = 0; cell < cells_.size(); ++cell) {
      if (!isTaken_[cell]) TakeRectangle(cell);
    }
  }

 private:
  void KeepFirstPoints() {
    std::size_t kept = 0;
    for (const Node& node : points_) {
      if (kept > 0 && PlaceOf(points_[kept - 1]) == PlaceOf(node)) {
        Compare(points_[kept - 1].of, node.of);
      } else {
        points_[kept++] = node;
      }
    }
    points_.resize(kept);
  }

  void Compare(const GridPoint& used, const GridPoint& other) {
    constexpr double kRounding = 1e-6;  // of a step
    double amount = 0;
    for (const auto values : part_.values) {
      const double difference =
          (grids_[used.grid].*values)[used.point] - (grids_[other.grid].*values)[other.point];
      amount = std::max(amount, std::abs(difference));
    }
    if (amount > part_.step * (1 + kRounding)) {
      joined_.differences.push_back({used, other, amount});
    } else if (amount > part_.step * kRounding) {
      ++joined_.roundings;
      joined_.largestRounding = std::max(joined_.largestRounding, amount);
    }
  }

  void KeepFirstCells() {
    const auto isSame = [](const Node& a, const Node& b) { return PlaceOf(a) == PlaceOf(b); };
    cells_.erase(std::unique(cells_.begin(), cells_.end(), isSame), cells_.end());
    std::erase_if(cells_, [&](const Node& cell) { return !(grids_[cell.of.grid].*part_.applies); });
  }

  /// The index of a place, or of the next behind it.
  static std::size_t Find(const Nodes& nodes, std::int64_t row, std::int64_t column) {
    const auto found =
        std::lower_bound(nodes.begin(), nodes.end(), std::pair(row, column),
                         [](const Node& node, const auto& place) { return PlaceOf(node) < place; });
    return static_cast<std::size_t>(found - nodes.begin());
  }

  /// How many cells from one to the east are there and not yet taken, at most so many.
  std::size_t FreeCells(std::size_t first, std::size_t most) const {
    std::size_t count = 0;
    while (count < most && first + count < cells_.size() && !isTaken_[first + count] &&
           cells_[first + count].row == cells_[first].row &&
           cells_[first + count].column == cells_[first].column + std::int64_t(count)) {
      ++count;
    }
    return count;
  }

  /// Takes the cells from one to the east, and those to the south of them all.
  void TakeRectangle(std::size_t corner) {
    const auto [row, column, of] = cells_[corner];
    const std::size_t width = FreeCells(corner, cells_.size());
    std::uint32_t firstGrid = of.grid;
    std::int64_t height = 0;
    for (std::size_t first = corner;; first = Find(cells_, row + height, column)) {
      const bool isThere =
          first < cells_.size() && PlaceOf(cells_[first]) == std::pair(row + height, column);
      if (!isThere || FreeCells(first, width) < width) break;
      for (std::size_t cell = first; cell < first + width; ++cell) {
        isTaken_[cell] = true;
        firstGrid = std::min(firstGrid, cells_[cell].of.grid);
      }
      ++height;
    }
    AddGrid(row, column, static_cast<std::size_t>(height) + 1, width + 1, firstGrid);
  }

  void AddGrid(std::int64_t row, std::int64_t column, std::size_t rows, std::size_t columns,
               std::uint32_t firstGrid) {
    const auto& [northStep, eastStep, north, east] = lattice_;
    const double west = std::remainder(east + static_cast<double>(column) * eastStep, kTurn);
    JoinedGrid grid{(north - static_cast<double>(row) * northStep) / kUnitsPerDegree,
                    west / kUnitsPerDegree,
                    northStep / kUnitsPerDegree,
                    eastStep / kUnitsPerDegree,
                    columns,
                    firstGrid,
                    {}};
    grid.points.reserve(rows * columns);
    for (std::size_t i = 0; i < rows; ++i, ++row) {
      const auto first = Find(points_, row, column);
      for (std::size_t j = 0; j < columns; ++j) grid.points.push_back(points_[first + j].of);
    }
    joined_.grids.push_back(std::move(grid));
  }

  const std::vector<ResidualGrid>& grids_;
  const GridPart& part_;
  JoinedGrids& joined_;
  Lattice lattice_;
  Nodes points_;
  Nodes cells_;  ///< by their north-western points
  std::vector<bool> isTaken_;
};

}  // namespace

JoinedGrids JoinGrids(const std::vector<ResidualGrid>& grids, const GridPart& part) {
  JoinedGrids joined;
  const std::vector<Window> windows = WindowsOf(grids);
  for (auto first = windows.begin(); first != windows.end();) {
    const auto last = std::find_if(first, windows.end(), [&](const Window& window) {
      return window.lattice != first->lattice;
    });
    LatticeJoiner(grids, part, first, last, joined).Join();
    first = last;
  }
  std::stable_sort(
      joined.grids.begin(), joined.grids.end(),
      [](const JoinedGrid& a, const JoinedGrid& b) { return a.firstGrid < b.firstGrid; });
  return joined;
}

std::vector<std::uint32_t> GridsAcrossOthers(const std::vector<ResidualGrid>& grids) {
  namespace bg = boost::geometry;
  using Point = bg::model::point<double, 2, bg::cs::cartesian>;
  using Box = bg::model::box<Point>;
  using Item = std::pair<Box, const Window*>;
  constexpr double kEdge = 1e-3;  // of a step: edges may touch

  const std::vector<Window> windows = WindowsOf(grids);
  std::vector<Item> items;
  for (const Window& window : windows) {
    const auto& [northStep, eastStep, latticeNorth, latticeEast] = window.lattice;
    const double north = latticeNorth - (static_cast<double>(window.row) + kEdge) * northStep;
    const double west = latticeEast + (static_cast<double>(window.column) + kEdge) * eastStep;
    const double steps = kCells - 2 * kEdge;
    items.emplace_back(Box({north - steps * northStep, west}, {north, west + steps * eastStep}),
                       &window);
  }
  const bg::index::rtree<Item, bg::index::rstar<16>> tree(items);
  std::vector<std::uint32_t> across;
  for (const auto& [box, window] : items) {
    const Lattice& lattice = window->lattice;
    const auto isOfOther = [&](const Item& item) { return item.second->lattice != lattice; };
    const auto isFound =
        tree.qbegin(bg::index::intersects(box) && bg::index::satisfies(isOfOther)) != tree.qend();
    if (isFound) across.push_back(window->grid);
  }
  std::sort(across.begin(), across.end());
  return across;
}

}  // namespace velta_tool
