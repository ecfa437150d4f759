#include <algorithm>

#include "geodesy/exports.h"
#include "geodesy/proj_steps.h"
#include "terminal.h"

namespace velta_tool {
namespace {

/// Outside all grids the position stays, as it does in a transformation of ours.
constexpr const char* kElseNothing = ",null";

std::string GridList(const std::string& file, const char* otherwise) {
  const bool needsQuotes = file.find_first_of(" +#") != file.npos;
  const std::string list = file + otherwise;
  return " +grids=" + (needsQuotes ? '"' + list + '"' : list);
}

/// What a pipeline does in front of the datum's steps and behind them so that a height residual is
/// read at the position of the source system and applied to the height that is meant.
struct HeightSteps {
  std::string inFront;
  std::string behind;
};

/// The residual, or for the source system's heights the height itself, is carried past the datum's
/// steps as the fourth coordinate.
HeightSteps HeightStepsOf(const std::string& grid, std::uint32_t heightIndicator) {
  const std::string swap = " +step +proj=axisswap +order=1,2,4,3";
  const std::string clear = " +step +proj=set +v_4=0";
  const std::string read = " +step +proj=vgridshift";
  if (heightIndicator == kPhysicalOfSource) {
    return {clear + " +step +proj=push +v_3" + read + GridList(grid, "") + " +multiplier=-1" +
                swap + " +step +proj=pop +v_3",
            swap + clear};
  }
  // In kilometres: while it is added it stands where a longitude would, and PROJ turns and refuses
  // large ones.
  const char* const kilometres = heightIndicator == kGeometricHeight ? "0.001" : "-0.001";
  return {clear + " +step +proj=push +v_3 +step +proj=set +v_3=0" + read +
              GridList(grid, kElseNothing) + " +multiplier=" + kilometres + swap +
              " +step +proj=pop +v_3",
          " +step +proj=push +v_1 +step +proj=axisswap +order=4,2,3,1 +step +proj=affine +s31=1000"
          " +step +proj=pop +v_1" +
              clear};
}

/// A step a line.
std::string OnLines(std::string steps) {
  for (std::size_t at = steps.find(" +step"); at != steps.npos; at = steps.find(" +step", at)) {
    steps[at] = '\n';
  }
  return steps + '\n';
}

bool AnyApplies(const std::vector<ResidualGrid>& grids, bool ResidualGrid::*shift) {
  return std::any_of(grids.begin(), grids.end(),
                     [=](const ResidualGrid& grid) { return grid.*shift; });
}

void TellWhatIsMissing(const Definition& definition, const GridFiles& grids,
                       const TellLeftOut& tell) {
  if (grids.horizontal.empty() && AnyApplies(definition.grids, &ResidualGrid::horShift)) {
    tell("horizontal residuals: export them as gtg, and name the file by --hgrid");
  }
  if (grids.vertical.empty() && AnyApplies(definition.grids, &ResidualGrid::vertShift)) {
    tell("height residuals: export them as gtg, and name the file by --vgrid");
  }
  if (definition.projection && !definition.planeGrids.empty()) {
    tell("the residuals of plane grids");
  }
}

}  // namespace

std::string ProjPipeline(const Definition& definition, std::size_t shiftIndex,
                         const GridFiles& grids, const TellLeftOut& tell) {
  const DatumShift& shift = definition.shifts[shiftIndex];
  std::string steps =
      "+proj=pipeline +step +proj=axisswap +order=2,1"
      " +step +proj=unitconvert +xy_in=deg +xy_out=rad";
  HeightSteps height;
  if (!grids.vertical.empty()) height = HeightStepsOf(grids.vertical, shift.heightIndicator);
  steps += height.inFront;
  if (!grids.horizontal.empty()) {
    steps += " +step +proj=hgridshift" + GridList(grids.horizontal, kElseNothing);
  }
  steps += DatumSteps(shift) + height.behind;
  steps += definition.projection ? ProjectionSteps(*definition.projection, shift.targetAxes)
                                 : " +step +proj=unitconvert +xy_in=rad +xy_out=deg";
  steps += " +step +proj=axisswap +order=2,1";
  TellWhatIsMissing(definition, grids, tell);
  return OnLines(std::move(steps));
}

}  // namespace velta_tool
