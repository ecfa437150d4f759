#pragma once

#include <array>
#include <cstdint>
#include <functional>
#include <streambuf>
#include <string>

#include "rtcm3/frame.h"
#include "rtcm3/message.h"

namespace velta_tool::rtcm3 {

/// What a stream held, message by message.
struct StreamCounts {
  FrameCounts frames;
  std::array<std::uint64_t, kMessageTypes> messages = {};  ///< 1021 to 1027
  std::uint64_t otherMessages = 0;
  std::uint64_t shortMessages = 0;  ///< 1021 to 1027 that end before their last field

  /// True when anything but the messages 1021 to 1027 was met.
  bool PassedOver() const;
};

/// The counts as one sentence.
std::string Summary(const StreamCounts& counts);

/// Takes the messages 1021 to 1027 out of a stream and passes over everything else.
class MessageReader {
 public:
  /// \param in, counts, beforeRead as FrameReader takes them
  MessageReader(std::streambuf& in, StreamCounts& counts, std::function<void()> beforeRead = {});

  /// \return the next message, valid until the next call; null at the end
  const Message* Next();

 private:
  FrameReader frames_;
  StreamCounts& counts_;
  Message message_;
};

}  // namespace velta_tool::rtcm3
