#include "geodesy/stored_definition.h"

#include <cmath>
#include <stdexcept>
#include <utility>

#include "command.h"
#include "files.h"
#include "orxregistry/in_file_key.h"
#include "orxutils/file_error.h"
#include "orxutils/orx_string.h"
#include "store/gff_layout.h"
#include "store/key_values.h"
#include "store/registry_tree.h"
#include "store/residual_grid.h"
#include "store/stored_entries.h"
#include "terminal.h"

namespace velta_tool {
namespace {

namespace velta = orx::cs::velta;
namespace layout = velta::layout;
using orx::TGenericRegistryKey;
using orx::TGenRegKeyIterator;
using velta::StoredKey;

/// Says that the library finds nothing behind an entry, and neither does this.
void NoteEnd(const std::string& file, const char* what, const std::string& entry) {
  ReportNote(file + ": the " + what + " of " + Printable(entry) +
             " cannot be read; nothing is looked for behind it");
}

/// Goes through the entries of a file.
/// \param visit (container, entry, its name)
/// \throws std::runtime_error when the file cannot be read, and when it has none
template <class Visit>
void VisitEntries(const std::string& file, const Visit& visit) {
  RequireFile(file);
  orx::ForgetFileError();
  const orx::TInFileKey tree(ToWide(file), nullptr, nullptr, true, orx::kRegistryFlags);
  const TGenericRegistryKey container = velta::ContainerOf(tree);
  velta::ShapeMemory memory;
  bool isEmpty = true;
  for (TGenRegKeyIterator walk(container); walk;) {
    const TGenericRegistryKey entry(walk++);
    memory.GoTo(entry);
    visit(container, memory, orx::ToUtf8(entry.GetName()));
    isEmpty = false;
  }
  const std::string damage = ErrorStateText(tree.GetErrorState(), orx::KeptFileError());
  if (isEmpty) throw std::runtime_error(file + ": " + (damage.empty() ? "no entry in it" : damage));
  if (!damage.empty()) ReportNote(file + ": " + damage + "; used is what could be read");
}

/// The list of residual grids of a file, while it grows.
class GridList {
 public:
  GridList(const std::string& file, const layout::ResidualGrid& layout,
           std::vector<ResidualGrid>& grids)
      : file_(file), layout_(layout), grids_(grids) {}

  void Add(velta::ShapeMemory& memory, const std::string& name) {
    if (hasEnded_) return;
    const StoredKey key(memory, layout_.key);
    velta::StoredGrid stored;
    if (!velta::ReadGridArea(key, layout_, stored)) {
      NoteEnd(file_, "residual grid", name);
      hasEnded_ = true;
      return;
    }
    const bool isRead = velta::ReadGridValues(key, stored);
    ResidualGrid grid = MakeGrid(name, stored.table);
    const bool isNone = !grid.horShift && !grid.vertShift && grid.area.northExtent == 0;
    if (isRead && isNone) return;  // what is written where no grid was received
    const bool isFull = stored.rows == kGridPoints && stored.columns == kGridPoints;
    if (!isFull) {
      grid.problem = std::to_string(stored.rows) + " by " + std::to_string(stored.columns) +
                     " points, not 4 by 4";
    }
    if (!isRead) grid.problem = "incomplete";
    grids_.push_back(std::move(grid));
  }

 private:
  const std::string& file_;
  const layout::ResidualGrid& layout_;
  std::vector<ResidualGrid>& grids_;
  bool hasEnded_ = false;
};

Projection ReadProjection(const StoredKey& standard) {
  std::wstring type;
  double parameters[orx::cs::projmath::TGeoProj::kMaxParameters];
  const bool isRead = velta::Read(standard, layout::kProjectionType, type) &&
                      velta::Read(standard, layout::kProjectionParameters, parameters);
  if (isRead) return StoredProjectionOf(type, parameters);
  Projection projection;
  projection.problem = "incomplete";
  return projection;
}

/// Notes that a projection is of another datum.
/// \throws std::runtime_error when it is of another ellipsoid
void RequireFit(const std::string& file, const StoredKey& standard, const Definition& definition) {
  std::wstring datum;
  if (!definition.targetName.empty() && velta::Read(standard, layout::kDatumName, datum) &&
      orx::ToUtf8(datum) != definition.targetName) {
    ReportNote(file + ": the projection is of the datum " + Printable(orx::ToUtf8(datum)) +
               ", not " + Printable(definition.targetName));
  }
  constexpr double kSame = 1e-3;  // metres, the step of the messages
  double axes[2];
  if (!velta::Read(standard, layout::kEllipsoid, axes)) return;
  for (const DatumShift& shift : definition.shifts) {
    for (std::size_t i = 0; i < shift.targetAxes.size(); ++i) {
      if (std::abs(axes[i] - shift.targetAxes[i]) <= kSame) continue;
      throw std::runtime_error(file + ": the projection is of another ellipsoid than the datum");
    }
  }
}

}  // namespace

Definition ReadDatumFile(const std::string& file) {
  Definition definition;
  bool hasEnded = false;
  GridList grids(file, layout::kDatumGrid, definition.grids);
  VisitEntries(file, [&](const TGenericRegistryKey& container, velta::ShapeMemory& memory,
                         const std::string& name) {
    const StoredKey standard(memory, layout::kStandardDatum);
    DatumArea area{name, {}, std::nullopt};
    if (!hasEnded && !velta::ReadValidityArea(standard, area.area)) {
      NoteEnd(file, "area of validity", name);
      hasEnded = true;
    }
    if (!hasEnded) {
      velta::DatumData datum;
      if (velta::ReadTransformation(container, standard, datum)) {
        area.shift = AddShift(datum, definition.shifts);
        if (definition.sourceName.empty()) {
          definition.sourceName = orx::ToUtf8(datum.sourceDatumName);
          definition.targetName = orx::ToUtf8(datum.targetDatumName);
        }
      }
      definition.areas.push_back(std::move(area));
    }
    grids.Add(memory, name);
  });
  return definition;
}

void AddProjectionFile(const std::string& file, Definition& definition) {
  GridList grids(file, layout::kProjectionGrid, definition.planeGrids);
  VisitEntries(
      file, [&](const TGenericRegistryKey&, velta::ShapeMemory& memory, const std::string& name) {
        if (!definition.projection) {
          const StoredKey standard(memory, layout::kStandardProjection);
          definition.projection = ReadProjection(standard);
          definition.projection->entry = name;
          RequireFit(file, standard, definition);
        }
        grids.Add(memory, name);
      });
}

}  // namespace velta_tool
