#include <CLI/App.hpp>
#include <CLI/Config.hpp>
#include <CLI/Formatter.hpp>
#include <algorithm>
#include <cstdint>
#include <exception>
#include <filesystem>
#include <initializer_list>
#include <iterator>
#include <map>
#include <memory>
#include <optional>
#include <set>
#include <string>
#include <system_error>
#include <tuple>
#include <utility>
#include <vector>

#include "command.h"
#include "files.h"
#include "ingest_report.h"
#include "interrupt.h"
#include "orxutils/orx_string.h"
#include "orxutils/path.h"
#include "rtcm3/message_reader.h"
#include "rtcm3/message_sets.h"
#include "stream_notes.h"
#include "terminal.h"
#include "velta/rtcm_data_support.h"

namespace velta_tool {
namespace {

namespace fs = std::filesystem;
using orx::cs::velta::MsgUtilized;
using orx::cs::velta::ResultCode;
using orx::cs::velta::Rtcm1026;
using orx::cs::velta::RtcmBasicTransformMessage;
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

/// Those of the numbers that a set has.
std::vector<unsigned> Held(const rtcm3::MessageSet& set, std::initializer_list<unsigned> numbers) {
  std::vector<unsigned> held;
  for (const unsigned number : numbers) {
    if (set.Find(number)) held.push_back(number);
  }
  return held;
}

/// What may be otherwise when the set is tried again; a message stays what it is.
bool IsOfTheFiles(ResultCode result) {
  constexpr ResultCode kOfMessages[] = {
      orx::cs::velta::kMissing1023, orx::cs::velta::kBadComputationIndicator,
      orx::cs::velta::kUnsupportedProjection, orx::cs::velta::kMissingProjectionPart,
      orx::cs::velta::kNoDatumName};
  return std::find(std::begin(kOfMessages), std::end(kOfMessages), result) == std::end(kOfMessages);
}

class Ingestion {
 public:
  explicit Ingestion(const Options& options)
      : fresh_(MakeSupport(options)),
        support_(MakeSupport(options)),
        datumFiles_(ToPath(orx::ToUtf8(support_->GetDatumPath()))),
        projectionFiles_(ToPath(orx::ToUtf8(support_->GetProjectionPath()))),
        sets_([this](const rtcm3::MessageSet& set) { return Ingest(set); }),
        report_(options.json, out_) {}

  void Read(const std::string& file) {
    Input in(file);
    stream_.emplace(Stream{file, StreamNotes(file, totals_.stream), totals_.stream.frames.frames});
    rtcm3::MessageReader messages(in.buffer(), totals_.stream, [this] {
      out_.Flush();
      stream_->notes.Tell();
      progress_.Show(totals_.stream.frames.bytes);
    });
    stream_->messages = &messages;
    TakeAll(messages);
    EndStream();
  }

  void Fail(const std::string& what) {
    ReportFailure(what);
    status_ = kFailed;
  }

  int Finish() {
    EndStream();
    progress_.Clear();
    for (const rtcm3::IncompleteSet& set : sets_.Incomplete()) ReportIncomplete(set);
    const rtcm3::CollectingCounts& counts = sets_.counts();
    totals_.repeats = counts.repeats;
    if (counts.givenUp > 0) {
      ReportNote("sets that stayed incomplete, as another datum message came: " +
                 std::to_string(counts.givenUp));
    }
    if (counts.dropped > 0) {
      Fail("messages dropped, as the rest of their set did not come: " +
           std::to_string(counts.dropped));
    }
    if (totals_.stream.shortMessages > 0) {
      Fail(std::to_string(totals_.stream.shortMessages) + " messages end before their last field");
    }
    report_.Close(totals_);
    return status_;
  }

 private:
  /// The stream that is being read.
  struct Stream {
    std::string name;
    StreamNotes notes;
    std::uint64_t framesBefore;
    rtcm3::MessageReader* messages = nullptr;
  };

  void TakeAll(rtcm3::MessageReader& messages) {
    while (const rtcm3::Message* message = messages.Next()) Take(*message);
  }

