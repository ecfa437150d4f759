#include "rtcm3/message_reader.h"

#include <utility>

#include "rtcm3/codec.h"

namespace velta_tool::rtcm3 {

bool StreamCounts::PassedOver() const {
  return frames.skippedBytes + frames.badCrcs + otherMessages + shortMessages > 0;
}

std::string Summary(const StreamCounts& counts) {
  std::string text = "frames: " + std::to_string(counts.frames.frames);
  std::string separator = " (";
  const auto add = [&](const std::string& what, std::uint64_t count) {
    if (count == 0) return;
    text += separator + what + ": " + std::to_string(count);
    separator = ", ";
  };
  for (unsigned i = 0; i < kMessageTypes; ++i) {
    add(std::to_string(kFirstMessage + i), counts.messages[i]);
  }
  add("other", counts.otherMessages);
  add("too short", counts.shortMessages);
  if (counts.frames.frames > 0) text += ")";
  return text + "; passed over: " + std::to_string(counts.frames.skippedBytes) + " bytes, " +
         std::to_string(counts.frames.badCrcs) + " wrong checksums";
}

MessageReader::MessageReader(std::streambuf& in, StreamCounts& counts,
                             std::function<void()> beforeRead)
    : frames_(in, counts.frames, std::move(beforeRead)), counts_(counts) {}

const Message* MessageReader::Next() {
  while (const auto payload = frames_.Next()) {
    switch (Decode(*payload, message_)) {
      case Decoded::kMessage:
        ++counts_.messages[message_.index()];
        return &message_;
      case Decoded::kOther:
        ++counts_.otherMessages;
        break;
      case Decoded::kTooShort:
        ++counts_.shortMessages;
        frames_.Remark(std::to_string((*payload)[0] << 4 | (*payload)[1] >> 4) +
                       " ends before its last field");
        break;
    }
  }
  return nullptr;
}

}  // namespace velta_tool::rtcm3
