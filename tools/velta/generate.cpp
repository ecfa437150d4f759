#include <CLI/App.hpp>
#include <CLI/Config.hpp>
#include <CLI/Formatter.hpp>
#include <cstdint>
#include <cstdio>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>
#include <variant>
#include <vector>

#include "angle.h"
#include "command.h"
#include "description.h"
#include "files.h"
#include "orxutils/orx_string.h"
#include "rtcm3/codec.h"
#include "rtcm3/json_lines.h"
#include "rtcm3/message.h"
#include "terminal.h"
#include "velta/rtcm_generator.h"

namespace velta_tool {
namespace rtcm3 = orx::cs::velta::rtcm3;
namespace {

using orx::cs::velta::AnnouncementBit;
using orx::cs::velta::RTCMGenerator;
using rtcm3::Message;

constexpr double kMaxLatitude = 90;
constexpr double kMaxLongitude = 360;
constexpr std::int32_t kMaxSystemId = 255;
constexpr std::size_t kMostAreasNamed = 10;

struct Options {
  std::string datum;
  std::string projection;
  double latitude = 0;   // degrees
  double longitude = 0;  // degrees
  std::optional<double> northing;
  std::optional<double> easting;
  std::int32_t systemId = 0;
  std::string output = "-";
  bool json = false;
};

std::string Decimal(double number) {
  char text[32];
  std::snprintf(text, sizeof text, "%.7g", number);
  return text;
}

/// Says that a datum file has no entry to use for the position, and which areas there are. The
/// library does not tell an area that is not there from an entry that it cannot use.
std::runtime_error NoAreaError(const Options& options, const RTCMGenerator& generator) {
  const auto datums = generator.getAllDatums();
  std::string text = options.datum + ": no area holds latitude " + Decimal(options.latitude) +
                     ", longitude " + Decimal(options.longitude) +
                     " degrees, or an entry up to the one that does cannot be used";
  if (datums.empty()) return std::runtime_error(text + "; the file has no complete entry");
  text += "; the areas are";
  for (std::size_t i = 0; i < datums.size() && i < kMostAreasNamed; ++i) {
    const Edges area(datums[i].validityArea);
    text += "\n  latitude " + Decimal(area.south) + " to " + Decimal(area.north) + ", longitude " +
            Decimal(area.west) + " to " + Decimal(area.east) + " degrees (" +
            Printable(orx::ToUtf8(datums[i].targetDatumName)) + ")";
  }
  if (datums.size() > kMostAreasNamed) {
    text += "\n  and " + std::to_string(datums.size() - kMostAreasNamed) + " more";
  }
  return std::runtime_error(text);
}

/// The messages for a position, in the order in which they are sent.
std::vector<Message> Generate(const Options& options) {
  const RTCMGenerator generator(options.systemId, ToWide(options.datum),
                                ToWide(options.projection));
  const double latitude = options.latitude / kDegreesPerRadian;
  const double longitude = options.longitude / kDegreesPerRadian;
  std::vector<Message> messages;
  std::uint32_t announced = 0;

  if (!options.datum.empty()) {
    RequireFile(options.datum);
    ReportErrorState(options.datum);
    const auto datum = generator.getRtcmDatumMessage(latitude, longitude, 0);
    if (!datum) throw NoAreaError(options, generator);
    messages.push_back(rtcm3::FromRecord(*datum));
    if (const auto grid = generator.get1023(latitude, longitude, 0)) {
      messages.emplace_back(*grid);
      announced |= AnnouncementBit(1023);
    } else {
      ReportNote(options.datum + ": no usable residual grid covers the position, no 1023 sent");
    }
  }
  if (!options.projection.empty()) {
    RequireFile(options.projection);
    ReportErrorState(options.projection);
    if (options.northing && options.easting) {
      const auto grid = generator.get1024(*options.northing, *options.easting, 0);
      if (!grid) {
        throw std::runtime_error(options.projection + ": no usable residual grid covers northing " +
                                 Decimal(*options.northing) + ", easting " +
                                 Decimal(*options.easting) + " metres");
      }
      messages.emplace_back(*grid);
      announced |= AnnouncementBit(1024);
    }
    const auto projection = generator.getRtcmProjMessage();
    if (!projection) throw std::runtime_error(options.projection + ": no usable projection in it");
    messages.push_back(rtcm3::FromRecord(*projection));
    announced |= AnnouncementBit(rtcm3::NumberOf(messages.back()));
  }

  std::visit(
      [announced](auto& record) {
        if constexpr (requires { record.utilizedMsgIndicator; }) {
          record.utilizedMsgIndicator = announced;
        }
      },
      messages.front());
  return messages;
}

int Run(const Options& options) {
  Output out(options.output, options.json ? OutputKind::kText : OutputKind::kFrames,
             {options.datum, options.projection});
  for (const Message& message : Generate(options)) {
    options.json ? rtcm3::AppendJsonLine(message, out.pending())
                 : rtcm3::Encode(message, out.pending());
  }
  out.Finish();
  return kDone;
}

void AddPosition(CLI::App& command, Options& options, CLI::Option* datum, CLI::Option* projection) {
  auto* latitude = command.add_option("--lat", options.latitude, "latitude, degrees")
                       ->transform(AngleCheck(kLatitude, kMaxLatitude));
  auto* longitude = command.add_option("--lon", options.longitude, "longitude, degrees")
                        ->transform(AngleCheck(kLongitude, kMaxLongitude));
  datum->needs(latitude)->needs(longitude);
  auto* northing =
      command.add_option("--northing", options.northing, "northing for a 1024, metres")
          ->check(kNumber);
  auto* easting = command.add_option("--easting", options.easting, "easting for a 1024, metres")
                      ->check(kNumber);
  northing->needs(easting)->needs(projection);
  easting->needs(northing);
}

}  // namespace

void AddGenerate(CLI::App& program, Action& action) {
  const auto options = std::make_shared<Options>();
  CLI::App* command = program.add_subcommand(
      "generate", "Builds the messages for a position from a datum and a projection file.");
  auto* datum = command->add_option("--datum", options->datum, "the datum file")->check(kDatumFile);
  auto* projection = command->add_option("--projection", options->projection, "the projection file")
                         ->check(kProjectionFile);
  AddPosition(*command, *options, datum, projection);
  command->add_option("--system-id", options->systemId, "System Identification Number")
      ->check(CLI::Range(0, kMaxSystemId))
      ->capture_default_str();
  command->add_option("-o,--output", options->output, "the output")
      ->check(kFileName)
      ->capture_default_str();
  command->add_flag("--json", options->json,
                    "print JSON lines as \"velta decode\" does, no frames");
  command->footer(
      "Sends, as RTCM 3 frames, a 1021 or 1022 and a 1023 from the datum file, a 1024 and a 1025\n"
      "or 1027 from the projection file: one of the two files must be given. A 1024 is sent only\n"
      "for a northing and an easting. The datum message announces what is sent with it. As the\n"
      "output \"-\" is standard output. A latitude or longitude may be written in degrees, minutes "
      "and\n"
      "seconds, too: 52°00'30\"N, 52 00 30.\n"
      "\n"
      "Example:\n"
      "  velta ingest --datum-dir . --projection-dir . examples/streams/dhdn.rtcm3\n"
      "  velta generate --datum AUTO_DHDN_BESEL.dff --projection AUTO_DHDN_BESEL.prj --lat 52.002 "
      "--lon 9.002 -o messages.rtcm3\n"
      "  velta decode messages.rtcm3");
  command->callback([&action, options] {
    if (options->datum.empty() && options->projection.empty()) {
      throw CLI::RequiredError("--datum or --projection");
    }
    action = [options] { return Run(*options); };
  });
}

}  // namespace velta_tool
