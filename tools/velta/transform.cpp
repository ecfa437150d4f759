#include <CLI/App.hpp>
#include <CLI/Config.hpp>
#include <CLI/Formatter.hpp>
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <exception>
#include <memory>
#include <nlohmann/json.hpp>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

#include "command.h"
#include "definition_source.h"
#include "description.h"
#include "files.h"
#include "geodesy/proj_steps.h"
#include "geodesy/transformation.h"
#include "interrupt.h"
#include "lines.h"
#include "positions.h"
#include "terminal.h"

namespace velta_tool {
namespace {

constexpr std::size_t kLongestLine = 65536;
constexpr int kDecimalsOfDegrees = 11;
constexpr int kDecimalsOfMetres = 5;

struct Options {
  DefinitionSource source;
  std::string file = "-";
  std::string output = "-";
  bool inverse = false;
  bool entries = false;
  bool json = false;
};

Coordinates InRadians(const PositionLine& line) {
  return {line.north / kDegreesPerRadian, line.east / kDegreesPerRadian, line.height.value_or(0)};
}

Coordinates InMetres(const PositionLine& line) {
  return {line.north, line.east, line.height.value_or(0)};
}

std::vector<std::string> InputsOf(const Options& options) {
  std::vector<std::string> inputs = options.source.names();
  inputs.push_back(options.file);
  return inputs;
}

/// Transforms positions line by line.
class Work {
 public:
  explicit Work(const Options& options)
      : options_(options),
        transformation_(Read(options.source)),
        isPlane_(transformation_.definition().projection.has_value()),
        in_(options.file),
        out_(options.output, OutputKind::kText, InputsOf(options)),
        progress_(SizeTogether({options.file})) {}

  void DoAll() {
    std::string line;
    while (ReadLine(in_.buffer(), line, kLongestLine)) {
      ++number_;
      bytes_ += line.size() + 1;
      Do(line);
      if (line.size() > kLongestLine) SkipLine(in_.buffer());
      const bool mayWait = in_.buffer().in_avail() <= 0;
      if (mayWait) progress_.Show(bytes_);
      mayWait ? out_.Flush() : out_.FlushIfLarge();
    }
  }

  int Finish() {
    out_.Finish();
    ClearLine();
    if (withoutGrid_ > 0) {
      ReportNote("positions that no residual grid covers, transformed without: " +
                 std::to_string(withoutGrid_));
    }
    if (withoutHeight_ > 0 && withoutHeight_ < done_) {
      ReportNote("positions without a height among others with one, taken at 0: " +
                 std::to_string(withoutHeight_));
    }
    if (ellipsoidalHeights_ > 0) {
      ReportNote("heights that are ellipsoidal, not physical, for want of a height residual: " +
                 std::to_string(ellipsoidalHeights_));
    }
    if (transformation_.readings().any()) {
      ReportNote(
          "the coordinates rest on these readings of the messages:\n" +
          TextOf(transformation_.readings()) +
          "  B: one operator's stream or one receiver's manual shows it; C: its name says it");
    }
    if (done_ == 0 && status_ == kDone) {
      ReportFailure(options_.file + ": no position in it");
      return kFailed;
    }
    return status_;
  }

 private:
  void Do(const std::string& line) {
    if (IsRemark(line)) {
      if (!options_.json) out_.pending() += line + '\n';
      return;
    }
    try {
      if (line.size() > kLongestLine) throw std::invalid_argument("the line is too long");
      const PositionLine given = ParsePosition(line, !options_.inverse || !isPlane_);
      const Transformed position = Transform(given);
      options_.json ? AppendJson(given, position) : AppendColumns(given, position);
      ++done_;
      if (!position.grid && !transformation_.definition().grids.empty()) ++withoutGrid_;
      if (given.height && position.lacksHeightResidual) ++ellipsoidalHeights_;
      if (!given.height) ++withoutHeight_;
    } catch (const std::exception& error) {
      ReportFailure(options_.file + ":" + std::to_string(number_) + ": " + error.what());
      status_ = kFailed;
    }
  }

  Transformed Transform(const PositionLine& given) {
    if (!options_.inverse) return transformation_.Forward(InRadians(given));
    return transformation_.Inverse(isPlane_ ? InMetres(given) : InRadians(given));
  }

  void AppendColumns(const PositionLine& given, const Transformed& position) {
    std::string& out = out_.pending();
    const bool isPlane = isPlane_ && !options_.inverse;
    const Coordinates& to = options_.inverse ? position.source
                            : isPlane        ? *position.plane
                                             : position.target;
    const double perUnit = isPlane ? 1 : kDegreesPerRadian;
    const int decimals = isPlane ? kDecimalsOfMetres : kDecimalsOfDegrees;
    AppendFixed(to.north * perUnit, decimals, out);
    out += given.separator;
    AppendFixed(to.east * perUnit, decimals, out);
    if (given.height) {
      out += given.separator;
      AppendFixed(to.height, kDecimalsOfMetres, out);
    }
    if (!given.rest.empty()) {
      (out += given.separator) += given.rest;
      // Tabs would be shown as the control characters that they are.
      std::replace(out.end() - static_cast<std::ptrdiff_t>(given.rest.size()), out.end(), '\t',
                   ' ');
    }
    if (options_.entries) {
      AppendEntry(given, position.area, out);
      AppendEntry(given, position.grid, out);
      AppendEntry(given, position.planeGrid, out);
    }
    out += '\n';
  }

