#include "ingest_report.h"

#include <nlohmann/json.hpp>

#include "command.h"

namespace velta_tool {
namespace {

using nlohmann::ordered_json;

std::string Joined(const std::vector<unsigned>& numbers) {
  std::string text;
  for (const unsigned number : numbers)
    text += (text.empty() ? "" : " + ") + std::to_string(number);
  return text;
}

std::string SetText(const IngestedSet& set) {
  const bool done = set.result == orx::cs::velta::kSuccess;
  std::string text = "system " + std::to_string(set.systemId);
  std::string separator = ": ";
  for (const IngestedPart& part : set.parts) {
    text += separator + Joined(part.messages);
    text += part.added || done ? " in " + part.file : "";
    text += part.added ? ", added" : done ? ", already there" : ", failed";
    separator = "; ";
  }
  if (!set.leftOut.empty()) text += "; not announced: " + Joined(set.leftOut);
  return text;
}

ordered_json SetJson(const IngestedSet& set) {
  ordered_json parts = ordered_json::array();
  for (const IngestedPart& part : set.parts) {
    parts.push_back({{"messages", part.messages}, {"file", part.file}, {"added", part.added}});
  }
  return {{"systemId", set.systemId},
          {"result", CodeText(set.result)},
          {"parts", parts},
          {"notAnnounced", set.leftOut}};
}

std::string TotalsText(const IngestTotals& totals) {
  return "sets: " + std::to_string(totals.ingested) + " ingested, " +
         std::to_string(totals.failed) + " failed, " + std::to_string(totals.incomplete) +
         " incomplete\n" + Summary(totals.stream);
}

ordered_json TotalsJson(const IngestTotals& totals) {
  ordered_json messages;
  for (unsigned i = 0; i < rtcm3::kMessageTypes; ++i) {
    messages[std::to_string(rtcm3::kFirstMessage + i)] = totals.stream.messages[i];
  }
  return {{"ingested", totals.ingested},
          {"failed", totals.failed},
          {"incomplete", totals.incomplete},
          {"frames", totals.stream.frames.frames},
          {"messages", messages},
          {"otherMessages", totals.stream.otherMessages},
          {"shortMessages", totals.stream.shortMessages},
          {"skippedBytes", totals.stream.frames.skippedBytes},
          {"badCrcs", totals.stream.frames.badCrcs}};
}

}  // namespace

void IngestReport::Add(const IngestedSet& set) {
  out_.pending() += (json_ ? SetJson(set).dump() : SetText(set)) + '\n';
  out_.FlushMuch();
}

void IngestReport::AddIncomplete(std::uint32_t systemId, const std::vector<std::string>& missing) {
  if (!json_) return;  // standard error tells it
  out_.pending() += ordered_json{{"systemId", systemId}, {"missing", missing}}.dump() + '\n';
}

void IngestReport::Close(const IngestTotals& totals) {
  out_.pending() += (json_ ? TotalsJson(totals).dump() : TotalsText(totals)) + '\n';
  out_.Flush();
}

}  // namespace velta_tool
