#pragma once

#include <cstddef>
#include <memory>
#include <optional>
#include <utility>
#include <vector>

#include "projmath/rect_rgn.h"

namespace velta_tool {

/// Finds the areas that hold a position.
class AreaIndex {
 public:
  /// \param areas in their order; empty ones never hold anything
  /// \param isPlane as TRectRgn::Inside() takes it
  AreaIndex(std::vector<orx::cs::projmath::TRectRgn> areas, bool isPlane);
  ~AreaIndex();
  AreaIndex(AreaIndex&&) noexcept;
  AreaIndex& operator=(AreaIndex&&) noexcept;

  /// \param margin metres on the ground, by which areas are taken for larger, or for smaller
  /// \return the number of the first area that holds the position
  std::optional<std::size_t> First(double north, double east, double margin = 0) const;
  /// \return the numbers of all areas that hold it, but for those that are equal to an earlier one
  std::vector<std::size_t> All(double north, double east, double margin) const;

 private:
  struct Tree;

  /// \param visit called with the number of each area, in any order
  template <class Visit>
  void VisitHolding(double north, double east, double margin, const Visit& visit) const;

  std::vector<orx::cs::projmath::TRectRgn> areas_;
  bool isPlane_;
  std::unique_ptr<Tree> tree_;
};

/// The index of what has an `area`.
template <class Held>
AreaIndex IndexOf(const std::vector<Held>& held, bool isPlane) {
  std::vector<orx::cs::projmath::TRectRgn> areas;
  areas.reserve(held.size());
  for (const Held& one : held) areas.push_back(one.area);
  return {std::move(areas), isPlane};
}

}  // namespace velta_tool
