#include <CLI/App.hpp>
#include <CLI/Config.hpp>
#include <CLI/Formatter.hpp>
#include <algorithm>
#include <cstdint>
#include <exception>
#include <filesystem>
#include <functional>
#include <initializer_list>
#include <iterator>
#include <map>
#include <memory>
#include <optional>
#include <set>
#include <string>
#include <tuple>
#include <utility>
#include <vector>

#include "command.h"
#include "conversion/datum_conversion.h"
#include "entries.h"
#include "files.h"
#include "ingest_report.h"
#include "interrupt.h"
#include "orxutils/file_error.h"
#include "orxutils/file_funcs.h"
#include "orxutils/orx_string.h"
#include "orxutils/path.h"
#include "rtcm3/message_reader.h"
#include "rtcm3/message_sets.h"
#include "stream_notes.h"
#include "terminal.h"
#include "velta/file_names.h"
#include "velta/rtcm_data_support.h"

namespace velta_tool {
namespace {

namespace fs = std::filesystem;
using orx::cs::velta::CleanDatumName;
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

std::unique_ptr<RTCMDataSupport> MakeSupport(const Options& options) {
  fs::path datums = PathOf(options.datumDir);
  fs::path projections = PathOf(options.projectionDir);
  if (!options.dir.empty()) {
    datums = PathOf(options.dir) / fs::path(orx::cs::velta::kDatumFolder).relative_path();
    projections = PathOf(options.dir) / fs::path(orx::cs::velta::kProjectionFolder).relative_path();
  }
  if (datums.empty()) return std::make_unique<RTCMDataSupport>();
  // The library wants the separator at the end.
  return std::make_unique<RTCMDataSupport>(ToWide(NameOf(datums / "")).c_str(),
                                           ToWide(NameOf(projections / "")).c_str());
}

bool Contains(const std::vector<unsigned>& numbers, unsigned number) {
  return std::find(numbers.begin(), numbers.end(), number) != numbers.end();
}

/// Those of the numbers that a set has.
std::vector<unsigned> Held(const rtcm3::MessageSet& set, std::initializer_list<unsigned> numbers) {
  std::vector<unsigned> held;
  for (const unsigned number : numbers) {
    if (set.Find(number)) held.push_back(number);
  }
  return held;
}

/// True for results that another try may change; those that are due to the messages stay.
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
        sets_([this](const rtcm3::MessageSet& set) { return Ingest(set); }),
        out_(options.files),
        report_(options.json, out_),
        progress_(SizeTogether(options.files)) {}

  void Read(const std::string& file) {
    try {
      stream_.emplace(file, totals_.stream, [this] {
        out_.Flush();
        stream_->notes.Tell();
        progress_.Show(totals_.stream.frames.bytes);
      });
      TakeAll(stream_->messages);
      EndStream();
    } catch (const std::exception& error) {
      if (stream_) stream_->notes.Tell();
      stream_.reset();
      Fail(error.what());
    }
  }

  int Finish() {
    EndStream();
    ClearLine();
    for (const rtcm3::IncompleteSet& set : sets_.Incomplete()) ReportIncomplete(set);
    const rtcm3::CollectingCounts& counts = sets_.counts();
    totals_.repeats = counts.repeats;
    if (counts.givenUp > 0) {
      ReportNote("sets that stayed incomplete, as another datum message came: " +
                 std::to_string(counts.givenUp));
    }
    if (counts.dropped > 0) {
      const std::string text = "messages dropped, as the rest of their set did not come: " +
                               std::to_string(counts.dropped);
      totals_.ingested > 0 ? ReportNote(text) : Fail(text);
    }
    if (totals_.stream.shortMessages > 0) {
      Fail(std::to_string(totals_.stream.shortMessages) + " messages end before their last field");
    }
    totals_.datumDirectory = orx::ToUtf8(support_->GetDatumPath());
    totals_.projectionDirectory = orx::ToUtf8(support_->GetProjectionPath());
    report_.Close(totals_);
    return status_;
  }

 private:
  /// The stream that is being read.
  struct Stream {
    Stream(const std::string& file, rtcm3::StreamCounts& counts, std::function<void()> beforeRead)
        : name(file),
          in(file),
          notes(file, counts),
          framesBefore(counts.frames.frames),
          messages(in.buffer(), counts, std::move(beforeRead)) {}

    std::string name;
    Input in;
    StreamNotes notes;
    std::uint64_t framesBefore;
    rtcm3::MessageReader messages;
  };

  void Fail(const std::string& what) {
    ReportFailure(what);
    status_ = kFailed;
  }

  void TakeAll(rtcm3::MessageReader& messages) {
    while (const rtcm3::Message* message = messages.Next()) Take(*message);
  }

