#pragma once

#include <cstdint>

namespace orx::cs::velta {

/// A 4 by 4 residual grid in physical units: the ellipsoidal grid of a datum (north and east are
/// latitude and longitude in radians) or the plane grid of a projection (northing and easting in
/// metres). Heights are metres. The 16 points keep the order of the message.
struct TableData {
  std::uint32_t reserved1 = 0;         ///< not used
  bool hasTable = false;               ///< a message was converted into this block
  bool vertShift = false;              ///< vertical shifts apply
  bool horShift = false;               ///< horizontal shifts apply
  std::uint64_t reserved2[3] = {};     ///< not used
  std::int32_t horInterpolation = 0;   ///< horizontal interpolation code, as received
  std::int32_t vertInterpolation = 0;  ///< vertical interpolation code, as received
  double centerN = 0.0;                ///< north coordinate of the grid's centre
  double centerE = 0.0;                ///< east coordinate of the grid's centre
  double meanValue[3] = {};            ///< mean residuals: north, east, height
  double dNdLatData[16] = {};          ///< north residuals
  double dEdLonData[16] = {};          ///< east residuals
  double dHData[16] = {};              ///< height residuals
  /// South edge, north extent, west edge, east extent, north step, east step.
  double bounds[6] = {};
  std::uint8_t reserved3[2] = {};  ///< not used
};

}  // namespace orx::cs::velta
