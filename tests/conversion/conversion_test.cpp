// Numbers between message units and physical units, where the files do not show them.

#include <gtest/gtest.h>

#include <vector>

#include "conversion/datum_conversion.h"
#include "conversion/grid_conversion.h"
#include "store/residual_grid.h"

namespace orx::cs::velta {
namespace {

using Doubles = std::vector<double>;

template <std::size_t count>
Doubles All(const double (&array)[count]) {
  return {array, array + count};
}

TEST(EllipsoidalGrid, IsScaledToTheLastBitAndTheNextReplacesIt) {
  constexpr double kHalf = 2.42406840554768e-06;
  Rtcm1023 message;
  message.horShiftIndicator = true;
  message.phi0 = 374415;
  message.lambda0 = 64815;
  message.dPhi = message.dLambda = 30;
  TableData table;
  ConvertEllipsoidalGrid(message, table);
  EXPECT_EQ(All(table.bounds),
            (Doubles{0.9074984889848849, 0.0002181661564992912, 0.15700691062732322,
                     0.0002181661564992912, 7.27220521664304e-05, 7.27220521664304e-05}));
  message = Rtcm1023();
  // three of them do not fit in 32 bits
  message.phi0 = -2;
  message.dLambda = 0x60000000;
  ConvertEllipsoidalGrid(message, table);
  EXPECT_EQ(All(table.bounds), (Doubles{-2 * kHalf, 0.0, -536870912.0 * 0.5 * kHalf,
                                        536870912.0 * kHalf, 0.0, 1610612736.0 * kHalf}));
  EXPECT_TRUE(table.hasTable);
  EXPECT_FALSE(table.horShift);
}

TEST(PlaneGrid, IsScaledInWholeMetresOf32Bits) {
  Rtcm1024 message;
  message.north0 = -500000000;
  message.east0 = 4000000000U;
  message.dN = 2;
  message.dE = 3;
  TableData table;
  ConvertPlaneGrid(table, message);
  EXPECT_EQ(All(table.bounds), (Doubles{-705032734.0, 60.0, 1345294291.0, 90.0, 20.0, 30.0}));
}

TEST(ValidityArea, LiesAroundItsCentreOrBeginsThere) {
  constexpr double kTwo = 9.69627362219072e-06;
  Rtcm1021 message;
  message.phiV = 10;
  message.lambdaV = -4;
  message.dPhiV = 5;
  DatumData datum;
  ConvertValidityArea(message, datum);
  EXPECT_EQ(All(datum.validityArea), (Doubles{7.5 * kTwo, 5 * kTwo, -4 * kTwo, 6.283185307179586}));
}

TEST(ResidualGrid, CheckedValueThatIsNotTakenFailsTheEntry) {
  const TGenericRegistryKey none{TGenericRegistryKeyImpPtr()};
  EXPECT_EQ(WriteResidualGrid(none, layout::kDatumGrid, TableData()), kEntryNotWritten);
}

}  // namespace
}  // namespace orx::cs::velta
