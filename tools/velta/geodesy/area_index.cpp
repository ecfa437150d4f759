#include "geodesy/area_index.h"

#include <algorithm>
#include <array>
#include <boost/geometry/geometries/box.hpp>
#include <boost/geometry/geometries/point.hpp>
#include <boost/geometry/index/rtree.hpp>
#include <cmath>
#include <set>
#include <utility>

#include "description.h"

namespace velta_tool {
namespace {

namespace bg = boost::geometry;
using orx::cs::projmath::TRectRgn;
using Point = bg::model::point<double, 2, bg::cs::cartesian>;
using Box = bg::model::box<Point>;
using Item = std::pair<Box, std::size_t>;

constexpr double kFullTurn = 2 * kPi;
/// More than the rounding of all that is done here with angles: the tree only leaves over what
/// TRectRgn::Inside() then decides on.
constexpr double kSlack = 1e-9;
constexpr double kEarthRadius = 6.4e6;  // metres
constexpr double kFar = 1e30;           // beyond any coordinate, and still to be reckoned with

Box BoxOf(double south, double north, double west, double east) {
  const auto near = [](double value) { return std::clamp(value, -kFar, kFar); };
  return {{near(south), near(west)}, {near(north), near(east)}};
}

/// Boxes that hold what an area does; longitudes of a box are within half a turn of 0.
std::vector<Box> BoxesOf(const TRectRgn& area, bool isPlane) {
  const auto& [south, northExtent, west, eastExtent] = area;
  const bool isArea = northExtent >= 0 && eastExtent >= 0 && std::isfinite(south + west);
  if (!isArea) return {};
  if (isPlane) return {BoxOf(south, south + northExtent, west, west + eastExtent)};
  const bool isAnyLatitude = northExtent >= kPi;
  const double low = isAnyLatitude ? -kFar : south - kSlack;
  const double high = isAnyLatitude ? kFar : south + northExtent + kSlack;
  if (eastExtent >= kFullTurn) return {BoxOf(low, high, -kFar, kFar)};
  const double from = std::remainder(west, kFullTurn) - kSlack;
  const double to = from + eastExtent + 2 * kSlack;
  std::vector<Box> boxes = {BoxOf(low, high, from, to)};
  if (to > kPi) boxes.push_back(BoxOf(low, high, from - kFullTurn, to - kFullTurn));
  if (from < -kPi) boxes.push_back(BoxOf(low, high, from + kFullTurn, to + kFullTurn));
  return boxes;
}

}  // namespace

struct AreaIndex::Tree : bg::index::rtree<Item, bg::index::rstar<16>> {
  using bg::index::rtree<Item, bg::index::rstar<16>>::rtree;
};

AreaIndex::AreaIndex(std::vector<TRectRgn> areas, bool isPlane)
    : areas_(std::move(areas)), isPlane_(isPlane) {
  std::vector<Item> items;
  std::set<std::array<double, 4>> known;
  for (std::size_t i = 0; i < areas_.size(); ++i) {
    const auto& [south, northExtent, west, eastExtent] = areas_[i];
    const std::vector<Box> boxes = BoxesOf(areas_[i], isPlane);
    // Of equal areas only the first is ever found.
    if (boxes.empty() || !known.insert({south, northExtent, west, eastExtent}).second) continue;
    for (const Box& box : boxes) items.emplace_back(box, i);
  }
  tree_ = std::make_unique<Tree>(items.begin(), items.end());
}

AreaIndex::~AreaIndex() = default;
AreaIndex::AreaIndex(AreaIndex&&) noexcept = default;
AreaIndex& AreaIndex::operator=(AreaIndex&&) noexcept = default;

template <class Visit>
void AreaIndex::VisitHolding(double north, double east, double margin, const Visit& visit) const {
  constexpr double kLeastShrinking = 1e-3;
  double marginNorth = margin;
  double marginEast = margin;
  double shownEast = east;
  if (!isPlane_) {
    marginNorth = margin / kEarthRadius;
    marginEast = marginNorth / std::max(std::cos(north), kLeastShrinking);
    shownEast = std::remainder(east, kFullTurn);
  }
  if (!std::isfinite(north) || !std::isfinite(east)) return;
  const Box around = BoxOf(north - std::abs(marginNorth), north + std::abs(marginNorth),
                           shownEast - std::abs(marginEast), shownEast + std::abs(marginEast));
  for (auto item = tree_->qbegin(bg::index::intersects(around)); item != tree_->qend(); ++item) {
    const auto& [south, northExtent, west, eastExtent] = areas_[item->second];
    const TRectRgn larger{south - marginNorth, northExtent + 2 * marginNorth, west - marginEast,
                          eastExtent + 2 * marginEast};
    if (larger.Inside(north, east, isPlane_)) visit(item->second);
  }
}

std::optional<std::size_t> AreaIndex::First(double north, double east, double margin) const {
  std::optional<std::size_t> first;
  VisitHolding(north, east, margin, [&first](std::size_t number) {
    if (!first || number < *first) first = number;
  });
  return first;
}

std::vector<std::size_t> AreaIndex::All(double north, double east, double margin) const {
  std::set<std::size_t> numbers;  // an area may have two boxes
  VisitHolding(north, east, margin, [&numbers](std::size_t number) { numbers.insert(number); });
  return {numbers.begin(), numbers.end()};
}

}  // namespace velta_tool
