#pragma once

#include <cstddef>
#include <memory>
#include <optional>
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

  /// \param margin metres on the ground, by which areas are taken for larger
  /// \return the number of the first area that holds the position
  std::optional<std::size_t> First(double north, double east, double margin = 0) const;

 private:
  struct Tree;

  std::vector<orx::cs::projmath::TRectRgn> areas_;
  bool isPlane_;
  std::unique_ptr<Tree> tree_;
};

}  // namespace velta_tool
