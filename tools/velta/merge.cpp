#include <CLI/App.hpp>
#include <CLI/Config.hpp>
#include <CLI/Formatter.hpp>
#include <memory>
#include <nlohmann/json.hpp>
#include <set>
#include <stdexcept>
#include <string>

#include "busy.h"
#include "command.h"
#include "entries.h"
#include "files.h"
#include "orxutils/file_error.h"
#include "terminal.h"
#include "velta/rtcm_data_support.h"

namespace velta_tool {
namespace {

using orx::cs::velta::ResultCode;
using orx::cs::velta::RTCMDataSupport;

struct Merge {
  std::string target;
  std::string source;
  bool json = false;
};

/// How many of the source's entries are new in the target, and how many it had.
struct MergeCounts {
  std::size_t added = 0;
  std::size_t replaced = 0;
};

MergeCounts Count(const Entries& target, const Entries& source) {
  std::set<std::string> names;
  for (const Entry& entry : target.entries) names.insert(entry.name);
  MergeCounts counts;
  for (const Entry& entry : source.entries)
    ++(names.contains(entry.name) ? counts.replaced : counts.added);
  return counts;
}

/// \throws std::runtime_error when a file is damaged, or not of the kind that it is named for
void RequireUsable(const std::string& file, const Entries& found) {
  if (!found.error.empty()) throw std::runtime_error(file + ": " + found.error);
  if (found.entries.empty() || HoldsOtherKind(file)) {
    throw std::runtime_error(file + ": is named " + ExtensionOf(KindOf(file)) +
                             ", but has no entry of that kind, or some of the other");
  }
}

/// Queries end at an incomplete entry, also for those behind it.
/// \throws std::runtime_error that names one
void RequireComplete(const std::string& file, const Entries& found) {
  for (const Entry& entry : found.entries) {
    if (entry.content) continue;
    throw std::runtime_error(file + ": its entry " + Printable(entry.name) +
                             " is incomplete, and would end the queries of the target");
  }
}

int Run(const Merge& merge) {
  Output out({merge.target, merge.source});
  RequireFile(merge.target);
  RequireFile(merge.source);
  const Busy busy("merging", {merge.target, merge.source});
  const Entries source = ReadEntries(merge.source);
  const Entries before = ReadEntries(merge.target);
  RequireUsable(merge.target, before);
  RequireUsable(merge.source, source);
  RequireComplete(merge.source, source);
  const std::wstring target = ToWide(merge.target);
  const std::wstring from = ToWide(merge.source);
  orx::ForgetFileError();
  const ResultCode result = KindOf(merge.target) == FileKind::kDatum
                                ? RTCMDataSupport::MergeRTCMDatumfiles(target, from)
                                : RTCMDataSupport::MergeRTCMProjectionfiles(target, from);
  const std::string reason = orx::KeptFileError();
  const bool isDone = result == orx::cs::velta::kSuccess;
  const MergeCounts counts = isDone ? Count(before, source) : MergeCounts();
  if (merge.json) {
    const nlohmann::ordered_json line = {{"target", merge.target},
                                         {"source", merge.source},
                                         {"result", CodeText(result)},
                                         {"added", counts.added},
                                         {"replaced", counts.replaced}};
    out.pending() = line.dump() + "\n";
  } else if (isDone && !IsQuiet()) {
    out.pending() = merge.target + ": " + std::to_string(counts.added) + " entries added, " +
                    std::to_string(counts.replaced) + " replaced\n";
  }
  out.Flush();
  if (!isDone) {
    ReportFailure(merge.source + " into " + merge.target + ": " + Meaning(result) +
                  (reason.empty() ? "" : ": " + reason));
    return kFailed;
  }
  const bool isDatum = KindOf(merge.target) == FileKind::kDatum;
  if (isDatum && source.name != before.name) {
    ReportNote(merge.source + ": its entries, of " + Printable(source.name) +
               ", are now entries of " + Printable(before.name));
  }
  return kDone;
}

}  // namespace

void AddMerge(CLI::App& program, Action& action) {
  const auto merge = std::make_shared<Merge>();
  CLI::App* command = program.add_subcommand(
      "merge", "Copies the entries of one datum or projection file into another of its kind.");
  command->add_option("TARGET", merge->target, "the file that gets the entries")
      ->required()
      ->check(kDatumOrProjectionFile);
  command->add_option("SOURCE", merge->source, "the file that they are copied from")
      ->required()
      ->check(kDatumOrProjectionFile);
  command->add_flag("--json", merge->json, "print the result as JSON");
  command->footer(
      "Entries of the same name are replaced by the source's; what only the target has stays.\n"
      "All entries of the target then count as its own datum's, whatever the source's is called.\n"
      "\n"
      "Example:\n"
      "  velta ingest --datum-dir . --projection-dir . examples/streams/dhdn.rtcm3\n"
      "  velta ingest --datum-dir . --projection-dir . examples/streams/molodenski.rtcm3\n"
      "  velta merge AUTO_DHDN_BESEL.dff Local_B_O_7.dff");
  command->callback([&action, merge] {
    if (KindOf(merge->target) != KindOf(merge->source)) {
      throw CLI::ValidationError("SOURCE", "a datum file and a projection file do not mix");
    }
    action = [merge] { return Run(*merge); };
  });
}

}  // namespace velta_tool
