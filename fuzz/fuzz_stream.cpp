// Arbitrary bytes as a stream: decoded, and its complete message sets ingested and generated again.

#include <cstdlib>
#include <map>
#include <sstream>
#include <string>

#include "message_set.h"
#include "rtcm3/frame.h"
#include "rtcm3/message_reader.h"
#include "scratch_directory.h"
#include "velta/rtcm_generator.h"

namespace velta_fuzz {
namespace {

namespace velta = orx::cs::velta;
namespace rtcm3 = velta_tool::rtcm3;

/// The input cut into payloads, each a byte count and so many bytes, with right frames around them.
std::string Frame(std::string_view input) {
  std::string stream;
  while (!input.empty()) {
    const std::size_t size = std::min<std::size_t>(static_cast<unsigned char>(input.front()), 255);
    input.remove_prefix(1);
    rtcm3::AppendFrame(input.substr(0, size), stream);
    input.remove_prefix(std::min(size, input.size()));
  }
  return stream;
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
  static const ScratchDirectory directory;
  directory.Empty();
  const std::wstring path = (directory / "").wstring();
  velta::RTCMDataSupport support(path.c_str(), path.c_str());
  std::map<std::uint32_t, velta_tool::MessageSet> sets;
  std::stringbuf in(stream);
  rtcm3::StreamCounts counts;
  rtcm3::MessageReader reader(in, counts);
  while (const rtcm3::Message* message = reader.Next()) {
    const std::uint32_t system = rtcm3::SystemIdOf(*message);
    velta_tool::MessageSet& set = sets[system];
    set.Put(*message, support);
    if (!set.Complete()) continue;
    velta::MsgUtilized records = set.Records();
    const velta::ResultCode result = support.ParseRTCMMEssages(records);
    // Whatever comes over the wire can be refused; a file that does not take it is a fault.
    if (result == velta::kDatumFileTrouble || result == velta::kProjectionFileTrouble) std::abort();
    Generate(support);
    sets.erase(system);
  }
}

}  // namespace
}  // namespace velta_fuzz

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  if (size == 0) return 0;
  const std::string_view input(reinterpret_cast<const char*>(data) + 1, size - 1);
  velta_fuzz::Ingest(data[0] % 4 == 0 ? std::string(input) : velta_fuzz::Frame(input));
  return 0;
}
