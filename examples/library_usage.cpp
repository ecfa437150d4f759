// Puts a received datum into a file and lists what the file holds.

#include <iostream>

#include "velta/rtcm_data_support.h"
#include "velta/rtcm_generator.h"

int main() {
  using namespace orx::cs::velta;

  Rtcm1021 datum;  // as a decoder fills it, in the units of the message
  datum.messageType = 21;
  datum.systemId = 23;
  datum.utilizedMsgIndicator = 1;  // a 1023 belongs to it
  datum.sourceName = "ETRS89";
  datum.targetName = "DHDN";
  datum.phiV = 93600;     // 52 degrees, in 2"
  datum.lambdaV = 16200;  // 9 degrees
  datum.dPhiV = datum.dLambdaV = 7200;
  datum.dX = -598100;  // millimetres
  Rtcm1023 grid;
  grid.systemId = 23;
  grid.phi0 = 374400;  // 52 degrees, in 0.5"
  grid.lambda0 = 64800;
  grid.dPhi = grid.dLambda = 30;

  RTCMDataSupport support(L"datums/", L"projections/");
  MsgUtilized set;
  set.info = support.GetUtilizedMessageInfo(datum);
  set.msg1021 = &datum;
  set.msg1023 = &grid;
  if (support.ParseRTCMMEssages(set) != kSuccess) return 1;

  for (const DatumData& entry : RTCMGenerator(23, L"datums/DHDN.dff", L"").getAllDatums()) {
    std::wcout << entry.sourceDatumName << L" to " << entry.targetDatumName << L": dX "
               << entry.parameters[0] << L" m\n";
  }
}
