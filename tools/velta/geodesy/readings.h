#pragma once

#include <bitset>
#include <string>

namespace velta_tool {

/// How the messages are read where no source settles it for all: what a coordinate may rest on.
enum class Reading {
  kStrictRotation,
  kRotationPoint,
  kGridAtSource,
  kWholeExtents,
  kHeightCorrection,
  kHeightOfSource,
  kParabolas,
  kNaturalSpline,
  kObliqueStereographic,
  kPlaneGrid,
};
inline constexpr std::size_t kReadings = 10;
using Readings = std::bitset<kReadings>;

/// Each of the readings as a line.
std::string TextOf(const Readings& readings);

}  // namespace velta_tool
