#include <CLI/App.hpp>
#include <CLI/Config.hpp>
#include <CLI/Formatter.hpp>
#include <exception>
#include <memory>
#include <string>
#include <vector>

#include "command.h"
#include "description.h"
#include "entries.h"
#include "files.h"
#include "terminal.h"

namespace velta_tool {
namespace {

struct Options {
  std::vector<std::string> files;
  bool full = false;
  bool json = false;
};

/// The description of an entry with its name in front.
Description Named(const Entry& entry) {
  Description description = {{"entry", "entry", entry.name}};
  if (!entry.content) return description;
  description.insert(description.end(), entry.content->begin(), entry.content->end());
  return description;
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

void Print(const std::vector<Description>& entries, const Options& options, Output& out) {
  if (!options.json && !options.full && entries.size() > 1) {
    out.pending() += ToSummary(entries);
    return;
  }
  for (const Description& entry : entries) {
    if (!options.json && &entry != &entries.front()) out.pending() += '\n';
    out.pending() += options.json ? ToJson(entry).dump() + '\n' : ToText(entry);
    out.FlushMuch();
  }
}

/// \return false when something is wrong with the file
bool List(const std::string& file, const Options& options, Output& out) {
  RequireFile(file);
  const Entries found = ReadEntries(file);
  std::vector<Description> complete;
  for (const Entry& entry : found.entries) {
    if (entry.content) complete.push_back(Named(entry));
  }
  if (!options.json && options.files.size() > 1) {
    out.pending() += (&file == &options.files.front() ? "" : "\n") + file + ":\n";
  }
  Print(complete, options, out);
  out.Flush();
  const bool isDamaged = ReportErrorState(file, found.error);
  ReportIncomplete(file, found);
  if (complete.empty()) ReportFailure(file + ": no complete entry in it");
  return !isDamaged && !complete.empty();
}

int Run(const Options& options) {
  Output out;
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
  command->add_flag("--full", options->full, "show each of several entries whole");
  command->add_flag("--json", options->json, "print JSON, one object a line");
  command->footer(
      "Angles are in degrees, rotations and residuals of angles in arc-seconds, scale corrections\n"
      "in ppm, lengths in metres; rotations are in the coordinate-frame sense. Of several entries\n"
      "it shows what they share, then a line for each. Projections are shown as they are stored;\n"
      "the library makes its message of the first.\n"
      "\n"
      "Example:\n"
      "  velta ingest --dir out examples/streams/dhdn.rtcm3\n"
      "  velta list out/datums/rtcmdata/AUTO_DHDN_BESEL.dff");
  command->callback([&action, options] { action = [options] { return Run(*options); }; });
}

}  // namespace velta_tool