  /// \param holder of an entry; null: "-"
  template <class Holder>
  static void AppendEntry(const PositionLine& given, const Holder* holder, std::string& out) {
    (out += given.separator) += holder ? holder->entry : "-";
  }

  void AppendJson(const PositionLine& given, const Transformed& position) {
    const auto height = [&given](double value) -> nlohmann::json {
      return given.height ? nlohmann::json(value) : nlohmann::json();
    };
    const auto entry = [](const auto* holder) -> nlohmann::json {
      return holder ? nlohmann::json(holder->entry) : nlohmann::json();
    };
    const auto inDegrees = [](double radians) { return radians * kDegreesPerRadian; };
    nlohmann::ordered_json json = {
        {"latitude", inDegrees(position.source.north)},
        {"longitude", inDegrees(position.source.east)},
        {"height", height(position.source.height)},
        {"targetLatitude", inDegrees(position.target.north)},
        {"targetLongitude", inDegrees(position.target.east)},
        {"targetHeight", height(position.target.height)},
        {"northing", nullptr},
        {"easting", nullptr},
        {"datumEntry", entry(position.area)},
        {"gridEntry", entry(position.grid)},
        {"projectionEntry", nullptr},
        {"planeGridEntry", entry(position.planeGrid)},
    };
    if (position.plane) {
      json["northing"] = position.plane->north;
      json["easting"] = position.plane->east;
      json["projectionEntry"] = entry(&*transformation_.definition().projection);
    }
    // As they are given, to the last bit.
    const bool isPlane = options_.inverse && isPlane_;
    json[isPlane ? "northing" : options_.inverse ? "targetLatitude" : "latitude"] = given.north;
    json[isPlane ? "easting" : options_.inverse ? "targetLongitude" : "longitude"] = given.east;
    if (options_.inverse && given.height) json["targetHeight"] = *given.height;
    out_.pending() += json.dump() + '\n';
  }

  const Options& options_;
  Transformation transformation_;
  bool isPlane_;
  Input in_;
  Output out_;
  Progress progress_;
  std::uint64_t number_ = 0;  ///< of the line
  std::uint64_t bytes_ = 0;
  std::uint64_t done_ = 0;
  std::uint64_t withoutGrid_ = 0;
  std::uint64_t ellipsoidalHeights_ = 0;
  std::uint64_t withoutHeight_ = 0;
  int status_ = kDone;
};

int Run(const Options& options) {
  if (options.source.messages == "-" && options.file == "-") {
    throw WrongCall("positions and messages cannot both come from standard input: name a FILE");
  }
  std::unique_ptr<Work> work;
  FinishWhenInterrupted([&work] {
    if (work) return work->Finish();
    ReportFailure("interrupted before the first position");
    return kFailed;
  });
  work = std::make_unique<Work>(options);
  work->DoAll();
  return work->Finish();
}

}  // namespace

void AddTransform(CLI::App& program, Action& action) {
  const auto options = std::make_shared<Options>();
  CLI::App* command = program.add_subcommand(
      "transform", "Transforms positions by datum and projection files, or by a stream.");
  command->add_option("FILE", options->file, "the positions, \"-\" for standard input")
      ->check(kFileName)
      ->capture_default_str();
  auto* datum =
      command->add_option("--datum", options->source.datum, "the datum file")->check(kDatumFile);
  auto* projection =
      command->add_option("--projection", options->source.projection, "the projection file")
          ->check(kProjectionFile)
          ->needs(datum);
  AddMessages(*command, options->source)->excludes(datum)->excludes(projection);
  command->add_flag("--inverse", options->inverse, "from the local system to the satellites'");
  command->add_flag("--entries", options->entries,
                    "add columns: the entries of datum, grid and plane grid that were used");
  command->add_option("-o,--output", options->output, "the output, \"-\" for standard output")
      ->check(kFileName)
      ->capture_default_str();
  command->add_flag("--json", options->json, "print JSON, one object a line");
  command->footer(
      "A line has a latitude and a longitude in degrees (52.5 or 52°30'00\"N), a height in metres\n"
      "if there is one, and anything behind, which is passed on; blanks or commas between. "
      "Printed\n"
      "are northing, easting and height in metres (southing and westing where the projection is\n"
      "orientated so), or without a projection latitude, longitude and height. Without a height 0\n"
      "is taken and none printed. Blank lines and those that begin with \"#\" are passed on.\n"
      "The first area and the first residual grid that hold a position are used. A line that is "
      "no\n"
      "position, or that no area holds, is reported, and the others are done. From a stream what\n"
      "comes again takes the place of what came before, and everything that PROJ can do is done,\n"
      "also what files do not keep: a 1026, Lambert projections, Mercator's scale.\n"
      "\n"
      "Where no source settles how a message is to be read, it is read so:\n" +
      TextOf(Readings().set()) +
      "B: one operator's stream or one receiver's manual shows it; C: its name says it.\n"
      "\n"
      "Example:\n"
      "  velta ingest --dir out examples/streams/dhdn.rtcm3\n"
      "  echo 52.002 9.002 100 | velta transform --datum "
      "out/datums/rtcmdata/AUTO_DHDN_BESEL.dff --projection "
      "out/projections/rtcmdata/AUTO_DHDN_BESEL.prj\n"
      "  echo 52.002 9.002 100 | velta transform --messages examples/streams/dhdn.rtcm3");
  command->callback([&action, options] {
    if (options->source.datum.empty() && options->source.messages.empty()) {
      throw CLI::RequiredError("--datum or --messages");
    }
    action = [options] { return Run(*options); };
  });
}

}  // namespace velta_tool
