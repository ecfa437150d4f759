#include <CLI/App.hpp>
#include <CLI/Config.hpp>
#include <CLI/Formatter.hpp>
#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <functional>
#include <memory>
#include <optional>
#include <set>
#include <stdexcept>
#include <string>
#include <string_view>
#include <utility>
#include <variant>
#include <vector>

#include "angle.h"
#include "busy.h"
#include "command.h"
#include "description.h"
#include "entries.h"
#include "files.h"
#include "orxregistry/in_file_key.h"
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

constexpr std::int32_t kMaxSystemId = 255;
constexpr std::size_t kMostAreasNamed = 10;

struct Options {
  std::string datum;
  std::string projection;
  std::optional<double> latitude;   // degrees
  std::optional<double> longitude;  // degrees
  std::optional<double> northing;
  std::optional<double> easting;
  std::int32_t systemId = 0;
  std::string output = "-";
  bool dms = false;
  bool json = false;
};

/// A message's file and the position that it is made for.
struct Source {
  const std::string& file;
  Position position;
};

/// \param number of the message
Source SourceOf(unsigned number, const Options& options) {
  if (number == 1021 || number == 1022 || number == 1023) {
    return {options.datum,
            {*options.latitude / kDegreesPerRadian, *options.longitude / kDegreesPerRadian}};
  }
  return {options.projection, {options.northing.value_or(0), options.easting.value_or(0)}};
}

std::string Decimal(double number) {
  char text[32];
  std::snprintf(text, sizeof text, "%.9g", number);
  return text;
}

/// How far a number lies from a range; the numbers of a circle come again after `period`.
double Outside(double number, double from, double to, double period = 0) {
  double distance = std::max({from - number, number - to, 0.0});
  for (const double same : {number - period, number + period}) {
    distance = std::min(distance, std::max({from - same, same - to, 0.0}));
  }
  return distance;
}

/// The areas of a file's entries, those nearest to a position first, each once, as lines.
/// \param key of the area in the entries' descriptions
/// \param period after which eastings come again
/// \param text of a coordinate
std::string NearestAreas(const std::string& file, std::string_view key, double north, double east,
                         double period, const std::function<std::string(double)>& text) {
  std::set<std::pair<double, std::string>> areas;
  for (const Entry& entry : ReadEntries(file).entries) {
    if (!entry.content) continue;
    for (const Property& property : *entry.content) {
      if (property.key != key || property.value.is_null()) continue;
      const auto edge = [&](const char* name) { return property.value.at(name).get<double>(); };
      const double shrinking = period > 0 ? std::cos(north / kDegreesPerRadian) : 1;
      const double distance =
          std::hypot(Outside(north, edge("south"), edge("north")),
                     Outside(east, edge("west"), edge("east"), period) * shrinking);
      areas.insert({distance, "south " + text(edge("south")) + ", north " + text(edge("north")) +
                                  ", west " + text(edge("west")) + ", east " + text(edge("east"))});
    }
  }
  if (areas.empty()) return "; the file has no complete entry with one";
  std::string lines = "; the nearest are";
  std::size_t count = 0;
  for (const auto& [distance, area] : areas) {
    if (count++ == kMostAreasNamed) break;
    lines += "\n  " + area;
  }
  if (count > kMostAreasNamed) lines += "\nof " + std::to_string(areas.size());
  return lines;
}

/// The damage of a file and a separator, to stand in front of what follows from it.
std::string Before(const std::string& damage) { return damage.empty() ? "" : damage + "; "; }

/// Says that a datum file has no entry to use for the position. The library does not tell an area
/// that is not there from an entry that it cannot use.
std::runtime_error NoAreaError(const Options& options, const std::string& damage) {
  const auto text = [&](double degrees) {
    return options.dms ? DegreesMinutesSeconds(degrees) : Decimal(degrees);
  };
  const double latitude = *options.latitude;
  const double longitude = *options.longitude;
  return std::runtime_error(options.datum + ": " + Before(damage) + "no area holds latitude " +
                            text(latitude) + ", longitude " + text(longitude) +
                            (options.dms ? "" : " degrees") +
                            ", or an entry up to the one that does cannot be used" +
                            NearestAreas(options.datum, "area", latitude, longitude, 360, text));
}

std::runtime_error NoPlaneGridError(const Options& options, const std::string& damage) {
  const double northing = *options.northing;
  const double easting = *options.easting;
  return std::runtime_error(
      options.projection + ": " + Before(damage) + "no usable residual grid covers northing " +
      Decimal(northing) + ", easting " + Decimal(easting) + " metres" +
      NearestAreas(options.projection, "gridArea", northing, easting, 0, Decimal));
}

