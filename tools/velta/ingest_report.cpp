#include "ingest_report.h"

#include <algorithm>
#include <nlohmann/json.hpp>
#include <utility>

#include "command.h"
#include "stream_notes.h"
#include "terminal.h"

namespace velta_tool {
namespace {

using nlohmann::ordered_json;

std::string Joined(const std::vector<std::string>& words, const char* separator) {
  std::string text;
  for (const std::string& word : words) text += (text.empty() ? "" : separator) + word;
  return text;
}

std::string Joined(const std::vector<unsigned>& numbers) {
  std::vector<std::string> words;
  words.reserve(numbers.size());
  for (const unsigned number : numbers) words.push_back(std::to_string(number));
  return Joined(words, " + ");
}

/// What is new and, of a set that failed, what did not get in.
std::string SetText(const IngestedSet& set) {
  std::string text = "system " + std::to_string(set.systemId);
  std::string separator = ": ";
  const auto add = [&](const std::string& what) { text += std::exchange(separator, "; ") + what; };
  for (const IngestedPart& part : set.parts) {
    const std::string messages = Joined(part.messages);
    if (part.added) add(messages + " in " + part.file + ", added");
    if (!part.isThere) add(messages + ", not added");
    if (part.isDifferenceNew) {
      add(messages + " in " + part.file + ", already there with other values (" +
          Joined(part.different, ", ") + "), the file's are kept");
    }
  }
  if (!set.changed.empty()) add("the datum message has changed: " + Joined(set.changed, ", "));
  return text;
}

ordered_json SetJson(const IngestedSet& set) {
  ordered_json parts = ordered_json::array();
  for (const IngestedPart& part : set.parts) {
    parts.push_back({{"messages", part.messages},
                     {"file", part.file},
                     {"added", part.added},
                     {"different", part.different}});
  }
  return {{"systemId", set.systemId},
          {"result", CodeText(set.result)},
          {"parts", parts},
          {"changed", set.changed},
          {"notAnnounced", set.notAnnounced}};
}

std::string TotalsText(const IngestTotals& totals) {
  std::string text = "datum files in " + totals.datumDirectory + "\nprojection files in " +
                     totals.projectionDirectory + "\nsets: " + std::to_string(totals.ingested) +
                     " ingested";
  std::vector<std::string> there;
  if (totals.alreadyThere > 0)
    there.push_back(std::to_string(totals.alreadyThere) + " already there");
  if (totals.different > 0) {
    there.push_back(std::to_string(totals.different) + " already there with other values");
  }
  if (!there.empty()) text += " (" + Joined(there, ", ") + ")";
  return text + ", " + std::to_string(totals.failed) + " failed, " +
         std::to_string(totals.incomplete) +
         " incomplete; repeated messages: " + std::to_string(totals.repeats) + "\n" +
         Summary(totals.stream);
}

ordered_json TotalsJson(const IngestTotals& totals) {
  ordered_json messages;
  for (unsigned i = 0; i < rtcm3::kMessageTypes; ++i) {
    messages[std::to_string(rtcm3::kFirstMessage + i)] = totals.stream.messages[i];
  }
  return {{"ingested", totals.ingested},
          {"alreadyThere", totals.alreadyThere},
          {"different", totals.different},
          {"failed", totals.failed},
          {"incomplete", totals.incomplete},
          {"repeats", totals.repeats},
          {"frames", totals.stream.frames.frames},
          {"messages", messages},
          {"cutMessages", totals.stream.cutMessages},
          {"otherMessages", totals.stream.otherMessages},
          {"shortMessages", totals.stream.shortMessages},
          {"skippedBytes", totals.stream.frames.skippedBytes},
          {"badCrcs", totals.stream.frames.badCrcs},
          {"datumDirectory", totals.datumDirectory},
          {"projectionDirectory", totals.projectionDirectory}};
}

}  // namespace

bool IngestedSet::HasAdded() const {
  return std::any_of(parts.begin(), parts.end(), [](const auto& part) { return part.added; });
}

bool IngestedSet::IsDifferent() const {
  return std::any_of(parts.begin(), parts.end(),
                     [](const auto& part) { return !part.different.empty(); });
}

bool IngestedSet::HasNews() const {
  return HasAdded() || !changed.empty() ||
         std::any_of(parts.begin(), parts.end(),
                     [](const auto& part) { return part.isDifferenceNew; });
}

void IngestReport::Add(const IngestedSet& set) {
  if (IsQuiet() && !json_) return;
  out_.pending() += (json_ ? SetJson(set).dump() : SetText(set)) + '\n';
  out_.FlushIfLarge();
}

void IngestReport::AddIncomplete(std::uint32_t systemId, const std::vector<std::string>& missing) {
  if (!json_) return;  // standard error tells it
  out_.pending() += ordered_json{{"systemId", systemId}, {"missing", missing}}.dump() + '\n';
}

void IngestReport::Close(const IngestTotals& totals) {
  if (json_) {
    out_.pending() += TotalsJson(totals).dump() + '\n';
  } else if (!IsQuiet()) {
    out_.pending() += TotalsText(totals) + '\n';
  }
  out_.Flush();
}

}  // namespace velta_tool
