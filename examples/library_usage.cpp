// Reads an RTCM 3 stream from a file, puts its transformations into datum and projection files, and
// lists what the last datum's file holds.

#include <fstream>
#include <iostream>

#include "orxutils/orx_string.h"
#include "rtcm3/message_reader.h"
#include "rtcm3/message_sets.h"
#include "velta/rtcm_data_support.h"
#include "velta/rtcm_generator.h"

int main(int argc, char** argv) {
  using namespace orx::cs::velta;
  std::ifstream stream(argc > 1 ? argv[1] : "", std::ios::binary);

  const RTCMDataSupport fresh(L"datums/", L"projections/");
  RTCMDataSupport support(L"datums/", L"projections/");
  rtcm3::MessageSets sets([&](const rtcm3::MessageSet& set) {
    support = fresh;  // so that nothing of the last set gets into this one
    MsgUtilized records = set.Records();
    const ResultCode result = support.ParseRTCMMEssages(records);
    std::cout << "system " << records.info.systemId << ": result " << result << '\n';
    return result == kSuccess;
  });

  rtcm3::StreamCounts counts;
  rtcm3::MessageReader messages(*stream.rdbuf(), counts);
  while (const rtcm3::Message* message = messages.Next()) sets.Put(*message);
  for (const std::string& remark : counts.frames.remarks) std::cout << remark << '\n';

  const std::wstring file = support.GetDatumPath() + support.GetTargetDatumName() + L".dff";
  for (const DatumData& entry : RTCMGenerator(0, file, L"").getAllDatums()) {
    std::cout << orx::ToUtf8(entry.sourceDatumName) << " to " << orx::ToUtf8(entry.targetDatumName)
              << ": dX " << entry.parameters[0] << " m\n";
  }
}
