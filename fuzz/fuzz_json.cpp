// Arbitrary lines as JSON messages: what is accepted must encode, and decode to itself.

#include <cstdlib>
#include <string>
#include <string_view>

#include "rtcm3/codec.h"
#include "rtcm3/fields.h"
#include "rtcm3/frame.h"
#include "rtcm3/json_lines.h"

namespace rtcm3 = velta_tool::rtcm3;

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  constexpr std::size_t kFrameHeader = 3;
  constexpr std::size_t kFrameOverhead = 6;
  const std::string_view line(reinterpret_cast<const char*>(data), size);
  try {
    const rtcm3::Message message = rtcm3::ParseJsonLine(line);
    std::string frame;
    rtcm3::Encode(message, frame);
    const auto* const payload = reinterpret_cast<const std::uint8_t*>(frame.data()) + kFrameHeader;
    rtcm3::Message decoded;
    const auto result = rtcm3::Decode({payload, frame.size() - kFrameOverhead}, decoded);
    std::string written;
    std::string again;
    rtcm3::AppendJsonLine(message, written);
    if (result == rtcm3::Decoded::kMessage) rtcm3::AppendJsonLine(decoded, again);
    if (written != again) std::abort();
  } catch (const rtcm3::FieldError&) {
    // The answer to a line that is no message.
  }
  return 0;
}
