#include <CLI/App.hpp>
#include <CLI/Config.hpp>
#include <CLI/Formatter.hpp>
#include <algorithm>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

#include "angle.h"
#include "busy.h"
#include "command.h"
#include "definition_source.h"
#include "description.h"
#include "files.h"
#include "geodesy/exports.h"
#include "geodesy/proj_steps.h"

namespace velta_tool {
namespace {

struct Options {
  DefinitionSource source;
  std::string format;
  std::vector<std::string> files;
  std::optional<double> latitude;   // degrees
  std::optional<double> longitude;  // degrees
  GridFiles grids;
  std::string output = "-";
};

/// Sorts the files by their kinds.
void TakeFiles(Options& options) {
  for (const std::string& file : options.files) {
    const bool isDatum = KindOf(file) == FileKind::kDatum;
    std::string& place = isDatum ? options.source.datum : options.source.projection;
    if (!place.empty()) {
      throw CLI::ValidationError("FILE", "one datum file and one projection file at most");
    }
    place = file;
  }
  if (options.source.datum.empty() && options.source.messages.empty()) {
    throw CLI::RequiredError("a datum file or --messages");
  }
}

/// Refuses what would have no effect, or another than is meant.
void CheckUse(const Options& options) {
  const auto& [horizontal, vertical] = options.grids;
  const bool isGrid = options.format == "gtg";
  const bool hasGrids = !horizontal.empty() || !vertical.empty();
  if (isGrid && !hasGrids) throw CLI::RequiredError("--hgrid or --vgrid");
  if (isGrid && horizontal == vertical) {
    throw CLI::ValidationError("--vgrid", "the two grids need files of their own");
  }
  if (isGrid && options.output != "-") {
    throw CLI::ValidationError("--output", "gtg writes the files of --hgrid and --vgrid");
  }
  if (hasGrids && !isGrid && options.format != "proj") {
    throw CLI::ValidationError("--format", "only gtg and proj take grids");
  }
  const bool takesAll = isGrid || options.format == "geojson";
  if (takesAll && options.latitude) {
    throw CLI::ValidationError("--lat", options.format + " takes all areas");
  }
  for (const std::string& grid : {horizontal, vertical}) {
    if (!isGrid && grid.find_first_of(",#\"") != grid.npos) {
      throw CLI::ValidationError("--hgrid, --vgrid", R"(PROJ takes no "," nor "#" in a name)");
    }
  }
}

/// The datum shift that is to be exported.
/// \throws std::runtime_error when there is none, or more than one to choose from
std::size_t ShiftOf(const Definition& definition, const Options& options) {
  std::optional<std::size_t> chosen;
  for (const DatumArea& area : definition.areas) {
    if (options.latitude && !area.area.Inside(*options.latitude / kDegreesPerRadian,
                                              *options.longitude / kDegreesPerRadian, false)) {
      continue;
    }
    if (!area.shift) {
      if (!options.latitude) continue;
      throw std::runtime_error(area.entry + " cannot be used");
    }
    if (options.latitude) return *area.shift;
    if (chosen && chosen != area.shift) {
      throw std::runtime_error(
          "areas have different datum shifts: choose one by a position in it, --lat and --lon");
    }
    chosen = area.shift;
  }
  if (chosen) return *chosen;
  throw std::runtime_error(options.latitude ? "no area holds the position"
                                            : "no entry can be used");
}

void Write(const std::string& bytes, OutputKind kind, const std::string& name,
           const Options& options) {
  std::vector<std::string> inputs = options.source.names();
  Output out(name, kind, inputs);
  out.pending() = bytes;
  out.Finish();
}

void WriteGrids(const Definition& definition, const Options& options, const TellLeftOut& tell) {
  const GridTiffs grids = MakeGridTiffs(definition, tell);
  if (grids.horizontal.empty() && grids.vertical.empty()) {
    throw std::runtime_error("there is no residual grid to export");
  }
  const auto check = [&](const std::string& bytes, const std::string& name, const char* kind) {
    if (name.empty() && !bytes.empty()) {
      tell("the " + std::string(kind) + " residuals, for which no file is named");
    }
    if (!name.empty() && bytes.empty()) {
      throw std::runtime_error(name + ": not written: there are no " + kind + " residuals");
    }
  };
  check(grids.horizontal, options.grids.horizontal, "horizontal");
  check(grids.vertical, options.grids.vertical, "height");
  const auto write = [&](const std::string& bytes, const std::string& name) {
    if (!name.empty()) Write(bytes, OutputKind::kBinary, name, options);
  };
  write(grids.horizontal, options.grids.horizontal);
  write(grids.vertical, options.grids.vertical);
}

int Run(const Options& options) {
  const Definition definition = Read(options.source);
  const Busy busy("exporting", options.source.names());
  const TellLeftOut tell = [&](std::string_view what) {
    ReportNote("not in the " + options.format + ": " + std::string(what));
  };
  if (options.format == "gtg") {
    WriteGrids(definition, options, tell);
    return kDone;
  }
  std::string text;
  if (options.format == "geojson") {
    text = GeoJson(definition, tell);
  } else {
    const std::size_t shift = ShiftOf(definition, options);
    text = options.format == "wkt" ? Wkt(definition, shift, tell)
                                   : ProjPipeline(definition, shift, options.grids, tell);
  }
  Write(text, OutputKind::kText, options.output, options);
  return kDone;
}

}  // namespace

void AddExport(CLI::App& program, Action& action) {
  const auto options = std::make_shared<Options>();
  CLI::App* command = program.add_subcommand(
      "export", "Writes a transformation in a form that other programs read.");
  command->add_option("FILE", options->files, "a datum file, or one and a projection file")
      ->check(kDatumOrProjectionFile);
  command->add_option("--format", options->format, "proj, wkt, gtg or geojson")
      ->required()
      ->check(CLI::IsMember({"proj", "wkt", "gtg", "geojson"}));
  AddMessages(*command, options->source)->excludes("FILE");
  AddPosition(*command, options->latitude, options->longitude);
  command
      ->add_option("--hgrid", options->grids.horizontal,
                   "GeoTIFF grid of horizontal residuals: gtg writes it, proj names it")
      ->check(kFileName);
  command
      ->add_option("--vgrid", options->grids.vertical, "GeoTIFF grid of height residuals, likewise")
      ->check(kFileName);
  command
      ->add_option("-o,--output", options->output,
                   "the output of the other forms, \"-\" for standard output")
      ->check(kFileName)
      ->capture_default_str();
  const std::string withoutProj =
      "This build has no PROJ: of the forms only proj and geojson are in it.\n\n";
  const std::string withProj =
      "  velta export --format gtg AUTO_DHDN_BESEL.dff --hgrid hor.tif --vgrid ver.tif\n"
      "  velta export --format proj AUTO_DHDN_BESEL.dff AUTO_DHDN_BESEL.prj --hgrid hor.tif "
      "--vgrid ver.tif\n"
      "  velta export --format wkt AUTO_DHDN_BESEL.dff AUTO_DHDN_BESEL.prj\n";
  command->footer(
      (kHasProj ? "" : withoutProj) +
      "  proj     a pipeline for cct and every user of PROJ, with the columns of \"velta\n"
      "           transform\": latitude, longitude in degrees, height in; northing, easting, "
      "height\n"
      "           out. Grids that were exported as gtg are applied when they are named; the\n"
      "           pipeline leads forward only then.\n"
      "  wkt      the local system as WKT 2: a projected one, bound to WGS 84 by the datum shift\n"
      "  gtg      the residual grids as GeoTIFF grids of PROJ; windows that share points are "
      "joined\n"
      "  geojson  areas, grids and their points with residuals; degrees of the source system\n"
      "Where the areas of a file have different datum shifts, a position chooses one. What a form\n"
      "cannot say is told on standard error.\n"
      "\n"
      "Example:\n"
      "  velta ingest --datum-dir . --projection-dir . examples/streams/dhdn.rtcm3\n" +
      (kHasProj ? withProj : "") +
      "  velta export --format proj AUTO_DHDN_BESEL.dff AUTO_DHDN_BESEL.prj\n"
      "  velta export --format geojson AUTO_DHDN_BESEL.dff");
  command->callback([&action, options] {
    TakeFiles(*options);
    CheckUse(*options);
    action = [options] { return Run(*options); };
  });
}

}  // namespace velta_tool