  void EndStream() {
    if (!stream_) return;
    // The reader may hold back what looks like the begin of a longer frame.
    if (IsInterrupted() && stream_->messages) TakeAll(*stream_->messages);
    stream_->notes.Tell();
    if (totals_.stream.frames.frames == stream_->framesBefore) {
      Fail(stream_->name + ": no RTCM 3 frame in it");
    }
    stream_.reset();
  }

  void Take(const rtcm3::Message& message) {
    if (std::holds_alternative<Rtcm1026>(message)) NameUnsupported(rtcm3::SystemIdOf(message));
    repeatsBefore_ = sets_.counts().repeats;
    sets_.Put(message);
  }

  /// \return false when the set is to be tried again
  bool Ingest(const rtcm3::MessageSet& set) {
    // Nothing of an earlier set, its residual grid for instance, may get into this one.
    *support_ = *fresh_;
    MsgUtilized records = set.Records();
    const ResultCode result = support_->ParseRTCMMEssages(records);

    const std::uint32_t systemId = rtcm3::SystemIdOf(*set.FindDatum());
    IngestedSet ingested{systemId, result, PartsOf(set), ChangedFields(set), NotAnnounced(set)};
    for (const unsigned number : ingested.notAnnounced) NameNotAnnounced(systemId, number);
    if (set.Announces(1026)) NameUnsupported(systemId);
    Count(ingested);
    const bool isToldFailure = TellFailure(systemId, result);
    if (isToldFailure || ingested.HasNews()) report_.Add(ingested);
    return result == orx::cs::velta::kSuccess || !IsOfTheFiles(result);
  }

  void Count(const IngestedSet& set) {
    if (set.result != orx::cs::velta::kSuccess) {
      const bool isAnotherTry = sets_.counts().repeats != repeatsBefore_;
      if (!isAnotherTry) ++totals_.failed;
      return;
    }
    ++totals_.ingested;
    if (!set.HasNews()) ++totals_.alreadyThere;
  }

  /// Tells a failure, but not the same one of a system again and again.
  /// \return true when it was told
  bool TellFailure(std::uint32_t systemId, ResultCode result) {
    if (std::exchange(results_[systemId], result) == result) return false;
    if (result == orx::cs::velta::kSuccess) return false;
    Fail("system " + std::to_string(systemId) + ": " + Describe(result));
    return true;
  }

  /// Says, once for each system, that a 1026 is not taken.
  void NameUnsupported(std::uint32_t systemId) {
    if (!named_.insert({systemId, 1026}).second) return;
    Fail("system " + std::to_string(systemId) +
         ": 1026: " + Describe(orx::cs::velta::kUnsupportedProjection));
  }

  /// Says, once for each system, that a message comes unannounced.
  void NameNotAnnounced(std::uint32_t systemId, unsigned number) {
    if (!named_.insert({systemId, number}).second) return;
    ReportNote("system " + std::to_string(systemId) + ": " + std::to_string(number) +
               " is not announced by the datum message, and taken");
  }

  std::vector<IngestedPart> PartsOf(const rtcm3::MessageSet& set) {
    const std::wstring name = support_->GetTargetDatumName();
    const fs::path datum = ToPath(orx::ToUtf8(support_->GetDatumPath() + name + L".dff"));
    std::vector<IngestedPart> parts = {
        {Held(set, {1021, 1022, 1023}), ToName(datum.filename()), datumFiles_.Changed(datum)}};
    if (set.Find(1025) || set.Find(1027)) {
      const fs::path projection =
          ToPath(orx::ToUtf8(support_->GetProjectionPath() + name + L".prj"));
      parts.push_back({Held(set, {1024, 1025, 1027}), ToName(projection.filename()),
                       projectionFiles_.Changed(projection)});
    }
    return parts;
  }

  /// The fields of the datum message that are not what they were when the same area of the same
  /// datum came before.
  std::vector<std::string> ChangedFields(const rtcm3::MessageSet& set) {
    const rtcm3::Message& datum = *set.FindDatum();
    const MsgUtilized records = set.Records();
    const RtcmBasicTransformMessage& record =
        records.msg1021 ? static_cast<const RtcmBasicTransformMessage&>(*records.msg1021)
                        : *records.msg1022;
    const auto [known, isNew] = datums_.try_emplace(
        {record.systemId, record.targetName, record.phiV, record.lambdaV}, datum);
    if (isNew) return {};
    std::vector<std::string> fields = rtcm3::DifferingFields(known->second, datum);
    known->second = datum;
    // What is sent with it is no parameter of the datum.
    std::erase(fields, "utilizedMsgIndicator");
    return fields;
  }

