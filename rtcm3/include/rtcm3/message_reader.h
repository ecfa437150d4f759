#pragma once

#include <array>
#include <bitset>
#include <cstdint>
#include <functional>
#include <streambuf>

#include "rtcm3/export.h"
#include "rtcm3/frame.h"
#include "rtcm3/message.h"

namespace orx::cs::velta::rtcm3 {

/// What a stream held, message by message.
struct StreamCounts {
  FrameCounts frames;                                      ///< the frames, of any message
  std::array<std::uint64_t, kMessageTypes> messages = {};  ///< 1021 to 1027
  std::uint64_t cutMessages = 0;    ///< those of them whose last field lacks less than a byte
  std::uint64_t otherMessages = 0;  ///< of other numbers
  std::uint64_t shortMessages = 0;  ///< 1021 to 1027 that lack more, and were passed over
};

/// Takes the messages 1021 to 1027 out of a stream and passes over everything else.
///
/// It remarks, once for each number and system, on a message that lacks the end of its last field
/// and on a scale that is hardly meant (HasUnlikelyScale); and on messages that are too short.
class MessageReader {
 public:
  /// \param in, counts, beforeRead as FrameReader takes them
  VELTA_RTCM3_EXPORT MessageReader(std::streambuf& in, StreamCounts& counts,
                                   std::function<void()> beforeRead = {});
  VELTA_RTCM3_EXPORT ~MessageReader();
  MessageReader(const MessageReader&) = delete;
  MessageReader& operator=(const MessageReader&) = delete;

  /// \return the next message, valid until the next call; null at the end
  VELTA_RTCM3_EXPORT const Message* Next();

 private:
  /// The systems of which something has been said, by number.
  using Said = std::array<std::bitset<256>, kMessageTypes>;

  void RemarkOnce(Said& said, const char* what);

  std::size_t shortRemarks_ = 0;  ///< on messages that are too short

  FrameReader frames_;
  StreamCounts& counts_;
  Message message_;
  Said cut_;
  Said unlikelyScale_;
};

}  // namespace orx::cs::velta::rtcm3
