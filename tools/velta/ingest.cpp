#include <CLI/App.hpp>
#include <CLI/Config.hpp>
#include <CLI/Formatter.hpp>
#include <cstdint>
#include <exception>
#include <filesystem>
#include <initializer_list>
#include <map>
#include <memory>
#include <set>
#include <string>
#include <system_error>
#include <utility>
#include <vector>

#include "command.h"
#include "files.h"
#include "ingest_report.h"
#include "message_set.h"
#include "orxutils/orx_string.h"
#include "orxutils/path.h"
#include "rtcm3/message_reader.h"
#include "terminal.h"
#include "velta/rtcm_data_support.h"

namespace velta_tool {
namespace {

namespace fs = std::filesystem;
using orx::cs::velta::ResultCode;
using orx::cs::velta::RTCMDataSupport;

struct Options {
  std::vector<std::string> files;
  std::string dir;
  std::string datumDir;
  std::string projectionDir;
  bool json = false;
};

/// Tells which files of a directory have got another size.
class SizeWatch {
 public:
  explicit SizeWatch(const fs::path& directory) {
    std::error_code error;
    for (fs::directory_iterator files(orx::ToSystemPath(directory), error), end;
         !error && files != end; files.increment(error)) {
      Changed(files->path());
    }
  }

  bool Changed(const fs::path& file) {
    std::error_code error;
    const std::uintmax_t size = fs::file_size(orx::ToSystemPath(file), error);
    if (error) return false;
    const auto [known, isNew] = sizes_.try_emplace(file.filename(), size);
    return isNew || std::exchange(known->second, size) != size;
  }

 private:
  std::map<fs::path, std::uintmax_t> sizes_;
};

std::unique_ptr<RTCMDataSupport> MakeSupport(const Options& options) {
  fs::path datums = ToPath(options.datumDir);
  fs::path projections = ToPath(options.projectionDir);
  if (!options.dir.empty()) {
    datums = ToPath(options.dir) / "datums" / "rtcmdata";
    projections = ToPath(options.dir) / "projections" / "rtcmdata";
  }
  if (datums.empty()) return std::make_unique<RTCMDataSupport>();
  // The library wants the separator at the end.
  return std::make_unique<RTCMDataSupport>(ToWide(ToName(datums / "")).c_str(),
                                           ToWide(ToName(projections / "")).c_str());
}

/// Those of the numbers that a set has and makes use of.
std::vector<unsigned> Used(const MessageSet& set, std::initializer_list<unsigned> numbers) {
  std::vector<unsigned> used;
  for (const unsigned number : numbers) {
    const bool isDatum = number == 1021 || number == 1022;
    if (set.Has(number) && (isDatum || set.Announces(number))) used.push_back(number);
  }
  return used;
}

class Ingestion {
 public:
  explicit Ingestion(const Options& options)
      : fresh_(MakeSupport(options)),
        support_(MakeSupport(options)),
        datumFiles_(ToPath(orx::ToUtf8(support_->GetDatumPath()))),
        projectionFiles_(ToPath(orx::ToUtf8(support_->GetProjectionPath()))),
        report_(options.json, out_) {}

  void Read(const std::string& file) {
    const std::uint64_t framesBefore = totals_.stream.frames.frames;
    Input in(file);
    rtcm3::MessageReader messages(in.buffer(), totals_.stream, [this] {
      out_.Flush();
      progress_.Show(totals_.stream.frames.bytes);
    });
    totals_.stream.frames.remarks.clear();
    while (const rtcm3::Message* message = messages.Next()) Take(*message);
    for (const std::string& remark : totals_.stream.frames.remarks)
      ReportNote(file + ": " + remark);
    if (totals_.stream.frames.frames == framesBefore) Fail(file + ": no RTCM 3 frame in it");
  }

  void Fail(const std::string& what) {
    ReportFailure(what);
    status_ = kFailed;
  }

  int Finish() {
    totals_.incomplete = sets_.size();
    for (const auto& [systemId, set] : sets_) ReportIncomplete(systemId, set);
    if (totals_.stream.shortMessages > 0) {
      Fail(std::to_string(totals_.stream.shortMessages) + " messages end before their last field");
    }
    report_.Close(totals_);
    return status_;
  }

 private:
  void Take(const rtcm3::Message& message) {
    const std::uint32_t systemId = rtcm3::SystemIdOf(message);
    if (std::holds_alternative<rtcm3::Rtcm1026>(message)) {
      NameUnsupported(systemId);
      return;
    }
    MessageSet& set = sets_[systemId];
    set.Put(message, *support_);
    if (!set.Complete()) return;
    Ingest(systemId, set);
    sets_.erase(systemId);
  }

