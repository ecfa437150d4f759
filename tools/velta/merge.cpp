#include <CLI/App.hpp>
#include <CLI/Config.hpp>
#include <CLI/Formatter.hpp>
#include <memory>
#include <nlohmann/json.hpp>
#include <stdexcept>
#include <string>

#include "command.h"
#include "files.h"
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

int Run(const Merge& merge) {
  RequireFile(merge.target);
  RequireFile(merge.source);
  const std::wstring target = ToWide(merge.target);
  const std::wstring source = ToWide(merge.source);
  const ResultCode result = KindOf(merge.target) == FileKind::kDatum
                                ? RTCMDataSupport::MergeRTCMDatumfiles(target, source)
                                : RTCMDataSupport::MergeRTCMProjectionfiles(target, source);
  if (merge.json) {
    const nlohmann::ordered_json line = {
        {"target", merge.target}, {"source", merge.source}, {"result", CodeText(result)}};
    Output out;
    out.pending() = line.dump() + "\n";
    out.Flush();
  }
  if (result == orx::cs::velta::kSuccess) return kDone;
  ReportFailure(merge.source + " into " + merge.target + ": " + Describe(result));
  return kFailed;
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
