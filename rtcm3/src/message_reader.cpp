#include "rtcm3/message_reader.h"

#include <string>
#include <utility>

#include "rtcm3/codec.h"

namespace orx::cs::velta::rtcm3 {

MessageReader::MessageReader(std::streambuf& in, StreamCounts& counts,
                             std::function<void()> beforeRead)
    : frames_(in, counts.frames, std::move(beforeRead)), counts_(counts) {}

MessageReader::~MessageReader() = default;

const Message* MessageReader::Next() {
  while (const auto payload = frames_.Next()) {
    const Decoded decoded = Decode(*payload, message_);
    switch (decoded) {
      case Decoded::kOther:
        ++counts_.otherMessages;
        continue;
      case Decoded::kTooShort:
        ++counts_.shortMessages;
        if (shortRemarks_++ < kMostRemarks) {
          frames_.Remark(std::to_string(NumberOf(message_)) + " ends before its last field");
        }
        continue;
      case Decoded::kCutMessage:
        ++counts_.cutMessages;
        RemarkOnce(cut_, "lacks the end of its last field, the missing bits are taken for 0");
        break;
      case Decoded::kMessage:
        break;
    }
    ++counts_.messages[message_.index()];
    if (HasUnlikelyScale(message_)) {
      RemarkOnce(unlikelyScale_, "has a scale field of 0, a scale of 0.993, which is unlikely");
    }
    return &message_;
  }
  return nullptr;
}

void MessageReader::RemarkOnce(Said& said, const char* what) {
  auto ofThisSystem = said[message_.index()][SystemIdOf(message_)];
  if (ofThisSystem) return;
  ofThisSystem = true;
  frames_.Remark(std::to_string(NumberOf(message_)) + " of system " +
                 std::to_string(SystemIdOf(message_)) + " " + what);
}

}  // namespace orx::cs::velta::rtcm3
