#include <geotiff/geotiff.h>
#include <proj.h>
#include <tiffio.h>

#include <algorithm>
#include <string_view>

#include "versions.h"

namespace velta_tool {

std::string ProjVersions() {
  // "LIBTIFF, Version 4.5.0" and lines of its authors.
  constexpr std::string_view kBehind = "Version ";
  std::string_view tiff = TIFFGetVersion();
  tiff = tiff.substr(0, tiff.find('\n'));
  tiff.remove_prefix(std::min(tiff.size(), tiff.find(kBehind) + kBehind.size()));
  constexpr int kGeotiff[] = {LIBGEOTIFF_VERSION / 1000, LIBGEOTIFF_VERSION / 100 % 10,
                              LIBGEOTIFF_VERSION / 10 % 10};
  return std::string("PROJ ") + proj_info().version + ", libgeotiff " +
         Numbers(kGeotiff[0], kGeotiff[1], kGeotiff[2]) + ", libtiff " + std::string(tiff);
}

}  // namespace velta_tool
