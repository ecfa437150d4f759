#pragma once

#include <cstdint>
#include <string>

#include "velta/rtcm_messages.h"

namespace velta_test {

/// A datum message and its residual grid, another pair for each number: one datum, and the cells of
/// its grid in rows, as a network service sends them to rovers on the road. Every cell has an area
/// of validity of its own. There is room between the cells, so that positions in none exist.
struct NumberedSet {
  explicit NumberedSet(std::uint32_t number, const std::string& datumName = "ROVERS") {
    constexpr std::int32_t kCellsInARow = 1000;
    constexpr std::int32_t kHalvesInTwo = 4;
    // Half arc-seconds.
    constexpr std::int32_t kCell = 90;
    constexpr std::int32_t kSouth = 300'000;
    constexpr std::int32_t kWest = 36'000;
    const auto cell = static_cast<std::int32_t>(number);
    grid.phi0 = kSouth + cell / kCellsInARow * kCell;
    grid.lambda0 = kWest + cell % kCellsInARow * kCell;
    grid.dPhi = grid.dLambda = 29;
    grid.horShiftIndicator = true;
    for (int i = 0; i < orx::cs::velta::kResidualGridPoints; ++i) {
      grid.residualPhi[i] = i * 3 - cell % 7;
      grid.residualLambda[i] = i * 5 - cell % 11;
      grid.residualH[i] = i - cell % 13;
    }
    datum.messageType = 21;
    datum.utilizedMsgIndicator = 1;
    datum.computationIndicator = 1;
    datum.sourceName = "ETRF89_ETRF89";
    datum.targetName = datumName;
    datum.phiV = grid.phi0 / kHalvesInTwo;
    datum.lambdaV = grid.lambda0 / kHalvesInTwo;
    datum.dPhiV = datum.dLambdaV = 22;
    datum.dX = -584957;
    datum.addAs = datum.addAt = 8137000;
    datum.addBs = datum.addBt = 6752314;
  }

  /// Name of the entry that the set becomes.
  std::wstring EntryName() const {
    return L"S_" + std::to_wstring(datum.phiV) + L"_" + std::to_wstring(datum.lambdaV) + L"_T_" +
           std::to_wstring(grid.phi0) + L"_" + std::to_wstring(grid.lambda0);
  }

  orx::cs::velta::Rtcm1021 datum;
  orx::cs::velta::Rtcm1023 grid;
};

}  // namespace velta_test
