#include "stream_notes.h"

#include <utility>
#include <vector>

#include "command.h"

namespace velta_tool {

std::string Summary(const rtcm3::StreamCounts& counts) {
  std::string text = "frames: " + std::to_string(counts.frames.frames);
  std::string separator = " (";
  const auto add = [&](const std::string& what, std::uint64_t count) {
    if (count == 0) return;
    text += separator + what + ": " + std::to_string(count);
    separator = ", ";
  };
  for (unsigned i = 0; i < rtcm3::kMessageTypes; ++i) {
    add(std::to_string(rtcm3::kFirstMessage + i), counts.messages[i]);
  }
  add("other", counts.otherMessages);
  add("without their very end", counts.cutMessages);
  add("too short", counts.shortMessages);
  if (counts.frames.frames > 0) text += ")";
  return text + "; passed over: " + std::to_string(counts.frames.skippedBytes) + " bytes, " +
         std::to_string(counts.frames.badCrcs) + " wrong checksums";
}

bool PassedOver(const rtcm3::StreamCounts& counts) {
  return counts.frames.skippedBytes + counts.frames.badCrcs + counts.otherMessages +
             counts.shortMessages >
         0;
}

StreamNotes::StreamNotes(std::string file, const rtcm3::StreamCounts& counts)
    : file_(std::move(file)), counts_(counts), told_(counts.frames.remarks.size()) {}

void StreamNotes::Tell() {
  const std::vector<std::string>& remarks = counts_.frames.remarks;
  for (; told_ < remarks.size(); ++told_) ReportNote(file_ + ": " + remarks[told_]);
}

}  // namespace velta_tool
