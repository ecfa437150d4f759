#pragma once

#include <algorithm>
#include <iterator>

#include "velta/rtcm_messages.h"

namespace velta_test {

/// A datum message, a projection message and the grids of both.
template <class Datum, class Projection>
struct MessageSet {
  Datum datum;
  orx::cs::velta::Rtcm1023 grid;
  orx::cs::velta::Rtcm1024 planeGrid;
  Projection projection;
};

using HelmertSet = MessageSet<orx::cs::velta::Rtcm1021, orx::cs::velta::Rtcm1025>;
using BadekasSet = MessageSet<orx::cs::velta::Rtcm1022, orx::cs::velta::Rtcm1027>;

/// DHDN with its residual grid and zone 3 of its Gauss-Krueger grid; the plane grid is made up.
inline HelmertSet Dhdn() {
  HelmertSet set;
  auto& [datum, grid, plane, projection] = set;
  datum.messageType = 21, datum.systemId = 23;
  datum.sourceName = "ETRF89_ETRF89", datum.targetName = "AUTO_DHDN_BESSEL";
  datum.utilizedMsgIndicator = 5, datum.plateNumber = 7;
  datum.computationIndicator = datum.heightIndicator = 1;
  datum.phiV = 91984, datum.lambdaV = 18653, datum.dPhiV = datum.dLambdaV = 7200;
  datum.dX = -584957, datum.dY = -70270, datum.dZ = -405170;
  datum.r1 = 55776, datum.r2 = -8250, datum.r3 = -154450, datum.dS = -799217;
  datum.addAs = 8137000, datum.addBs = 6752314, datum.addAt = 7397155, datum.addBt = 6078963;

  grid.horShiftIndicator = grid.vertShiftIndicator = true;
  grid.phi0 = 374415, grid.lambda0 = 64815, grid.dPhi = grid.dLambda = 30;
  grid.meanDPhi = -3, grid.meanDLambda = 14, grid.meanDH = 33;
  constexpr int kPhi[] = {11, 9, 7, 5, 4, 2, 0, -2, -3, -5, -7, -9, -10, -12, -14, -16};
  constexpr int kLambda[] = {-10, -7, -4, -1, -11, -8, -5, -2, -12, -9, -6, -3, -13, -10, -7, -4};
  constexpr int kH[] = {-3, -4, -1, -6, 1, -3, -2, -5, 0, -7, -3, -4, -1, -6, 1, -3};
  std::copy(std::begin(kPhi), std::end(kPhi), grid.residualPhi);
  std::copy(std::begin(kLambda), std::end(kLambda), grid.residualLambda);
  std::copy(std::begin(kH), std::end(kH), grid.residualH);
  grid.mjd = 60000;

  plane.vertShiftIndicator = true;
  plane.horInterpolationMethod = 1, plane.vertInterpolationMethod = 2;
  plane.north0 = 540000, plane.east0 = 340000, plane.dN = 100, plane.dE = 120;
  plane.meanDN = 7, plane.meanDE = -12, plane.meanDh = -345;
  for (int i = 0; i < orx::cs::velta::kResidualGridPoints; ++i) {
    plane.residualN[i] = i * 16 - 120, plane.residualE[i] = 100 - i * 13;
    plane.residualH[i] = 255 - i * 34;
  }
  projection.systemId = 23, projection.projectionType = 1;
  projection.loNO = 818181818, projection.addSNO = 700000000, projection.fe = 3500000000;
  return set;
}

/// A Molodenski-Badekas datum in the south and west that covers the globe, and a rectified oblique
/// Mercator; the grids are those of the DHDN set.
inline BadekasSet Badekas() {
  const HelmertSet helmert = Dhdn();
  BadekasSet set;
  auto& [datum, grid, plane, projection] = set;
  static_cast<orx::cs::velta::RtcmBasicTransformMessage&>(datum) = helmert.datum;
  grid = helmert.grid;
  plane = helmert.planeGrid;
  datum.messageType = 22, datum.computationIndicator = datum.heightIndicator = 3;
  datum.sourceName = "WGS84 (G1762)", datum.targetName = "Local B/O 7";
  datum.phiV = -61234, datum.lambdaV = -200111, datum.dPhiV = datum.dLambdaV = 0;
  datum.xp = -4123456789, datum.yp = 2987654321, datum.zp = -1000;
  projection.systemId = 41, projection.projectionType = 7, projection.rectificationFlag = true;
  projection.laPC = -3092727272, projection.loPC = -10106565656;
  projection.azIL = 4848181818, projection.diffARSG = -1212345, projection.addSIL = 660000000;
  projection.epc = 500000000, projection.npc = -10000000;
  return set;
}

}  // namespace velta_test