/// Names the entry whose numbers do not fit the message.
std::runtime_error MisfitError(unsigned number, const Options& options, std::string reason) {
  // Truncation gives these for numbers that no integer holds.
  for (const char* const beyond : {", not -2147483648", ", not -9223372036854775808"}) {
    if (reason.ends_with(beyond)) {
      reason.replace(reason.rfind(','), reason.npos, ", and what is stored is beyond any");
    }
  }
  const Source source = SourceOf(number, options);
  const unsigned kind = number == 1022 ? 1021 : number == 1027 ? 1025 : number;
  const std::string entry = UsedFor(kind, source.file, source.position);
  return std::runtime_error(source.file + ": what is stored in " + Printable(entry) +
                            " does not fit a " + std::to_string(number) + ": " + reason);
}

/// What is wrong with a file of which a part can be read; empty when nothing is.
/// \throws std::runtime_error when nothing of it can be read
std::string DamageIn(const std::string& file) {
  RequireFile(file);
  const FileState state = StateOf(file);
  const bool isReadable = state.error == orx::kRegistryOk || state.error == orx::kDamaged;
  if (!isReadable) throw std::runtime_error(file + ": " + state.text);
  return state.text;
}

void NoteDamage(const std::string& file, const std::string& damage) {
  if (!damage.empty()) ReportNote(file + ": " + damage + ", behind what was used");
}

/// The messages for a position, in the order in which they are sent.
std::vector<Message> Generate(const Options& options) {
  const RTCMGenerator generator(options.systemId, ToWide(options.datum),
                                ToWide(options.projection));
  std::vector<Message> messages;
  std::uint32_t announced = 0;

  if (!options.datum.empty()) {
    const auto [latitude, longitude] = SourceOf(1021, options).position;
    const std::string damage = DamageIn(options.datum);
    const auto datum = generator.getRtcmDatumMessage(latitude, longitude, 0);
    if (!datum) throw NoAreaError(options, damage);
    messages.push_back(rtcm3::FromRecord(*datum));
    if (const auto grid = generator.get1023(latitude, longitude, 0)) {
      messages.emplace_back(*grid);
      announced |= AnnouncementBit(1023);
    } else {
      ReportNote(options.datum + ": no usable residual grid covers the position, no 1023 sent");
    }
    NoteDamage(options.datum, damage);
  }
  if (!options.projection.empty()) {
    const std::string damage = DamageIn(options.projection);
    if (options.northing && options.easting) {
      const auto grid = generator.get1024(*options.northing, *options.easting, 0);
      if (!grid) throw NoPlaneGridError(options, damage);
      messages.emplace_back(*grid);
      announced |= AnnouncementBit(1024);
    }
    const auto projection = generator.getRtcmProjMessage();
    if (!projection) {
      throw std::runtime_error(options.projection + ": " + Before(damage) +
                               "no usable projection in it");
    }
    messages.push_back(rtcm3::FromRecord(*projection));
    announced |= AnnouncementBit(rtcm3::NumberOf(messages.back()));
    NoteDamage(options.projection, damage);
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
  Output out(options.output, options.json ? OutputKind::kText : OutputKind::kBinary,
             {options.datum, options.projection});
  const Busy busy("reading", {options.datum, options.projection});
  for (const Message& message : Generate(options)) {
    std::string frame;
    try {
      rtcm3::Encode(message, frame);
    } catch (const rtcm3::FieldError& error) {
      throw MisfitError(rtcm3::NumberOf(message), options, error.what());
    }
    options.json ? rtcm3::AppendJsonLine(message, out.pending())
                 : static_cast<void>(out.pending() += frame);
  }
  out.Finish();
  return kDone;
}

}  // namespace

void AddGenerate(CLI::App& program, Action& action) {
  const auto options = std::make_shared<Options>();
  CLI::App* command = program.add_subcommand(
      "generate", "Builds the messages for a position from a datum and a projection file.");
  auto* datum = command->add_option("--datum", options->datum, "the datum file")->check(kDatumFile);
  auto* projection = command->add_option("--projection", options->projection, "the projection file")
                         ->check(kProjectionFile);
  AddPosition(*command, options->latitude, options->longitude);
  datum->needs("--lat")->needs("--lon");
  auto* northing = command->add_option("--northing", options->northing, "northing for a 1024")
                       ->type_name("METRES")
                       ->check(kNumber);
  auto* easting = command->add_option("--easting", options->easting, "easting for a 1024")
                      ->type_name("METRES")
                      ->check(kNumber);
  northing->needs(easting)->needs(projection);
  easting->needs(northing);
  command->add_option("--system-id", options->systemId, "System Identification Number")
      ->type_name("0.." + std::to_string(kMaxSystemId))
      ->check(CLI::Range(0, kMaxSystemId))
      ->capture_default_str();
  command->add_option("-o,--output", options->output, "the output")
      ->check(kFileName)
      ->capture_default_str();
  AddDms(*command, options->dms);
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
