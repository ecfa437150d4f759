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

/// The steps that leave the height as the fourth coordinate, where the datum's steps pass it by:
/// its residual is read at the position of the source system, and the horizontal residuals, which
/// PROJ adds in front of the datum, leave it alone.
std::string HeightSteps(const DatumShift& shift, const std::string& grid) {
  const bool isOfSource = shift.heightIndicator == kPhysicalOfSource && !grid.empty();
  std::string steps = " +step +proj=set +v_4=0";
  if (isOfSource) {
    steps += " +step +proj=push +v_3";
  } else {
    steps += " +step +proj=push +v_1 +v_2 +v_3" + DatumSteps(shift) + " +step +proj=pop +v_1 +v_2";
  }
  if (!grid.empty()) {
    // Without a residual the height is that of the target.
    const char* const otherwise = isOfSource ? "" : kElseNothing;
    const char* const sign = shift.heightIndicator == kGeometricHeight ? "1" : "-1";
    steps += " +step +proj=vgridshift" + GridList(grid, otherwise) + " +multiplier=" + sign;
  }
  return steps + " +step +proj=axisswap +order=1,2,4,3 +step +proj=pop +v_3";
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

void TellWhatIsMissing(const Definition& definition, const DatumShift& shift,
                       const GridFiles& grids, const TellLeftOut& tell) {
  if (grids.horizontal.empty() && AnyApplies(definition.grids, &ResidualGrid::horShift)) {
    tell("horizontal residuals: export them as gtg, and name the file by --hgrid");
  }
  if (grids.vertical.empty() && AnyApplies(definition.grids, &ResidualGrid::vertShift)) {
    tell("height residuals: export them as gtg, and name the file by --vgrid");
  }
  if (definition.projection && !definition.planeGrids.empty()) {
    tell("the residuals of plane grids");
  }
  if (IsBounded(definition)) tell("the area of validity: it goes on outside");
  if (grids.horizontal.empty() && grids.vertical.empty()) return;
  tell("the way back: with grids it leads forward only");
  const auto isCurved = [](const ResidualGrid& grid) {
    return (grid.horShift && grid.horInterpolation != kBilinear) ||
           (grid.vertShift && grid.vertInterpolation != kBilinear);
  };
  if (std::any_of(definition.grids.begin(), definition.grids.end(), isCurved)) {
    tell("the interpolation by parabolas or splines, where PROJ's is bilinear");
  }
  if (!grids.vertical.empty() && shift.heightIndicator == kPhysicalOfSource) {
    tell("positions outside the height grid, which fail");
  }
}

}  // namespace

std::string ProjPipeline(const Definition& definition, std::size_t shiftIndex,
                         const GridFiles& grids, const TellLeftOut& tell) {
  const DatumShift& shift = definition.shifts[shiftIndex];
  std::string steps =
      "+proj=pipeline +step +proj=axisswap +order=2,1"
      " +step +proj=unitconvert +xy_in=deg +xy_out=rad";
  const bool hasGrids = !grids.horizontal.empty() || !grids.vertical.empty();
  if (hasGrids) steps += HeightSteps(shift, grids.vertical);
  if (!grids.horizontal.empty()) {
    steps += " +step +proj=hgridshift" + GridList(grids.horizontal, kElseNothing);
  }
  steps += DatumSteps(shift);
  if (hasGrids) steps += " +step +proj=axisswap +order=1,2,4,3 +step +proj=set +v_4=0";
  steps += definition.projection ? ProjectionSteps(*definition.projection, shift.targetAxes)
                                 : " +step +proj=unitconvert +xy_in=rad +xy_out=deg";
  steps += " +step +proj=axisswap +order=2,1";
  TellWhatIsMissing(definition, shift, grids, tell);
  return OnLines(std::move(steps));
}

}  // namespace velta_tool
