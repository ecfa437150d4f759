// Arbitrary lines as JSON messages: what is accepted must encode, and decode to itself.

#include <cstdlib>
#include <string>
#include <string_view>

#include "rtcm3/codec.h"
#include "rtcm3/frame.h"
#include "rtcm3/json_lines.h"

namespace velta_fuzz {
namespace {

namespace rtcm3 = orx::cs::velta::rtcm3;

void Try(std::string_view line) {
  constexpr std::size_t kFrameHeader = 3;
  constexpr std::size_t kFrameOverhead = 6;
  try {
    const rtcm3::Message message = rtcm3::ParseJsonLine(line);
    std::string frame;
    rtcm3::Encode(message, frame);
    rtcm3::Message decoded;
    const std::string_view payload(frame.data() + kFrameHeader, frame.size() - kFrameOverhead);
    const auto result = rtcm3::Decode(payload, decoded);
    std::string written;
    std::string again;
    rtcm3::AppendJsonLine(message, written);
    if (result == rtcm3::Decoded::kMessage) rtcm3::AppendJsonLine(decoded, again);
    if (written != again) std::abort();
  } catch (const rtcm3::FieldError&) {
    // The answer to a line that is no message.
  }
}

}  // namespace
}  // namespace velta_fuzz

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  std::string_view input(reinterpret_cast<const char*>(data), size);
  while (!input.empty()) {
    const std::size_t end = std::min(input.find('\n'), input.size());
    velta_fuzz::Try(input.substr(0, end));
    input.remove_prefix(std::min(end + 1, input.size()));
  }
  return 0;
}
