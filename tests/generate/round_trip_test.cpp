// What was ingested comes back, and what truncation takes on the way stays small however often a
// set travels.

#include <array>
#include <cstdlib>
#include <random>

#include "support/message_fields.h"
#include "support/rtcm_test.h"

namespace velta_test {
namespace {

using Numbers = std::vector<std::int64_t>;

class RoundTripTest : public RtcmTest {
 protected:
  template <class Visit>
  static void VisitSet(auto& set, const Visit& visit) {
    VisitFields(set.datum, visit), VisitFields(set.grid, visit);
    VisitFields(set.planeGrid, visit), VisitFields(set.projection, visit);
  }
  static Numbers NumbersOf(auto& set) {
    Numbers numbers;
    VisitSet(set, [&](auto, auto& field, int, int) { numbers.push_back(std::int64_t(field)); });
    return numbers;
  }

  /// Ingests a set into new files and builds it again from them.
  template <class Set>
  Set ThereAndBack(const Set& in) {
    constexpr bool kIsBadekas = std::is_same_v<Set, BadekasSet>;
    std::filesystem::remove_all(directory_ / "new");
    EXPECT_EQ(Ingest(in, kAllParts), kSuccess);
    const RTCMGenerator generator = Generator(kIsBadekas ? kBadekas : kDhdn);
    Set out;
    const auto datum = generator.getRtcmDatumMessage(in.datum.phiV * kTwoSeconds,
                                                     in.datum.lambdaV * kTwoSeconds, 0);
    if constexpr (kIsBadekas) {
      out.datum = dynamic_cast<Rtcm1022&>(*datum);
    } else {
      static_cast<RtcmBasicTransformMessage&>(out.datum) = *datum;
    }
    out.grid = *generator.get1023(in.grid.phi0 * kHalfSecond, in.grid.lambda0 * kHalfSecond, 0);
    out.planeGrid = *generator.get1024(in.planeGrid.north0 * 10.0, in.planeGrid.east0 * 10.0, 0);
    out.projection = dynamic_cast<decltype(out.projection)&>(*generator.getRtcmProjMessage());
    EXPECT_EQ(in.datum.computationIndicator, out.datum.computationIndicator);
    return out;
  }

  template <class Set>
  void TravelUntilNothingChanges(Set set) {
    VisitSet(set, [this](const char*, auto& field, int bits, int) {
      if (bits == 0) return;
      using Number = std::remove_reference_t<decltype(field)>;
      const std::uint64_t least = std::is_signed_v<Number> ? std::uint64_t{1} << (bits - 1) : 0;
      field = static_cast<Number>((random_() >> (64 - bits)) - least);
    });
    if constexpr (std::is_same_v<Set, HelmertSet>) {
      set.datum.computationIndicator = static_cast<std::uint32_t>(random_() % 3);
      set.projection.projectionType = std::array{1U, 6U, 8U, 9U}[random_() % 4];
      if (set.projection.projectionType % 3 == 0) set.projection.addSNO = 0;
    } else {
      set.projection.diffARSG *= set.projection.rectificationFlag;
    }
    const Numbers sent = NumbersOf(set);
    Numbers before, now = sent;
    for (int tour = 0; tour < 500 && now != before; ++tour) {
      set = ThereAndBack(set);
      before = std::exchange(now, NumbersOf(set));
    }
    EXPECT_EQ(now, before);
    std::size_t place = 0;
    VisitSet(set, [&](const char* name, auto&, int, int limit) {
      const std::int64_t first = sent.at(place), loss = std::abs(first - now.at(place++));
      EXPECT_LE(loss, limit) << name << " of " << first;
    });
  }

  std::mt19937_64 random_{2024};
};

TEST_F(RoundTripTest, TruncationStaysWithinItsLimitHoweverOftenASetTravels) {
  for (int set = 0; set < 5 && !HasFailure(); ++set) {
    TravelUntilNothingChanges(Dhdn());
    TravelUntilNothingChanges(Badekas());
  }
}

TEST_F(RoundTripTest, FilesKeepNeitherQualitiesNorPlateNorDayNorTheNamesAsTheyWere) {
  for (const auto& [sent, returned] : {std::pair{2U, 1U}, {10U, 8U}}) {
    HelmertSet set = Dhdn();
    auto& [datum, grid, plane, projection] = set;
    datum.horQualityIndicator = datum.vertQualityIndicator = 5;
    grid.horGridQualityIndicator = grid.vertGridQualityIndicator = plane.mjd = 3;
    datum.dPhiV = datum.dLambdaV = 0, projection.projectionType = sent;
    set = ThereAndBack(set);
    EXPECT_EQ(projection.projectionType, returned);
    EXPECT_EQ(datum.dPhiV + datum.dLambdaV + datum.plateNumber + datum.utilizedMsgIndicator, 0U);
    EXPECT_EQ(datum.horQualityIndicator + datum.vertQualityIndicator + grid.mjd + plane.mjd, 0U);
    EXPECT_EQ(grid.horGridQualityIndicator + grid.vertGridQualityIndicator, 0U);
    EXPECT_EQ(datum.sourceName + " " + datum.targetName, "ETRF89_ETRF89 AUTO_DHDN_BESEL");
  }
}

}  // namespace
}  // namespace velta_test
