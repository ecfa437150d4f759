#include <CLI/App.hpp>
#include <CLI/Config.hpp>
#include <CLI/Formatter.hpp>
#include <exception>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "angle.h"
#include "busy.h"
#include "command.h"
#include "description.h"
#include "entries.h"
#include "files.h"
#include "terminal.h"

namespace velta_tool {
namespace {

struct Options {
  std::vector<std::string> files;
  std::optional<double> latitude;   // degrees
  std::optional<double> longitude;  // degrees
  bool full = false;
  bool dms = false;
  bool json = false;

  /// The position whose entries are shown, if one is given.
  std::optional<Position> position() const {
    if (!latitude || !longitude) return std::nullopt;
    return Position{*latitude / kDegreesPerRadian, *longitude / kDegreesPerRadian};
  }
};

/// The entries of which the library makes messages, by their names.
struct UsedEntries {
  std::string datum;
  std::string grid;
  std::string projection;

  /// \param position of the entries of a datum file that are used, if one is given
  UsedEntries(const std::string& file, const std::optional<Position>& position) {
    if (KindOf(file) == FileKind::kProjection) projection = UsedFor(1025, file, {});
    if (!position) return;
    datum = UsedFor(1021, file, *position);
    grid = UsedFor(1023, file, *position);
  }
  /// What an entry is used for, for people; empty when for nothing.
  std::string For(const std::string& entry) const {
    if (entry == projection) return "projection message";
    if (entry == datum && entry == grid) return "datum message, residual grid";
    if (entry == datum) return "datum message";
    return entry == grid ? "residual grid" : "";
  }
};

/// The description of a complete entry with its name in front and what it is used for.
Description Labelled(const Entry& entry, const std::string& uses) {
  Description description = {{"entry", "entry", entry.name}};
  if (!uses.empty()) description.push_back({"used for", "usedFor", uses});
  description.insert(description.end(), entry.content->begin(), entry.content->end());
  return description;
}

/// True when an entry's area or grid holds the position.
bool Holds(const Entry& entry, const Position& position) {
  const auto holds = [&](const auto& area) {
    return area && area->Inside(position.north, position.east, false);
  };
  return holds(entry.area) || holds(entry.gridArea);
}

/// Names those that the library cannot use.
void ReportIncomplete(const std::string& file, const Entries& found) {
  constexpr std::size_t kMostNamed = 10;
  std::size_t count = 0;
  std::string names;
  for (const Entry& entry : found.entries) {
    if (entry.content || count++ >= kMostNamed) continue;
    names += (names.empty() ? "" : ", ") + Printable(entry.name);
  }
  if (count == 0) return;
  if (count > kMostNamed) names += ", ...";
  ReportNote(file + ": incomplete entries: " + std::to_string(count) + ": " + names);
}

void Print(const std::string& file, const std::vector<Description>& entries, const Options& options,
           Output& out) {
  if (!options.json && !options.full && entries.size() > 1) {
    out.pending() += ToSummary(entries);
    return;
  }
  for (const Description& entry : entries) {
    if (options.json) {
      nlohmann::ordered_json json = {{"file", file}};
      json.update(ToJson(entry));
      out.pending() += json.dump() + '\n';
    } else {
      out.pending() += (&entry == &entries.front() ? "" : "\n") + ToText(entry);
    }
    out.FlushIfLarge();
  }
}

/// The complete entries that are to be shown.
std::vector<Description> Chosen(const std::string& file, const Entries& found,
                                const Options& options) {
  const std::optional<Position> position = options.position();
  const UsedEntries used(file, position);
  std::vector<Description> chosen;
  for (const Entry& entry : found.entries) {
    if (!entry.content || (position && !Holds(entry, *position))) continue;
    Description description = Labelled(entry, used.For(entry.name));
    if (options.dms) description = WithDegreesMinutesSeconds(std::move(description));
    chosen.push_back(std::move(description));
  }
  return chosen;
}

/// \return false when something is wrong with the file, or nothing of it can be shown
bool List(const std::string& file, const Options& options, Output& out) {
  RequireFile(file);
  const Busy busy("reading", {file});
  const Entries found = ReadEntries(file);
  const std::vector<Description> chosen = Chosen(file, found, options);
  if (!options.json && options.files.size() > 1) {
    out.pending() += (&file == &options.files.front() ? "" : "\n") + file + ":\n";
  }
  Print(file, chosen, options, out);
  out.Flush();
  if (!found.error.empty()) {
    ReportFailure(file + ": " + found.error + "; shown is what could be read");
  }
  ReportIncomplete(file, found);
  if (chosen.empty()) {
    ReportFailure(file + (options.position() ? ": no complete entry for the position in it"
                                             : ": no complete entry in it"));
  }
  return found.error.empty() && !chosen.empty();
}

int Run(const Options& options) {
  Output out(options.files);
  int status = kDone;
  for (const std::string& file : options.files) {
    try {
      if (!List(file, options, out)) status = kFailed;
    } catch (const std::exception& error) {
      ReportFailure(error.what());
      status = kFailed;
    }
  }
  return status;
}

}  // namespace

void AddList(CLI::App& program, Action& action) {
  const auto options = std::make_shared<Options>();
  CLI::App* command =
      program.add_subcommand("list", "Lists the entries of a datum file or a projection file.");
  command->add_option("FILE", options->files, "the files")
      ->required()
      ->check(kDatumOrProjectionFile);
  AddPosition(*command, options->latitude, options->longitude);
  command->add_flag("--full", options->full, "show each of several entries whole");
  AddDms(*command, options->dms);
  command->add_flag("--json", options->json, "print JSON, one object a line");
  command->footer(
      "Angles are in degrees, rotations and residuals of angles in arc-seconds, scale corrections\n"
      "in ppm, lengths in metres; rotations are in the coordinate-frame sense. Of several entries\n"
      "it shows what most share, then a line for each. Projections are shown as they are stored.\n"
      "For a latitude and a longitude it shows the entries of datum files that hold the position,\n"
      "and of which of them the messages are made; both may be written in degrees, minutes and\n"
      "seconds, too: 52°00'30\"N, 52 00 30.\n"
      "\n"
      "Example:\n"
      "  velta ingest --dir out examples/streams/dhdn.rtcm3\n"
      "  velta list out/datums/rtcmdata/AUTO_DHDN_BESEL.dff");
  command->callback([&action, options] {
    for (const std::string& file : options->files) {
      if (options->latitude && KindOf(file) == FileKind::kProjection) {
        throw CLI::ValidationError("--lat", "entries of " + file + " have no such position");
      }
    }
    action = [options] { return Run(*options); };
  });
}

}  // namespace velta_tool
