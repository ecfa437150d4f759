#include <algorithm>
#include <array>
#include <cmath>
#include <cstdint>
#include <filesystem>
#include <map>
#include <memory>
#include <nlohmann/json.hpp>
#include <set>
#include <stdexcept>
#include <string>
#include <system_error>
#include <utility>
#include <vector>

#include "busy.h"
#include "command.h"
#include "description.h"
#include "files.h"
#include "geodesy/definition.h"
#include "geodesy/stored_definition.h"
#include "map_page.h"
#include "orxutils/path.h"
#include "terminal.h"

namespace velta_tool {
namespace {

using nlohmann::json;

struct Options {
  std::vector<std::string> files;
  std::string output;
};

/// The page's places are arc-seconds or metres with so many decimals, its residuals integers: of a
/// millionth of an arc-second or a tenth of a millimetre. All are well below a message's steps.
constexpr double kPlaceUnits = 1e4;
constexpr double kAngleUnits = 1e6;
constexpr double kLengthUnits = 1e4;

/// What the page shows together: the files of one kind. Windows are kept in columns, as their
/// numbers make up nearly all of the page.
struct Sheet {
  double factor;         ///< from what is stored to arc-seconds or metres
  double residualUnits;  ///< of north and east residuals
  json files = json::array();
  json systems = json::array();  ///< of the files: source, target, height indicators
  json areas = json::array();
  json fileOf = json::array();
  json entries = json::array();
  json places = json::array();     ///< south edge, north extent, west edge, east extent
  json methods = json::array();    ///< horizontal and height interpolation; -1 does not apply
  json means = json::array();      ///< north, east, height
  json residuals = json::array();  ///< 16 to the north, 16 to the east, 16 heights; means taken off
  json problems = json::object();  ///< by the window's place in the columns
};

/// False also for what is no number.
bool IsDrawable(double number) {
  constexpr double kMost = 1e15;  // beyond everything on earth, and exact as an integer
  return std::abs(number) < kMost;
}

bool IsDrawable(const TRectRgn& area) {
  return IsDrawable(area.south) && IsDrawable(area.northExtent) && IsDrawable(area.west) &&
         IsDrawable(area.eastExtent);
}

void AddPlace(const TRectRgn& area, double factor, json& places) {
  for (const double edge : {area.south, area.northExtent, area.west, area.eastExtent}) {
    places.push_back(std::round(edge * factor * kPlaceUnits) / kPlaceUnits);
  }
}

/// Areas with the same edges are one to the page, with the number of entries that have it.
void AddAreas(const std::vector<DatumArea>& areas, Sheet& sheet) {
  struct Count {
    std::size_t entries = 0;
    std::size_t unusable = 0;
  };
  std::map<std::array<double, 4>, Count> counts;
  for (const DatumArea& area : areas) {
    if (!IsDrawable(area.area)) continue;
    const auto& [south, northExtent, west, eastExtent] = area.area;
    Count& count = counts[{south, northExtent, west, eastExtent}];
    ++count.entries;
    if (!area.shift) ++count.unusable;
  }
  for (const auto& [edges, count] : counts) {
    json place = json::array();
    AddPlace({edges[0], edges[1], edges[2], edges[3]}, sheet.factor, place);
    sheet.areas.push_back({{"file", sheet.files.size()},
                           {"place", std::move(place)},
                           {"entries", count.entries},
                           {"unusable", count.unusable}});
  }
}

void AddWindow(const ResidualGrid& grid, Sheet& sheet) {
  bool hasNumbers = true;
  const auto integer = [&](double number) -> std::int64_t {
    if (IsDrawable(number)) return std::llround(number);
    hasNumbers = false;
    return 0;
  };
  const auto add = [&](const ResidualGrid::Points& points, double mean, double units) {
    sheet.means.push_back(integer(mean * units));
    for (const double value : points) sheet.residuals.push_back(integer((value - mean) * units));
  };
  const double horizontal = sheet.factor * sheet.residualUnits;
  add(grid.north, grid.means[0], horizontal);
  add(grid.east, grid.means[1], horizontal);
  add(grid.height, grid.means[2], kLengthUnits);
  const std::string problem = hasNumbers ? grid.problem : "a residual is no number";
  if (!problem.empty()) sheet.problems[std::to_string(sheet.fileOf.size())] = problem;
  sheet.fileOf.push_back(sheet.files.size());
  sheet.entries.push_back(Printable(grid.entry));
  AddPlace(grid.area, sheet.factor, sheet.places);
  sheet.methods.push_back(grid.horShift ? grid.horInterpolation : -1);
  sheet.methods.push_back(grid.vertShift ? grid.vertInterpolation : -1);
}

std::set<std::uint32_t> HeightIndicators(const Definition& definition) {
  std::set<std::uint32_t> indicators;
  for (const DatumShift& shift : definition.shifts) indicators.insert(shift.heightIndicator);
  return indicators;
}

/// \param name of the file on the page
void AddFile(const std::string& file, const std::string& name, const Definition& definition,
             const std::vector<ResidualGrid>& windows, Sheet& sheet) {
  AddAreas(definition.areas, sheet);
  std::size_t unplaced = 0;
  for (const ResidualGrid& window : windows) {
    if (IsDrawable(window.area)) {
      AddWindow(window, sheet);
    } else {
      ++unplaced;
    }
  }
  if (unplaced > 0) {
    ReportNote(file +
               ": residual grids that lie nowhere and are not shown: " + std::to_string(unplaced));
  }
  if (definition.areas.empty() && windows.empty()) {
    ReportNote(file + ": nothing in it that a map could show");
  }
  sheet.files.push_back(Printable(name));
  sheet.systems.push_back({{"source", Printable(definition.sourceName)},
                           {"target", Printable(definition.targetName)},
                           {"heightIndicators", HeightIndicators(definition)}});
}

json ToJson(Sheet sheet) {
  return {{"files", std::move(sheet.files)},
          {"systems", std::move(sheet.systems)},
          {"areas", std::move(sheet.areas)},
          {"residualUnits", sheet.residualUnits},
          {"heightUnits", kLengthUnits},
          {"fileOf", std::move(sheet.fileOf)},
          {"entries", std::move(sheet.entries)},
          {"places", std::move(sheet.places)},
          {"methods", std::move(sheet.methods)},
          {"means", std::move(sheet.means)},
          {"residuals", std::move(sheet.residuals)},
          {"problems", std::move(sheet.problems)}};
}

/// The data as text that ends no element of the page, whatever names are in it.
std::string Embedded(const json& data) {
  const std::string text = data.dump(-1, ' ', false, json::error_handler_t::replace);
  std::string embedded;
  embedded.reserve(text.size());
  for (const char c : text) {
    if (c == '<') {
      embedded += "\\u003c";
    } else {
      embedded += c;
    }
  }
  return embedded;
}

/// The files without those that stand before them under another name, too.
std::vector<std::string> EachOnce(const std::vector<std::string>& files) {
  std::vector<std::string> once;
  for (const std::string& file : files) {
    const bool isThere = std::any_of(once.begin(), once.end(), [&](const std::string& other) {
      std::error_code error;  // what is not there is told when it is read
      return std::filesystem::equivalent(orx::ToSystemPath(PathOf(file)),
                                         orx::ToSystemPath(PathOf(other)), error);
    });
    if (isThere) {
      ReportNote(file + ": is named twice and drawn once");
    } else {
      once.push_back(file);
    }
  }
  return once;
}

/// A file's name without its directory, unless another has the same.
std::string PageName(const std::string& file, const std::vector<std::string>& files) {
  const auto nameOf = [](const std::string& path) { return NameOf(PathOf(path).filename()); };
  const auto isSame = [&](const std::string& other) { return nameOf(other) == nameOf(file); };
  return std::count_if(files.begin(), files.end(), isSame) > 1 ? file : nameOf(file);
}

int Run(const Options& options) {
  Output out(options.output, OutputKind::kText, options.files);
  const Busy busy("drawing", options.files);
  Sheet datums{kArcSecondsPerRadian, kAngleUnits};
  Sheet projections{1, kLengthUnits};
  const std::vector<std::string> files = EachOnce(options.files);
  for (const std::string& file : files) {
    const std::string name = PageName(file, files);
    if (KindOf(file) == FileKind::kDatum) {
      const Definition definition = ReadDatumFile(file);
      AddFile(file, name, definition, definition.grids, datums);
    } else {
      Definition definition;
      AddProjectionFile(file, definition);
      AddFile(file, name, definition, definition.planeGrids, projections);
    }
  }
  const json data = {{"datums", ToJson(std::move(datums))},
                     {"projections", ToJson(std::move(projections))}};
  const std::size_t place = kMapPage.find(kMapData);
  out.pending() += kMapPage.substr(0, place);
  out.pending() += Embedded(data);
  out.pending() += kMapPage.substr(place + kMapData.size());
  out.Finish();
  return kDone;
}

}  // namespace

void AddMap(CLI::App& program, Action& action) {
  const auto options = std::make_shared<Options>();
  CLI::App* command = program.add_subcommand(
      "map", "Draws areas, grid windows and residuals of files as a page for a browser.");
  command->add_option("FILE", options->files, "datum and projection files")
      ->required()
      ->check(kDatumOrProjectionFile);
  command->add_option("-o,--output", options->output, "the page, \"-\" for standard output")
      ->required()
      ->check(kFileName);
  command->footer(
      "The page is one file that needs no network. It shows where entries are valid, the windows\n"
      "of their residual grids, the horizontal residuals as arrows to scale and the heights as\n"
      "colours, and the numbers of a window that is pointed at. Plane grids of projection files\n"
      "have a tab of their own.\n"
      "\n"
      "Example:\n"
      "  velta ingest --datum-dir . --projection-dir . examples/streams/rover.rtcm3\n"
      "  velta map ROVER_NET.dff -o map.html");
  command->callback([&action, options] { action = [options] { return Run(*options); }; });
}

}  // namespace velta_tool
