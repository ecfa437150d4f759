#pragma once

#include <array>
#include <memory>
#include <string>
#include <vector>

struct tiff;

namespace velta_tool {

/// Samples at points on parallels and meridians; angles in degrees.
struct GeoTiffImage {
  double north;  ///< of the first row
  double west;   ///< of the first column
  double northStep;
  double eastStep;
  std::size_t columns;
  std::size_t samplesPerPoint;
  std::vector<float> samples;  ///< rows from north to south, each from west to east
  std::string metadata;        ///< as GDAL takes it, in XML
};

/// A GeoTIFF file of several images, in memory.
class GeoTiffFile {
 public:
  /// \param axes of the ellipsoid, metres
  /// \param system name of the geographic system, ISO 8859-1
  GeoTiffFile(const std::array<double, 2>& axes, std::string system);
  ~GeoTiffFile();

  /// \throws std::runtime_error with the reason of libtiff or libgeotiff
  void Add(const GeoTiffImage& image);

  /// The bytes of the file, when all is added.
  /// \throws std::runtime_error likewise
  std::string Finish();

 private:
  struct Memory;

  void SetKeys();
  void Require(bool isDone) const;

  std::array<double, 2> axes_;
  std::string system_;
  std::unique_ptr<Memory> memory_;
  std::unique_ptr<tiff, void (*)(tiff*)> tiff_;
};

}  // namespace velta_tool