  static std::vector<unsigned> NotAnnounced(const rtcm3::MessageSet& set) {
    std::vector<unsigned> numbers = Held(set, {1023, 1024, 1025, 1026, 1027});
    std::erase_if(numbers, [&set](unsigned number) { return set.Announces(number); });
    return numbers;
  }

  void ReportIncomplete(const rtcm3::IncompleteSet& set) {
    ++totals_.incomplete;
    std::vector<std::string> missing;
    std::string list;
    for (const unsigned number : set.missing) {
      missing.push_back(number == 1021 ? "1021 or 1022" : std::to_string(number));
      list += (list.empty() ? "" : ", ") + missing.back();
    }
    const std::string system = "system " + std::to_string(set.systemId) + ": ";
    if (set.hadCompleteSet) {
      ReportNote(system + "the last set is incomplete, not received: " + list);
    } else {
      Fail(system + "incomplete, not received: " + list);
    }
    report_.AddIncomplete(set.systemId, missing);
  }

  /// System Identification Number, name of the target system, centre of the area of validity.
  using DatumArea = std::tuple<std::uint32_t, std::string, std::int32_t, std::int32_t>;

  std::unique_ptr<const RTCMDataSupport> fresh_;
  std::unique_ptr<RTCMDataSupport> support_;
  SizeWatch datumFiles_;
  SizeWatch projectionFiles_;
  rtcm3::MessageSets sets_;
  std::uint64_t repeatsBefore_ = 0;                     ///< in front of the message in hand
  std::map<DatumArea, rtcm3::Message> datums_;          ///< as they came last
  std::map<std::uint32_t, ResultCode> results_;         ///< of each system's last set
  std::set<std::pair<std::uint32_t, unsigned>> named_;  ///< systems and messages that were named
  std::optional<Stream> stream_;
  IngestTotals totals_;
  int status_ = kDone;
  Output out_;
  IngestReport report_;
  Progress progress_;
};

int Run(const Options& options) {
  Ingestion ingestion(options);
  FinishWhenInterrupted([&ingestion] { return ingestion.Finish(); });
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
  command->add_option("FILE", options->files, "the streams, \"-\" for standard input")
      ->required()
      ->check(kFileName);
  auto* dir = command->add_option("--dir", options->dir,
                                  "the files go to datums/rtcmdata and projections/rtcmdata in\n"
                                  "this directory");
  auto* datumDir =
      command->add_option("--datum-dir", options->datumDir, "directory of the datum files (.dff)");
  auto* projectionDir = command->add_option("--projection-dir", options->projectionDir,
                                            "directory of the projection files (.prj)");
  datumDir->needs(projectionDir)->excludes(dir);
  projectionDir->needs(datumDir)->excludes(dir);
  for (CLI::Option* const directory : {dir, datumDir, projectionDir}) directory->check(kFileName);
  command->add_flag("--json", options->json, "print the result as JSON, one object a line");
  command->footer(
      "A set is a datum message (1021 or 1022) and the messages that it announces, all with the\n"
      "same System Identification Number. It is ingested as soon as it is complete, and again\n"
      "for each message that comes new or different after that, announced or not. A line tells\n"
      "what is new: an entry, a projection, other parameters of a datum. A 1026 is not supported.\n"
      "A set that is incomplete at the end is a failure if its system never gave a complete one.\n"
      "Interrupted (Ctrl-C), the program takes what it has read and ends as at the end of it.\n"
      "Without a directory the files go to the user's geodetic directory, where the office\n"
      "application looks for them; the environment variable ORX_USER_GEO_DIR names another.\n"
      "\n"
      "Example:\n"
      "  velta ingest --dir out examples/streams/dhdn.rtcm3");
  command->callback([&action, options] { action = [options] { return Run(*options); }; });
}

}  // namespace velta_tool