  void EndStream() {
    if (!stream_) return;
    // The reader may hold back what looks like the begin of a longer frame.
    if (IsInterrupted()) TakeAll(stream_->messages);
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

  /// One of the files that a set goes into, and the entry that it becomes there.
  struct Place {
    std::wstring file;
    ReceivedEntry entry;
    bool wasThere;
  };

  /// \return false when the set is to be tried again
  bool Ingest(const rtcm3::MessageSet& set) {
    // Nothing of an earlier set, its residual grid for instance, may get into this one.
    *support_ = *fresh_;
    MsgUtilized records = set.Records();
    const std::wstring datumName = CleanDatumName(BasicMessage(records).targetName);
    const std::vector<Place> places =
        datumName.empty() ? std::vector<Place>() : PlacesOf(records, datumName);
    std::string reason = OtherKindAt(places);
    ResultCode result = orx::cs::velta::kDatumFileTrouble;
    if (datumName.empty()) {
      result = orx::cs::velta::kNoDatumName;
    } else if (reason.empty()) {
      orx::ForgetFileError();
      result = support_->ParseRTCMMEssages(records);
      reason = orx::KeptFileError();
    }

    const std::uint32_t systemId = rtcm3::SystemIdOf(*set.FindDatum());
    IngestedSet ingested{systemId, result, PartsOf(set, places), ChangedFields(set),
                         NotAnnounced(set)};
    for (const unsigned number : ingested.notAnnounced) NameNotAnnounced(systemId, number);
    if (set.Announces(1026)) NameUnsupported(systemId);
    Count(ingested);
    NameSharedFile(places, BasicMessage(records).targetName);
    const bool isToldFailure = TellFailure(ingested, places, reason);
    if (isToldFailure || ingested.HasNews()) report_.Add(ingested);
    if (ingested.IsDifferent()) NameWayToReplace();
    return ingested.IsDone() || !IsOfTheFiles(result);
  }

  void Count(const IngestedSet& set) {
    if (!set.IsDone()) {
      const bool isAnotherTry = sets_.counts().repeats != repeatsBefore_;
      if (!isAnotherTry) ++totals_.failed;
      return;
    }
    ++totals_.ingested;
    if (set.IsDifferent()) {
      ++totals_.different;
    } else if (!set.HasAdded()) {
      ++totals_.alreadyThere;
    }
  }

  /// Tells a failure, but not the same one of a system again and again.
  /// \param reason what the system said; may be empty
  /// \return true when it was told
  bool TellFailure(const IngestedSet& set, const std::vector<Place>& places,
                   const std::string& reason) {
    if (std::exchange(results_[set.systemId], set.result) == set.result) return false;
    if (set.IsDone()) return false;
    std::string text = "system " + std::to_string(set.systemId) + ": ";
    std::string state;
    for (std::size_t i = 0; IsOfTheFiles(set.result) && i < places.size(); ++i) {
      if (FindEntry(places[i].file, places[i].entry.name)) continue;
      const std::string file = orx::ToUtf8(places[i].file);
      text += file + ": ";
      if (orx::FileFuncs::isFileExists(places[i].file)) state = StateOf(file).text;
      break;
    }
    text += Meaning(set.result);
    if (IsOfTheFiles(set.result) && !reason.empty()) text += ": " + reason;
    if (!state.empty()) text += ": " + state;
    Fail(text);
    return true;
  }

  /// What is wrong with the files of a set when one of them holds entries of the other kind; looked
  /// up once for each.
  std::string OtherKindAt(const std::vector<Place>& places) {
    for (const Place& place : places) {
      const auto [known, isNew] = holdsOtherKind_.try_emplace(place.file, false);
      if (isNew) known->second = HoldsOtherKind(orx::ToUtf8(place.file));
      if (known->second) return orx::ToUtf8(place.file) + " holds entries of the other kind";
    }
    return "";
  }

  /// Says, once, how the received values come into a file that has others.
  void NameWayToReplace() {
    if (std::exchange(isWayNamed_, true)) return;
    ReportNote(
        "to take the received values, ingest the stream into a fresh directory and merge\n"
        "its files into these: velta merge TARGET SOURCE");
  }

  /// Says, once for each file, that two received names have become one.
  void NameSharedFile(const std::vector<Place>& places, const std::string& receivedName) {
    if (places.empty()) return;
    const std::wstring& file = places.front().file;
    std::set<std::string>& known = receivedNames_[file];
    if (!known.insert(receivedName).second || known.size() == 1) return;
    const auto quoted = [](const std::string& name) {
      return '"' + Printable(orx::ToUtf8(orx::Widen(name))) + '"';
    };
    std::string names;
    for (const std::string& name : known) {
      names += (names.empty() ? "" : " and ") + quoted(name);
    }
    ReportNote(names + " have one file, as it is named without signs and repeated characters: " +
               orx::ToUtf8(file));
  }

  /// Says, once for each system, that a 1026 is not taken.
  void NameUnsupported(std::uint32_t systemId) {
    if (!named_.insert({systemId, 1026}).second) return;
    Fail("system " + std::to_string(systemId) +
         ": 1026: " + Meaning(orx::cs::velta::kUnsupportedProjection));
  }

  /// Says, once for each system, that a message comes unannounced.
  void NameNotAnnounced(std::uint32_t systemId, unsigned number) {
    if (!named_.insert({systemId, number}).second) return;
    ReportNote("system " + std::to_string(systemId) + ": " + std::to_string(number) +
               " is not announced by the datum message, and taken");
  }

  std::vector<Place> PlacesOf(const MsgUtilized& records, const std::wstring& datumName) {
    std::vector<Place> places;
    const auto add = [&places](const std::wstring& file, ReceivedEntry entry) {
      // Of two messages with one entry the first makes it.
      const bool isThere = FindEntry(file, entry.name).has_value() ||
                           std::any_of(places.begin(), places.end(), [&](const Place& place) {
                             return place.file == file && place.entry.name == entry.name;
                           });
      places.push_back({file, std::move(entry), isThere});
    };
    add(support_->GetDatumPath() + datumName + orx::cs::velta::kDatumFileExtension,
        ReceivedDatum(records));
    for (ReceivedEntry& projection : ReceivedProjections(records)) {
      add(support_->GetProjectionPath() + datumName + orx::cs::velta::kProjectionFileExtension,
          std::move(projection));
    }
    return places;
  }

  /// What became of a set at its places, asked of the files.
  std::vector<IngestedPart> PartsOf(const rtcm3::MessageSet& set,
                                    const std::vector<Place>& places) {
    std::vector<IngestedPart> parts;
    parts.emplace_back().messages = Held(set, {1021, 1022, 1023});
    for (const unsigned projection : {1025U, 1027U}) {
      if (set.Find(projection)) parts.emplace_back().messages = Held(set, {1024, projection});
    }
    for (const auto& [file, received, wasThere] : places) {
      const auto hasMessage = [message = received.message](const IngestedPart& part) {
        return Contains(part.messages, message);
      };
      IngestedPart& part = *std::find_if(parts.begin(), parts.end(), hasMessage);
      part.file = NameOf(PathOf(orx::ToUtf8(file)).filename());
      const std::optional<Entry> stored = FindEntry(file, received.name);
      part.isThere = stored.has_value();
      part.added = stored && !wasThere;
      if (!stored) continue;
      part.different = stored->content ? DifferingLabels(received.content, *stored->content)
                                       : std::vector<std::string>{"incomplete"};
      auto& told = toldDifferences_[{file, received.name}];
      part.isDifferenceNew = !part.different.empty() && told != part.different;
      told = part.different;
    }
    return parts;
  }

  /// The fields of the datum message that are not what they were when the same area of the same
  /// datum came before.
  std::vector<std::string> ChangedFields(const rtcm3::MessageSet& set) {
    const rtcm3::Message& datum = *set.FindDatum();
    const MsgUtilized records = set.Records();
    const RtcmBasicTransformMessage& record = BasicMessage(records);
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
  rtcm3::MessageSets sets_;
  std::uint64_t repeatsBefore_ = 0;  ///< counted before the current message
  /// Differences that have been reported, by file and entry.
  std::map<std::pair<std::wstring, std::wstring>, std::vector<std::string>> toldDifferences_;
  std::map<std::wstring, std::set<std::string>, orx::NameOrder> receivedNames_;  ///< by file
  std::map<std::wstring, bool> holdsOtherKind_;                                  ///< by file
  bool isWayNamed_ = false;
  std::map<DatumArea, rtcm3::Message> datums_;          ///< as they came last
  std::map<std::uint32_t, ResultCode> results_;         ///< of each system's last set
  std::set<std::pair<std::uint32_t, unsigned>> named_;  ///< systems and messages that were named
  IngestTotals totals_;
  int status_ = kDone;
  Output out_;
  IngestReport report_;
  Progress progress_;
  std::optional<Stream> stream_;
};

int Run(const Options& options) {
  Ingestion ingestion(options);
  FinishWhenInterrupted([&ingestion] { return ingestion.Finish(); });
  for (const std::string& file : options.files) ingestion.Read(file);
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
  for (CLI::Option* const directory : {dir, datumDir, projectionDir}) {
    directory->check(kFileName)->type_name("DIR");
  }
  command->add_flag("--json", options->json, "print the result as JSON, one object a line");
  command->footer(
      "A set is a datum message (1021 or 1022) and the messages that it announces, all with the\n"
      "same System Identification Number. It is ingested as soon as it is complete, and again\n"
      "for each message that comes new or different after that, announced or not. A line tells\n"
      "what is new: an entry, a projection, other parameters of a datum. A 1026 is not supported.\n"
      "A set that is incomplete at the end is a failure if its system never gave a complete one.\n"
      "Interrupted (Ctrl-C), the program takes what it has read and ends as at the end of it.\n"
      "Without a directory the files go where the office application looks for them: to\n"
      "datums/rtcmdata and projections/rtcmdata in ~/.local/share/orx/geodata, on Windows\n"
      "%LOCALAPPDATA%\\orx\\geodata; the environment variable ORX_USER_GEO_DIR names another.\n"
      "\n"
      "Example:\n"
      "  velta ingest --dir out examples/streams/dhdn.rtcm3");
  command->callback([&action, options] { action = [options] { return Run(*options); }; });
}

}  // namespace velta_tool
