#pragma once

#include <cstddef>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "geodesy/area_index.h"
#include "geodesy/definition.h"
#include "geodesy/proj_operation.h"
#include "geodesy/readings.h"
#include "geodesy/residuals.h"

namespace velta_tool {

/// A position in both systems.
struct Transformed {
  Coordinates source;                ///< latitude, longitude, ellipsoidal height
  Coordinates target;                ///< likewise, with the residuals; the height as `plane` has it
  std::optional<Coordinates> plane;  ///< northing, easting; nothing without a projection
  const DatumArea* area = nullptr;
  const ResidualGrid* grid = nullptr;       ///< null where none covers the position
  const ResidualGrid* planeGrid = nullptr;  ///< likewise
  /// Physical heights are meant, and no residual made one of the ellipsoidal height.
  bool lacksHeightResidual = false;
};

/// Applies a definition to positions. The first area and the first grid that hold a position are
/// used, as the library finds them.
class Transformation {
 public:
  explicit Transformation(Definition definition);

  /// \param source latitude, longitude, ellipsoidal height of the source system
  /// \throws NotTransformable when no area holds the position, and for what cannot be applied
  Transformed Forward(const Coordinates& source);

  /// \param target northing, easting, height; without a projection latitude, longitude, height
  /// \throws NotTransformable as above, and when the iteration does not end
  Transformed Inverse(const Coordinates& target);

  const Definition& definition() const { return definition_; }
  /// What the positions so far rest on.
  const Readings& readings() const { return readings_; }

 private:
  /// The operations of a shift.
  struct Operations {
    ProjOperation datum;
    std::optional<ProjOperation> projection;
  };
  /// They are made when they are needed first; what PROJ refuses is kept as the reason.
  struct Prepared {
    std::optional<Operations> operations;
    std::string refused;
  };

  const Operations& OperationsOf(const DatumArea& area);
  /// \param planeGrid the one that is to be used; nothing: the one that holds the plane position
  Transformed Apply(const Coordinates& source, const DatumArea& area, const ResidualGrid* grid,
                    std::optional<const ResidualGrid*> planeGrid = std::nullopt);

  // The inverse. Which area and which grids a position is in is known of the source only: each that
  // comes into question is tried, and stands when the source turns out to be in it.
  using Grids = std::vector<const ResidualGrid*>;
  /// A position of the target in latitude and longitude.
  Coordinates Unprojected(const Coordinates& target);
  /// Without the residuals.
  Coordinates Back(const Coordinates& target, const DatumArea& area);
  /// \return nothing when the source is not where this area's shift applies
  std::optional<Transformed> ReverseIn(const Coordinates& target, const DatumArea& area);
  /// \return nothing when the iteration does not end
  std::optional<Transformed> Iterate(const Coordinates& target, const DatumArea& area,
                                     const ResidualGrid* grid, const ResidualGrid* planeGrid);
  bool IsWhereItIsTaken(const Transformed& reached);

  void Note(const Transformed& position);
  void NoteGrid(const ResidualGrid& grid);

  Definition definition_;
  AreaIndex areas_;
  AreaIndex grids_;
  AreaIndex planeGrids_;
  ProjContext context_;
  std::vector<Prepared> prepared_;  ///< by the shifts' indices
  Readings readings_;
};

}  // namespace velta_tool
