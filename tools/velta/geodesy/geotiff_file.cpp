#include "geodesy/geotiff_file.h"

#include <geotiff/geotiff.h>
#include <geotiff/geovalues.h>
#include <geotiff/xtiffio.h>
#include <tiffio.h>

#include <algorithm>
#include <cstdarg>
#include <cstdint>
#include <cstdio>
#include <stdexcept>
#include <utility>

namespace velta_tool {

/// A file as libtiff reads and writes it, and what it last complained of.
struct GeoTiffFile::Memory {
  std::string bytes;
  std::size_t at = 0;
  std::string error;

  static Memory& Of(thandle_t handle) { return *static_cast<Memory*>(handle); }

  static tmsize_t Read(thandle_t handle, void* to, tmsize_t size) {
    Memory& memory = Of(handle);
    const std::size_t left = memory.bytes.size() - std::min(memory.at, memory.bytes.size());
    const std::size_t count = std::min(static_cast<std::size_t>(size), left);
    memory.bytes.copy(static_cast<char*>(to), count, memory.bytes.size() - left);
    memory.at += count;
    return static_cast<tmsize_t>(count);
  }

  static tmsize_t Write(thandle_t handle, void* from, tmsize_t size) {
    Memory& memory = Of(handle);
    const auto count = static_cast<std::size_t>(size);
    memory.bytes.resize(std::max(memory.bytes.size(), memory.at + count));
    std::copy_n(static_cast<const char*>(from), count, memory.bytes.data() + memory.at);
    memory.at += count;
    return size;
  }

  static toff_t Seek(thandle_t handle, toff_t offset, int whence) {
    Memory& memory = Of(handle);
    if (whence == SEEK_CUR) offset += memory.at;
    if (whence == SEEK_END) offset += memory.bytes.size();
    memory.at = offset;
    return offset;
  }

  static toff_t Size(thandle_t handle) { return Of(handle).bytes.size(); }
  static int Close(thandle_t) { return 0; }

