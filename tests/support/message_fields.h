#pragma once

#include <string>

#include "velta/rtcm_messages.h"

namespace velta_test {

using namespace orx::cs::velta;

/// Visits the fields that generation takes from a file: name, field, width in bits (a type code has
/// none) and the units it may lose in all on repeated trips through files, which only truncate.
template <class Visit>
void VisitFields(RtcmMessage& message, const Visit& visit) {
#define VISIT(field, bits, limit) visit(#field, m->field, bits, limit)
  if (auto* const m = dynamic_cast<RtcmBasicTransformMessage*>(&message)) {
    VISIT(phiV, 19, 400), VISIT(lambdaV, 20, 400), VISIT(dPhiV, 14, 10), VISIT(dLambdaV, 14, 10);
    VISIT(dX, 23, 5), VISIT(dY, 23, 5), VISIT(dZ, 23, 5), VISIT(r1, 32, 4), VISIT(r2, 32, 4);
    VISIT(r3, 32, 4), VISIT(dS, 25, 3), VISIT(addAs, 24, 3), VISIT(addBs, 25, 3);
    VISIT(addAt, 24, 3), VISIT(addBt, 25, 3), VISIT(heightIndicator, 2, 0);
  }
  if (auto* const m = dynamic_cast<Rtcm1022*>(&message)) {
    VISIT(xp, 35, 5), VISIT(yp, 35, 5), VISIT(zp, 35, 5);
  }
  if (auto* const m = dynamic_cast<RtcmTableMessage*>(&message)) {
    VISIT(horShiftIndicator, 1, 0), VISIT(vertShiftIndicator, 1, 0);
    VISIT(horInterpolationMethod, 2, 0), VISIT(vertInterpolationMethod, 2, 0);
  }
  if (auto* const m = dynamic_cast<Rtcm1023*>(&message)) {
    VISIT(phi0, 21, 400), VISIT(lambda0, 22, 400), VISIT(dPhi, 12, 10), VISIT(dLambda, 12, 10);
    VISIT(meanDPhi, 8, 3), VISIT(meanDLambda, 8, 3), VISIT(meanDH, 15, 5);
    for (int i = 0; i < kResidualGridPoints; ++i) {
      VISIT(residualPhi[i], 9, 3), VISIT(residualLambda[i], 9, 3), VISIT(residualH[i], 9, 0);
    }
  }
  if (auto* const m = dynamic_cast<Rtcm1024*>(&message)) {
    VISIT(north0, 25, 0), VISIT(east0, 26, 0), VISIT(dN, 12, 0), VISIT(dE, 12, 0);
    VISIT(meanDN, 10, 5), VISIT(meanDE, 10, 5), VISIT(meanDh, 15, 5);
    for (int i = 0; i < kResidualGridPoints; ++i) {
      VISIT(residualN[i], 9, 0), VISIT(residualE[i], 9, 0), VISIT(residualH[i], 9, 0);
    }
  }
  if (auto* const m = dynamic_cast<Rtcm1025*>(&message)) {
    VISIT(projectionType, 0, 0), VISIT(laNO, 34, 8), VISIT(loNO, 35, 8), VISIT(addSNO, 30, 30);
    VISIT(fe, 36, 5), VISIT(fn, 35, 5);
  }
  if (auto* const m = dynamic_cast<Rtcm1027*>(&message)) {
    VISIT(projectionType, 0, 0), VISIT(laPC, 34, 8), VISIT(loPC, 35, 8), VISIT(azIL, 35, 8);
    VISIT(addSIL, 30, 30), VISIT(epc, 36, 5), VISIT(npc, 35, 5), VISIT(rectificationFlag, 1, 0);
    VISIT(diffARSG, 26, 25);
  }
#undef VISIT
}

/// "type systemId: fields"; of a residual grid those before the residuals and the first point's.
inline std::string Describe(RtcmMessage* message) {
  if (!message) return "nothing";
  std::string text =
      std::to_string(message->messageType) + " " + std::to_string(message->systemId) + ":";
  int residuals = 0;
  VisitFields(*message, [&](const char*, auto& field, int bits, int) {
    if (bits != 9 || residuals++ < 3) text += " " + std::to_string(field);
  });
  return text;
}

}  // namespace velta_test
