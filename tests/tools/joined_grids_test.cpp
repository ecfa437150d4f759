#include "geodesy/joined_grids.h"

#include <gtest/gtest.h>

#include <cmath>
#include <map>
#include <random>
#include <set>
#include <utility>
#include <vector>

#include "description.h"

namespace velta_tool {
namespace {

using Place = std::pair<int, int>;  // row, counted to the south, and column

constexpr double kStep = 15.0 / 3600;  // degrees
constexpr double kNorth = 10;          // of row 0, degrees
/// Of column 0, degrees: the antimeridian and Greenwich are among the columns.
constexpr double kWests[] = {179.9, -0.1};
constexpr int kRows = 30;
constexpr int kColumns = 60;
constexpr double kResidualStep = 0.001;
const GridPart kHeights = {&ResidualGrid::vertShift, {&ResidualGrid::height}, kResidualStep};

/// A field of heights, out of which windows are cut.
class Field {
 public:
  explicit Field(unsigned seed, double west = kWests[0]) : random_(seed), west_(west) {
    for (int row = 0; row < kRows; ++row) {
      for (int column = 0; column < kColumns; ++column) {
        heights_[{row, column}] = std::uniform_real_distribution(-100.0, 100.0)(random_);
      }
    }
  }

  double At(const Place& place) const { return heights_.at(place); }

  ResidualGrid Window(int row, int column) const {
    const double south = kNorth - (row + kGridPoints - 1) * kStep;
    const double west = std::remainder(west_ + column * kStep, 360);
    const double extent = (kGridPoints - 1) * kStep / kDegreesPerRadian;
    ResidualGrid grid = {};
    grid.area = {south / kDegreesPerRadian, extent, west / kDegreesPerRadian, extent};
    grid.vertShift = true;
    for (int i = 0; i < kGridPoints * kGridPoints; ++i) {
      grid.height[static_cast<std::size_t>(i)] =
          At({row + i / kGridPoints, column + i % kGridPoints});
    }
    return grid;
  }

  Place PlaceOf(const JoinedGrid& grid, std::size_t point) const {
    const double row = (kNorth - grid.north) / kStep;
    const double column = std::remainder(grid.west - west_, 360) / kStep;
    return {static_cast<int>(std::lround(row)) + static_cast<int>(point / grid.columns),
            static_cast<int>(std::lround(column)) + static_cast<int>(point % grid.columns)};
  }

  std::vector<Place> CellsOf(const JoinedGrid& grid) const {
    std::vector<Place> cells;
    for (std::size_t point = 0; point + grid.columns < grid.points.size(); ++point) {
      const bool isLast = point % grid.columns == grid.columns - 1;
      if (!isLast) cells.push_back(PlaceOf(grid, point));
    }
    return cells;
  }

  /// Windows here and there, some of which touch and some overlap.
  std::vector<ResidualGrid> Windows(int count, std::set<Place>& cells) {
    std::vector<ResidualGrid> windows;
    for (int i = 0; i < count; ++i) {
      const int row = std::uniform_int_distribution(0, kRows - kGridPoints)(random_);
      const int column = std::uniform_int_distribution(0, kColumns - kGridPoints)(random_);
      windows.push_back(Window(row, column));
      for (int cell = 0; cell < 9; ++cell) cells.insert({row + cell / 3, column + cell % 3});
    }
    return windows;
  }