  static int TakeError(TIFF*, void* memory, const char*, const char* format, va_list values) {
    char text[256];
    std::vsnprintf(text, sizeof(text), format, values);
    static_cast<Memory*>(memory)->error = text;
    return 1;  // said, as far as libtiff is concerned
  }
};

namespace {

using Options = std::unique_ptr<TIFFOpenOptions, decltype(&TIFFOpenOptionsFree)>;
using Keys = std::unique_ptr<GTIF, decltype(&GTIFFree)>;

/// Has an image take GDAL's tag, which libtiff does not know.
bool AddMetadataTag(TIFF* tiff) {
  static char name[] = "GDALMetadata";  // which libtiff keeps a pointer to
  const TIFFFieldInfo field = {TIFFTAG_GDAL_METADATA, -1,   -1,    TIFF_ASCII,
                               FIELD_CUSTOM,          true, false, name};
  return TIFFMergeFieldInfo(tiff, &field, 1) == 0;
}

}  // namespace

GeoTiffFile::GeoTiffFile(const std::array<double, 2>& axes, std::string system)
    : axes_(axes),
      system_(std::move(system)),
      memory_(std::make_unique<Memory>()),
      tiff_(nullptr, TIFFClose) {
  const Options options(TIFFOpenOptionsAlloc(), TIFFOpenOptionsFree);
  TIFFOpenOptionsSetErrorHandlerExtR(options.get(), Memory::TakeError, memory_.get());
  TIFFOpenOptionsSetWarningHandlerExtR(options.get(), Memory::TakeError, memory_.get());
  XTIFFInitialize();
  tiff_.reset(TIFFClientOpenExt("GeoTIFF", "w", memory_.get(), Memory::Read, Memory::Write,
                                Memory::Seek, Memory::Close, Memory::Size, nullptr, nullptr,
                                options.get()));
  Require(tiff_ != nullptr);
}

GeoTiffFile::~GeoTiffFile() = default;

void GeoTiffFile::Add(const GeoTiffImage& image) {
  TIFF* const tiff = tiff_.get();
  const auto set = [&](std::uint32_t tag, auto... values) {
    Require(TIFFSetField(tiff, tag, values...) == 1);
  };
  const auto rowLength = image.columns * image.samplesPerPoint;
  const auto rows = image.samples.size() / rowLength;
  set(TIFFTAG_IMAGEWIDTH, static_cast<std::uint32_t>(image.columns));
  set(TIFFTAG_IMAGELENGTH, static_cast<std::uint32_t>(rows));
  set(TIFFTAG_SAMPLESPERPIXEL, static_cast<int>(image.samplesPerPoint));
  set(TIFFTAG_BITSPERSAMPLE, static_cast<int>(8 * sizeof(float)));
  set(TIFFTAG_SAMPLEFORMAT, SAMPLEFORMAT_IEEEFP);
  set(TIFFTAG_PLANARCONFIG, PLANARCONFIG_CONTIG);
  set(TIFFTAG_PHOTOMETRIC, PHOTOMETRIC_MINISBLACK);
  const std::vector<std::uint16_t> more(image.samplesPerPoint - 1, EXTRASAMPLE_UNSPECIFIED);
  if (!more.empty()) set(TIFFTAG_EXTRASAMPLES, static_cast<int>(more.size()), more.data());
  set(TIFFTAG_ROWSPERSTRIP, TIFFDefaultStripSize(tiff, 0));
  const double scale[] = {image.eastStep, image.northStep, 0};
  set(TIFFTAG_GEOPIXELSCALE, 3, scale);
  const double tiepoint[] = {0, 0, 0, image.west, image.north, 0};
  set(TIFFTAG_GEOTIEPOINTS, 6, tiepoint);
  Require(AddMetadataTag(tiff));
  set(TIFFTAG_GDAL_METADATA, image.metadata.c_str());
  SetKeys();
  for (std::size_t row = 0; row < rows; ++row) {
    const auto first = image.samples.begin() + static_cast<std::ptrdiff_t>(row * rowLength);
    std::vector<float> line(first, first + static_cast<std::ptrdiff_t>(rowLength));
    Require(TIFFWriteScanline(tiff, line.data(), static_cast<std::uint32_t>(row), 0) == 1);
  }
  Require(TIFFWriteDirectory(tiff) == 1);
}

void GeoTiffFile::SetKeys() {
  const Keys keys(GTIFNew(tiff_.get()), GTIFFree);
  Require(keys != nullptr);
  const auto setCode = [&](geokey_t key, int code) {
    Require(GTIFKeySet(keys.get(), key, TYPE_SHORT, 1, code) == 1);
  };
  const auto setText = [&](geokey_t key, const std::string& text) {
    Require(GTIFKeySet(keys.get(), key, TYPE_ASCII, 0, text.c_str()) == 1);
  };
  const auto setNumber = [&](geokey_t key, double number) {
    Require(GTIFKeySet(keys.get(), key, TYPE_DOUBLE, 1, number) == 1);
  };
  setCode(GTModelTypeGeoKey, ModelTypeGeographic);
  setCode(GTRasterTypeGeoKey, RasterPixelIsPoint);
  setCode(GeographicTypeGeoKey, KvUserDefined);
  setText(GeogCitationGeoKey, system_);
  setCode(GeogGeodeticDatumGeoKey, KvUserDefined);
  setCode(GeogPrimeMeridianGeoKey, PM_Greenwich);
  setCode(GeogAngularUnitsGeoKey, Angular_Degree);
  setCode(GeogEllipsoidGeoKey, KvUserDefined);
  setNumber(GeogSemiMajorAxisGeoKey, axes_[0]);
  setNumber(GeogSemiMinorAxisGeoKey, axes_[1]);
  Require(GTIFWriteKeys(keys.get()) == 1);
}

std::string GeoTiffFile::Finish() {
  Require(TIFFFlush(tiff_.get()) == 1);
  tiff_.reset();
  return std::move(memory_->bytes);
}

void GeoTiffFile::Require(bool isDone) const {
  if (isDone) return;
  throw std::runtime_error("the GeoTIFF cannot be made: " +
                           (memory_->error.empty() ? "unknown" : memory_->error));
}

}  // namespace velta_tool
