// Arbitrary bytes as a stream: decoded, and its complete message sets ingested and generated again.

#include <cstdlib>
#include <cstring>
#include <random>
#include <sstream>
#include <string>
#include <vector>

#include "rtcm3/codec.h"
#include "rtcm3/frame.h"
#include "rtcm3/json_lines.h"
#include "rtcm3/message_reader.h"
#include "rtcm3/message_sets.h"
#include "support/temporary_directory.h"
#include "velta/rtcm_data_support.h"
#include "velta/rtcm_generator.h"

extern "C" std::size_t LLVMFuzzerMutate(std::uint8_t* data, std::size_t size, std::size_t maxSize);

namespace velta_fuzz {
namespace {

namespace velta = orx::cs::velta;
namespace rtcm3 = orx::cs::velta::rtcm3;

void Require(bool holds) {
  if (!holds) std::abort();
}

/// Spoils one of the frames of a stream and puts right frames around all of them.
std::string Spoil(const std::string& stream, unsigned seed) {
  constexpr std::size_t kLongestPayload = 1023;
  std::minstd_rand random(seed);
  std::vector<std::string> payloads;
  std::stringbuf in(stream);
  rtcm3::FrameCounts counts;
  rtcm3::FrameReader reader(in, counts);
  while (const auto payload = reader.Next())
    payloads.emplace_back(payload->begin(), payload->end());
  if (payloads.empty()) payloads.emplace_back(stream, 0, kLongestPayload);
  std::string& one = payloads[random() % payloads.size()];
  std::string& other = payloads[random() % payloads.size()];
  switch (random() % 8) {
    case 0:
      payloads.push_back(one);
      break;
    case 1:
      std::swap(one, other);
      break;
    case 2:
      one = std::move(payloads.back());
      payloads.pop_back();
      break;
    default:
      const std::size_t size = one.size();
      one.resize(kLongestPayload);
      one.resize(LLVMFuzzerMutate(reinterpret_cast<std::uint8_t*>(one.data()), size, one.size()));
  }
  std::string spoiled;
  for (const std::string& payload : payloads) rtcm3::AppendFrame(payload, spoiled);
  return spoiled;
}

/// A message shown as JSON is the same message when it is read again.
void Show(const rtcm3::Message& message) {
  std::string line;
  std::string again;
  rtcm3::AppendJsonLine(message, line);
  rtcm3::AppendJsonLine(rtcm3::ParseJsonLine(line), again);
  Require(line == again);
}

void Generate(const velta::RTCMDataSupport& support) {
  const std::wstring name = support.GetTargetDatumName();
  const velta::RTCMGenerator generator(1, support.GetDatumPath() + name + L".dff",
                                       support.GetProjectionPath() + name + L".prj");
  for (const velta::DatumData& datum : generator.getAllDatums()) {
    generator.getRtcmDatumMessage(datum.validityCentre[0], datum.validityCentre[1], 0);
    generator.get1023(datum.grid.bounds[0], datum.grid.bounds[2], 0);
  }
  generator.get1024(0, 0, 0);
  generator.getRtcmProjMessage();
}

void Ingest(const std::string& stream) {
  const velta_test::TemporaryDirectory directory;
  const std::wstring path = (directory / "").wstring();
  velta::RTCMDataSupport support(path.c_str(), path.c_str());
  unsigned taken = 0;
  rtcm3::MessageSets sets([&](const rtcm3::MessageSet& set) {
    velta::MsgUtilized records = set.Records();
    const velta::ResultCode result = support.ParseRTCMMEssages(records);
    // Whatever comes over the wire can be refused; a file that does not take it is a fault.
    Require(result != velta::kDatumFileTrouble && result != velta::kProjectionFileTrouble &&
            result != velta::kEntryNotWritten);
    Generate(support);
    return ++taken % 2 == 0;
  });
  std::stringbuf in(stream);
  rtcm3::StreamCounts counts;
  rtcm3::MessageReader reader(in, counts);
  while (const rtcm3::Message* message = reader.Next()) {
    Show(*message);
    sets.Put(*message);
  }
  sets.Incomplete();
}

}  // namespace
}  // namespace velta_fuzz

extern "C" std::size_t LLVMFuzzerCustomMutator(std::uint8_t* data, std::size_t size,
                                               std::size_t maxSize, unsigned seed) {
  if (seed % 4 == 0) return LLVMFuzzerMutate(data, size, maxSize);
  const std::string spoiled = velta_fuzz::Spoil({reinterpret_cast<const char*>(data), size}, seed);
  if (spoiled.size() > maxSize) return LLVMFuzzerMutate(data, size, maxSize);
  std::memcpy(data, spoiled.data(), spoiled.size());
  return spoiled.size();
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  velta_fuzz::Ingest({reinterpret_cast<const char*>(data), size});
  return 0;
}
