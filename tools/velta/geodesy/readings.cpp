#include "geodesy/readings.h"

#include <array>

namespace velta_tool {
namespace {

struct Text {
  Reading reading;
  const char* text;
};

/// In the order of the enumerators; B is what one operator's stream or one receiver's manual shows,
/// C what the field's name says.
constexpr std::array<Text, kReadings> kTexts = {{
    {Reading::kStrictRotation,
     "B  computation indicator 1: the strict matrix R3 R2 R1 (another order: up to some mm)"},
    {Reading::kRotationPoint,
     "C  computation indicator 3: coordinate-frame sense, matrix of small angles"},
    {Reading::kGridAtSource,
     "B  residual grids are read at the position in the source system (at the target's: up to 4 "
     "mm)"},
    {Reading::kWholeExtents, "B  extents of an area of validity are whole, about its centre"},
    {Reading::kHeightCorrection, "C  height indicator 0: the residual is added to the height"},
    {Reading::kHeightOfSource,
     "C  height indicator 2: the residual is taken off the height in the source system"},
    {Reading::kParabolas,
     "C  interpolation 1: parabolas through the nearest 3 by 3 points (bilinear: up to 0.5 mm "
     "off)"},
    {Reading::kNaturalSpline,
     "C  interpolation 2: a natural bicubic spline through all points (bilinear: up to 0.5 mm "
     "off)"},
    {Reading::kObliqueStereographic,
     "C  projection type 8: the double projection by the Gaussian sphere (the plain oblique\n"
     "     stereographic: 3 to 30 m off)"},
    {Reading::kPlaneGrid,
     "C  residuals of a plane grid are added to northing and easting, their height as above"},
}};

}  // namespace

std::string TextOf(const Readings& readings) {
  std::string lines;
  for (const auto& [reading, text] : kTexts) {
    if (readings[static_cast<std::size_t>(reading)]) lines += "  " + std::string(text) + '\n';
  }
  return lines;
}

}  // namespace velta_tool
