#pragma once

#include <string>

#include "velta/rtcm_messages.h"

namespace velta_test {

using namespace orx::cs::velta;

/// Visits the fields that generation takes from a file, with their widths in bits; a type code
/// has none.
template <class Visit>
void VisitFields(RtcmMessage& message, const Visit& visit) {
  if (auto* const m = dynamic_cast<RtcmBasicTransformMessage*>(&message)) {
    visit(m->phiV, 19), visit(m->lambdaV, 20), visit(m->dPhiV, 14), visit(m->dLambdaV, 14);
    visit(m->dX, 23), visit(m->dY, 23), visit(m->dZ, 23), visit(m->r1, 32), visit(m->r2, 32);
    visit(m->r3, 32), visit(m->dS, 25), visit(m->addAs, 24), visit(m->addBs, 25);
    visit(m->addAt, 24), visit(m->addBt, 25), visit(m->heightIndicator, 2);
  }
  if (auto* const m = dynamic_cast<Rtcm1022*>(&message)) {
    visit(m->xp, 35), visit(m->yp, 35), visit(m->zp, 35);
  }
  if (auto* const m = dynamic_cast<RtcmTableMessage*>(&message)) {
    visit(m->horShiftIndicator, 1), visit(m->vertShiftIndicator, 1);
    visit(m->horInterpolationMethod, 2), visit(m->vertInterpolationMethod, 2);
  }
  const auto visitAll = [&](auto&... residuals) {
    for (int i = 0; i < kResidualGridPoints; ++i) (visit(residuals[i], 9), ...);
  };
  if (auto* const m = dynamic_cast<Rtcm1023*>(&message)) {
    visit(m->phi0, 21), visit(m->lambda0, 22), visit(m->dPhi, 12), visit(m->dLambda, 12);
    visit(m->meanDPhi, 8), visit(m->meanDLambda, 8), visit(m->meanDH, 15);
    visitAll(m->residualPhi, m->residualLambda, m->residualH);
  }
  if (auto* const m = dynamic_cast<Rtcm1024*>(&message)) {
    visit(m->north0, 25), visit(m->east0, 26), visit(m->dN, 12), visit(m->dE, 12);
    visit(m->meanDN, 10), visit(m->meanDE, 10), visit(m->meanDh, 15);
    visitAll(m->residualN, m->residualE, m->residualH);
  }
  if (auto* const m = dynamic_cast<Rtcm1025*>(&message)) {
    visit(m->projectionType, 0);
    visit(m->laNO, 34), visit(m->loNO, 35), visit(m->addSNO, 30), visit(m->fe, 36);
    visit(m->fn, 35);
  }
  if (auto* const m = dynamic_cast<Rtcm1027*>(&message)) {
    visit(m->projectionType, 0);
    visit(m->laPC, 34), visit(m->loPC, 35), visit(m->azIL, 35), visit(m->addSIL, 30);
    visit(m->epc, 36), visit(m->npc, 35), visit(m->rectificationFlag, 1);
    visit(m->diffARSG, 26);
  }
}

/// "type systemId: fields"; of a residual grid those before the residuals and the first point's.
inline std::string Describe(RtcmMessage* message) {
  if (!message) return "nothing";
  std::string text =
      std::to_string(message->messageType) + " " + std::to_string(message->systemId) + ":";
  int residuals = 0;
  VisitFields(*message, [&](auto& field, int bits) {
    if (bits != 9 || residuals++ < 3) text += " " + std::to_string(field);
  });
  return text;
}

}  // namespace velta_test
