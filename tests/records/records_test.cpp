// Numbers between message units and physical units, and descriptions compared.

#include <gtest/gtest.h>

#include <cmath>
#include <functional>
#include <limits>
#include <vector>

#include "ingest/datum_conversion.h"
#include "ingest/grid_conversion.h"
#include "ingest/projection_conversion.h"
#include "records/comparison.h"
#include "records/projection_types.h"
#include "records/truncation.h"
#include "store/residual_grid.h"
#include "support/message_samples.h"

namespace orx::cs::velta {
namespace {

using Doubles = std::vector<double>;

template <std::size_t count>
Doubles All(const double (&array)[count]) {
  return {array, array + count};
}

TEST(Truncation, GoesTowardZeroAndIsDefinedForEveryDouble) {
  constexpr auto kMin32 = std::numeric_limits<std::int32_t>::min();
  constexpr auto kMin64 = std::numeric_limits<std::int64_t>::min();
  const struct {
    double value;
    std::int32_t in32;
    std::int64_t in64;
  } cases[] = {{-2.9999999, -2, -2},
               {2147483647.9, 2147483647, 2147483647},
               {2147483648.0, kMin32, 2147483648},
               {-2147483648.9, kMin32, -2147483648},
               {-2147483649.0, kMin32, -2147483649},
               {0x1p63, kMin32, kMin64},
               {-std::numeric_limits<double>::infinity(), kMin32, kMin64},
               {std::nan(""), kMin32, kMin64}};
  for (const auto& c : cases) {
    EXPECT_EQ(ToInt32(c.value), c.in32) << c.value;
    EXPECT_EQ(ToUint32(c.value), static_cast<std::uint32_t>(c.in32)) << c.value;
    EXPECT_EQ(ToInt64(c.value), c.in64) << c.value;
    EXPECT_EQ(ToUint64(c.value), static_cast<std::uint64_t>(c.in64)) << c.value;
    EXPECT_EQ(ToLow32(c.value), static_cast<std::uint32_t>(c.in64)) << c.value;
  }
  EXPECT_EQ(ToUint64(0x1.8p63), 0xC000000000000000U);
  EXPECT_EQ(ToUint64(0x1p64), 0x8000000000000000U);
}

TEST(EllipsoidalGrid, IsScaledToTheLastBitAndTheNextReplacesIt) {
  TableData table;
  table.reserved1 = 7;
  ConvertEllipsoidalGrid(velta_test::Dhdn().grid, table);
  EXPECT_EQ(table.centerN, 0.9076075720631346);
  EXPECT_EQ(table.centerE, 0.1571159937055729);
  EXPECT_EQ(All(table.bounds),
            (Doubles{0.9074984889848849, 0.0002181661564992912, 0.15700691062732322,
                     0.0002181661564992912, 7.27220521664304e-05, 7.27220521664304e-05}));
  EXPECT_TRUE(table.hasTable && table.horShift && table.vertShift);
  Rtcm1023 next;
  next.phi0 = -2, next.dLambda = 0x60000000;  // three of them do not fit in 32 bits
  ConvertEllipsoidalGrid(next, table);
  constexpr double kHalf = 2.42406840554768e-06;
  EXPECT_EQ(All(table.bounds), (Doubles{-2 * kHalf, 0.0, -536870912.0 * 0.5 * kHalf,
                                        536870912.0 * kHalf, 0.0, 1610612736.0 * kHalf}));
  EXPECT_TRUE(table.hasTable && !table.horShift && !table.vertShift);
  EXPECT_EQ(All(table.dNdLatData), Doubles(16));
  EXPECT_EQ(table.reserved1, 7U);
}

TEST(ValidityArea, LiesAroundItsCentreOrBeginsThere) {
  Rtcm1021 message;
  message.phiV = 10, message.lambdaV = -4, message.dPhiV = 5;
  DatumData datum;
  ConvertValidityArea(message, datum);
  constexpr double kTwo = 9.69627362219072e-06;
  EXPECT_EQ(All(datum.validityArea), (Doubles{7.5 * kTwo, 5 * kTwo, -4 * kTwo, 6.283185307179586}));
  EXPECT_EQ(All(datum.validityCentre), (Doubles{10 * kTwo, -4 * kTwo}));
}

TEST(PlaneGrid, IsScaledInWholeMetresOf32Bits) {
  Rtcm1024 message;
  message.north0 = -5, message.east0 = 7, message.dN = 2, message.dE = 3;
  TableData table;
  ConvertPlaneGrid(table, message);
  EXPECT_EQ(table.centerN, -50.0);
  EXPECT_EQ(table.centerE, 70.0);
  EXPECT_EQ(All(table.bounds), (Doubles{-80.0, 60.0, 25.0, 90.0, 20.0, 30.0}));
  message.north0 = -500000000, message.east0 = 4000000000U;
  ConvertPlaneGrid(table, message);
  EXPECT_EQ(table.centerN, -705032704.0);
  EXPECT_EQ(table.centerE, 1345294336.0);
}

TEST(ResidualGrid, CheckedValueThatIsNotTakenFailsTheEntry) {
  const TGenericRegistryKey none{TGenericRegistryKeyImpPtr()};
  EXPECT_EQ(WriteResidualGrid(none, layout::kDatumGrid, TableData()), kEntryNotWritten);
}

void MakeDatum(DatumData& datum) {
  datum.targetDatumName = L"Local", datum.sourceDatumName = L"ETRS89";
  datum.computationIndicator = 2, datum.parameters[3] = 1.1;
}
void MakeProjection(ProjectionData& projection) {
  projection.rtcmProjName = L"Local";
  projection.geoProj = CreateProjection(projection, ProjectionData::TM, 6377397.155, 6356078.963);
}

/// Compares a description with what each change makes of it.
template <class Description>
void Compare(void (*make)(Description&), bool (*isSame)(const Description&, const Description&),
             bool expected, const std::vector<std::function<void(Description&)>>& changes) {
  for (std::size_t i = 0; i < changes.size(); ++i) {
    Description description, changed;
    make(description), make(changed);
    changes[i](changed);
    EXPECT_EQ(isSame(description, changed), expected) << "change " << i;
    EXPECT_EQ(isSame(changed, description), expected) << "change " << i;
  }
}

TEST(Comparison, AllowsForTheTolerancesAndForCase) {
  Compare<DatumData>(
      &MakeDatum, &IsSameDatum, true,
      {[](auto& d) { d.parameters[3] += 5e-8; }, [](auto& d) { d.parameters[2] += 9e-6; },
       [](auto& d) { d.targetDatumName = L"LOCAL"; },
       [](auto& d) { d.sourceDatumName = L"etrs89"; },
       [](auto& d) { d.validityArea[0] = d.heightIndicator = 3; }});
  Compare<DatumData>(
      &MakeDatum, &IsSameDatum, false,
      {[](auto& d) { d.parameters[5] += 2e-7; }, [](auto& d) { d.parameters[0] -= 2e-5; },
       [](auto& d) { d.parameters[12] += 2e-5; }, [](auto& d) { d.targetDatumName = L"Loca"; },
       [](auto& d) { d.sourceDatumName += L" "; }, [](auto& d) { d.computationIndicator = 1; },
       [](auto& d) { d.sourceEllipsoid.second += 1e-9; },
       [](auto& d) { d.targetEllipsoid.a = std::nan(""); }});
  Compare<ProjectionData>(
      &MakeProjection, &ProjectionEquals, true,
      {[](auto& p) { p.geoProj->SetParam(1e-7, 2, 3); }, [](auto& p) { p.prjType = L"tmerc"; }});
  Compare<ProjectionData>(
      &MakeProjection, &ProjectionEquals, false,
      {[](auto& p) { p.geoProj->SetParam(1.01e-7, 4, 3); }, [](auto& p) { p.prjType = L"OM"; },
       [](auto& p) { p.rtcmProjName = L"LOCAL"; }, [](auto& p) { p.geoProj->parameterCount = 4; },
       [](auto& p) { p.geoProj->semiMajorAxis += 1e-3; },
       [](auto& p) { p.geoProj->ellipsoidSecond = std::nan(""); },
       [](auto& p) { p.geoProj.reset(); }});
  const ProjectionData none;
  EXPECT_FALSE(ProjectionEquals(none, none));
}

TEST(Assignment, KeepsWhatIsTheTargetsOwn) {
  DatumData source, datum;
  MakeDatum(source);
  source.ellipsoidName = L"Bessel", datum.ellipsoidName = L"mine";
  datum = source;
  EXPECT_TRUE(IsSameDatum(datum, source));
  EXPECT_EQ(datum.ellipsoidName + DatumData(source).ellipsoidName, L"mineBessel");
  ProjectionData projection;
  projection = ProjectionData();
  EXPECT_TRUE(projection.geoProj);
}

}  // namespace
}  // namespace orx::cs::velta
