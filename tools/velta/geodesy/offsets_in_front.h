#pragma once

#include <optional>
#include <vector>

#include "geodesy/area_index.h"
#include "geodesy/definition.h"
#include "geodesy/proj_operation.h"
#include "geodesy/residuals.h"

namespace velta_tool {

/// What is to be added to a position of the source system so that behind the datum shift its
/// residuals have been added. The residuals themselves would be up to a ten-thousandth off.
class OffsetsInFront {
 public:
  /// \param definition lives as long as the object
  explicit OffsetsInFront(const Definition& definition);

  /// \param at latitude and longitude of a grid's point, radians
  /// \param residuals those of the point, radians
  /// \return the offsets, radians
  Residuals At(const Coordinates& at, const Residuals& residuals) const;

 private:
  std::size_t ShiftAt(const Coordinates& at) const;

  const Definition& definition_;
  AreaIndex areas_;
  ProjContext context_;
  /// By the shifts' indices; nothing for one that no position is transformed by.
  std::vector<std::optional<ProjOperation>> operations_;
};

}  // namespace velta_tool
