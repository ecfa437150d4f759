#pragma once

#include <cstddef>
#include <string>

#include "rtcm3/message_reader.h"

namespace velta_tool {

namespace rtcm3 = orx::cs::velta::rtcm3;

/// The counts as one sentence.
std::string Summary(const rtcm3::StreamCounts& counts);

/// True when anything but the messages 1021 to 1027 was met.
bool PassedOver(const rtcm3::StreamCounts& counts);

/// Tells on standard error what is remarked on in a stream.
class StreamNotes {
 public:
  /// \param file the stream's name
  /// \param counts what is counted while the stream is read; stays the caller's
  StreamNotes(std::string file, const rtcm3::StreamCounts& counts);

  /// Tells the remarks that have come since.
  void Tell();

 private:
  std::string file_;
  const rtcm3::StreamCounts& counts_;
  std::size_t told_;
};

}  // namespace velta_tool
