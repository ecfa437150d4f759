#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <optional>
#include <streambuf>
#include <string>
#include <string_view>
#include <vector>

#include "rtcm3/export.h"

namespace orx::cs::velta::rtcm3 {

/// The most bytes that a frame can carry.
inline constexpr std::size_t kMaxPayload = 1023;

/// Appends a frame around a payload of at most kMaxPayload bytes.
/// \throws std::length_error for a longer one
VELTA_RTCM3_EXPORT void AppendFrame(std::string_view payload, std::string& out);

/// What a stream held so far.
struct FrameCounts {
  std::uint64_t bytes = 0;         ///< read
  std::uint64_t frames = 0;        ///< whole, with the right checksum
  std::uint64_t skippedBytes = 0;  ///< outside those frames
  std::uint64_t badCrcs = 0;       ///< places that looked like a frame but for the checksum
  /// What is worth telling of, with its place: where bytes were passed over and why, which of the
  /// messages are too short, each up to the first kMostRemarks of a stream; and what is unusual
  /// about the messages of a system.
  std::vector<std::string> remarks;
};

inline constexpr std::size_t kMostRemarks = 10;  ///< of one kind, of a stream

/// Finds the frames in a stream of bytes. After a place that fails, the search goes on one byte
/// behind its first.
class FrameReader {
 public:
  /// \param in stays the caller's and must outlive the reader; takes what has arrived without
  ///     waiting for more, so that a live stream is followed frame by frame
  /// \param counts the caller's too; counted on from what they hold
  /// \param beforeRead called each time before the stream is asked, which may have to wait
  VELTA_RTCM3_EXPORT FrameReader(std::streambuf& in, FrameCounts& counts,
                                 std::function<void()> beforeRead = {});
  VELTA_RTCM3_EXPORT ~FrameReader();
  FrameReader(const FrameReader&) = delete;
  FrameReader& operator=(const FrameReader&) = delete;

  /// \return the next frame's payload, valid until the next call; nothing at the end
  VELTA_RTCM3_EXPORT std::optional<std::string_view> Next();

  /// Adds a remark about the last frame.
  VELTA_RTCM3_EXPORT void Remark(const std::string& what);

 private:
  std::uint64_t Place() const { return counts_.bytes - bytesBefore_ - (end_ - begin_); }
  void RemarkAt(std::uint64_t place, const std::string& what);
  void EndSkipping();
  bool SkipToPreamble();
  void Skip(std::size_t bytes);
  std::size_t FrameSize();
  bool Require(std::size_t bytes);
  bool Fill();

  std::streambuf& in_;
  FrameCounts& counts_;
  std::function<void()> beforeRead_;
  std::vector<std::uint8_t> buffer_;
  std::size_t begin_ = 0;
  std::size_t end_ = 0;
  std::uint64_t bytesBefore_;    ///< counted before this stream
  std::uint64_t frameAt_ = 0;    ///< place of the last frame in the stream
  std::size_t skipRemarks_ = 0;  ///< on what was passed over
  std::uint64_t skippedAt_ = 0;  ///< place, bytes and bad checksums of the run being skipped
  std::uint64_t skipped_ = 0;
  std::uint64_t skippedCrcs_ = 0;
  bool endsInFrame_ = false;  ///< the stream ends before what looks like a frame does
};

}  // namespace orx::cs::velta::rtcm3