  void Ingest(std::uint32_t systemId, const MessageSet& set) {
    // Nothing of an earlier set, its residual grid for instance, may get into this one.
    *support_ = *fresh_;
    orx::cs::velta::MsgUtilized records = set.Records();
    const ResultCode result = support_->ParseRTCMMEssages(records);
    report_.Add({systemId, result, PartsOf(set), LeftOut(set)});

    const std::string system = "system " + std::to_string(systemId) + ": ";
    ++(result == orx::cs::velta::kSuccess ? totals_.ingested : totals_.failed);
    if (result != orx::cs::velta::kSuccess) Fail(system + Describe(result));
    if (set.Announces(1026)) NameUnsupported(systemId);
  }

  /// Says, once for each system, that a 1026 is not taken.
  void NameUnsupported(std::uint32_t systemId) {
    if (!unsupported_.insert(systemId).second) return;
    Fail("system " + std::to_string(systemId) +
         ": 1026: " + Describe(orx::cs::velta::kUnsupportedProjection));
  }

  std::vector<IngestedPart> PartsOf(const MessageSet& set) {
    const std::wstring name = support_->GetTargetDatumName();
    const fs::path datum = ToPath(orx::ToUtf8(support_->GetDatumPath() + name + L".dff"));
    std::vector<IngestedPart> parts = {
        {Used(set, {1021, 1022, 1023}), ToName(datum.filename()), datumFiles_.Changed(datum)}};
    if (set.Announces(1025) || set.Announces(1027)) {
      const fs::path projection =
          ToPath(orx::ToUtf8(support_->GetProjectionPath() + name + L".prj"));
      parts.push_back({Used(set, {1024, 1025, 1027}), ToName(projection.filename()),
                       projectionFiles_.Changed(projection)});
    }
    return parts;
  }

  static std::vector<unsigned> LeftOut(const MessageSet& set) {
    std::vector<unsigned> leftOut;
    for (unsigned number = 1023; number <= 1027; ++number) {
      if (set.Has(number) && !set.Announces(number)) leftOut.push_back(number);
    }
    return leftOut;
  }

  void ReportIncomplete(std::uint32_t systemId, const MessageSet& set) {
    const std::vector<std::string> missing = set.Missing();
    std::string list;
    for (const std::string& message : missing) list += (list.empty() ? "" : ", ") + message;
    Fail("system " + std::to_string(systemId) + ": incomplete, not received: " + list);
    report_.AddIncomplete(systemId, missing);
  }

  std::unique_ptr<const RTCMDataSupport> fresh_;
  std::unique_ptr<RTCMDataSupport> support_;
  SizeWatch datumFiles_;
  SizeWatch projectionFiles_;
  std::map<std::uint32_t, MessageSet> sets_;
  std::set<std::uint32_t> unsupported_;  ///< systems whose 1026 has been named
  IngestTotals totals_;
  int status_ = kDone;
  Output out_;
  IngestReport report_;
  Progress progress_;
};

int Run(const Options& options) {
  Ingestion ingestion(options);
  for (const std::string& file : options.files) {
    try {
      ingestion.Read(file);
    } catch (const std::exception& error) {
      ingestion.Fail(error.what());
    }
  }
  return ingestion.Finish();
}

}  // namespace

void AddIngest(CLI::App& program, Action& action) {
  const auto options = std::make_shared<Options>();
  CLI::App* command = program.add_subcommand(
      "ingest", "Puts the message sets of RTCM 3 streams into datum and projection files.");
  command->add_option("FILE", options->files, "the streams, \"-\" for standard input")->required();
  auto* dir = command->add_option("--dir", options->dir,
                                  "the files go to datums/rtcmdata and projections/rtcmdata in\n"
                                  "this directory");
  auto* datumDir =
      command->add_option("--datum-dir", options->datumDir, "directory of the datum files (.dff)");
  auto* projectionDir = command->add_option("--projection-dir", options->projectionDir,
                                            "directory of the projection files (.prj)");
  datumDir->needs(projectionDir)->excludes(dir);
  projectionDir->needs(datumDir)->excludes(dir);
  command->add_flag("--json", options->json, "print the result as JSON, one object a line");
  command->footer(
      "A set is a datum message (1021 or 1022) and the messages that it announces, all with the\n"
      "same System Identification Number, in any order. It is ingested as soon as it is complete.\n"
      "A 1026 is not supported. Sets that are incomplete at the end are reported as failures.\n"
      "Without a directory the files go to the user's geodetic directory, where the office\n"
      "application looks for them; the environment variable ORX_USER_GEO_DIR names another.\n"
      "\n"
      "Example:\n"
      "  velta ingest --dir out examples/streams/dhdn.rtcm3");
  command->callback([&action, options] { action = [options] { return Run(*options); }; });
}

}  // namespace velta_tool