 private:
  std::mt19937 random_;
  double west_;
  std::map<Place, double> heights_;
};

TEST(JoinedGrids, EveryCoveredCellIsInOneRectangle) {
  for (unsigned seed = 0; seed < 50; ++seed) {
    SCOPED_TRACE(seed);
    Field field(seed, kWests[seed % 2]);
    std::set<Place> covered;
    const std::vector<ResidualGrid> windows = field.Windows(40, covered);
    std::multiset<Place> joined;
    for (const JoinedGrid& grid : JoinGrids(windows, kHeights).grids) {
      const std::vector<Place> cells = field.CellsOf(grid);
      joined.insert(cells.begin(), cells.end());
    }
    EXPECT_EQ(joined, std::multiset<Place>(covered.begin(), covered.end()));
  }
}

TEST(JoinedGrids, EveryPointHasTheValueOfTheField) {
  for (unsigned seed = 0; seed < 50; ++seed) {
    SCOPED_TRACE(seed);
    Field field(seed, kWests[seed % 2]);
    std::set<Place> covered;
    const std::vector<ResidualGrid> windows = field.Windows(40, covered);
    const JoinedGrids joined = JoinGrids(windows, kHeights);
    EXPECT_TRUE(joined.differences.empty());
    EXPECT_EQ(joined.roundings, 0);
    for (const JoinedGrid& grid : joined.grids) {
      for (std::size_t point = 0; point < grid.points.size(); ++point) {
        const auto [window, number] = grid.points[point];
        EXPECT_EQ(windows[window].height[number], field.At(field.PlaceOf(grid, point)));
      }
    }
  }
}

TEST(JoinedGrids, AdjacentWindowsMakeOneRectangleAcrossTheAntimeridianAndGreenwich) {
  for (const double west : kWests) {
    SCOPED_TRACE(west);
    const Field field(1, west);
    std::vector<ResidualGrid> windows;
    for (int column = 0; column + kGridPoints <= kColumns; column += kGridPoints - 1) {
      windows.insert(windows.begin(), field.Window(5, column));
    }
    const JoinedGrids joined = JoinGrids(windows, kHeights);
    ASSERT_EQ(joined.grids.size(), 1);
    EXPECT_EQ(joined.grids[0].columns, (kColumns - 1) / 3 * 3 + 1);
    EXPECT_DOUBLE_EQ(joined.grids[0].west, west);
  }
}

TEST(JoinedGrids, TheFirstWindowsValueIsTakenAndTheDifferenceTold) {
  const Field field(2);
  std::vector<ResidualGrid> windows = {field.Window(5, 5), field.Window(6, 7)};
  windows[1].height[1] += 5 * kResidualStep;  // point 7 of the first window
  const JoinedGrids joined = JoinGrids(windows, kHeights);
  ASSERT_EQ(joined.differences.size(), 1);
  const Difference& difference = joined.differences[0];
  EXPECT_EQ(difference.used.grid, 0);
  EXPECT_EQ(difference.used.point, 7);
  EXPECT_EQ(difference.other.grid, 1);
  EXPECT_EQ(difference.other.point, 1);
  EXPECT_NEAR(difference.amount, 5 * kResidualStep, 1e-9);
  EXPECT_EQ(joined.roundings, 0);
}

TEST(JoinedGrids, ADifferenceOfAStepIsRounding) {
  const Field field(3);
  std::vector<ResidualGrid> windows = {field.Window(5, 5), field.Window(6, 7)};
  windows[1].height[0] += kResidualStep;
  windows[1].height[1] -= kResidualStep / 2;
  const JoinedGrids joined = JoinGrids(windows, kHeights);
  EXPECT_TRUE(joined.differences.empty());
  EXPECT_EQ(joined.roundings, 2);
  EXPECT_NEAR(joined.largestRounding, kResidualStep, 1e-9);
}

TEST(JoinedGrids, WhereTheFirstWindowDoesNotApplyNothingIsJoined) {
  const Field field(4);
  std::vector<ResidualGrid> windows = {field.Window(5, 5), field.Window(5, 6)};
  windows[0].vertShift = false;
  const JoinedGrids joined = JoinGrids(windows, kHeights);
  ASSERT_EQ(joined.grids.size(), 1);
  const std::vector<Place> last = {{5, 8}, {6, 8}, {7, 8}};
  EXPECT_EQ(field.CellsOf(joined.grids[0]), last);
  for (const GridPoint& point : joined.grids[0].points) EXPECT_EQ(point.grid, 1);
}

TEST(JoinedGrids, WindowsOfOtherStepsStayApartAndAreNamedWhereTheyOverlap) {
  const Field field(5);
  std::vector<ResidualGrid> windows = {field.Window(5, 5), field.Window(15, 5),
                                       field.Window(15, 8)};
  windows[1].area.eastExtent *= 2;
  EXPECT_EQ(JoinGrids(windows, kHeights).grids.size(), 3);
  EXPECT_EQ(GridsAcrossOthers(windows), (std::vector<std::uint32_t>{1, 2}));
  windows[2] = field.Window(15, 11);  // only touches
  EXPECT_TRUE(GridsAcrossOthers(windows).empty());
}

}  // namespace
}  // namespace velta_tool
