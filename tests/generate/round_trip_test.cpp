// What was ingested comes back: codes as they were, every other number whole or one unit nearer to
// zero.

#include <array>
#include <random>

#include "support/message_fields.h"
#include "support/rtcm_test.h"

namespace velta_test {
namespace {

constexpr int kCodeBits = 4;  // a field of no more bits is a code

class RoundTripTest : public RtcmTest {
 protected:
  void Randomise(RtcmMessage& message) {
    VisitFields(message, [this](auto& field, int bits) {
      if (bits == 0) return;
      using Field = std::remove_reference_t<decltype(field)>;
      const std::uint64_t raw = random_() >> (64 - bits);
      const std::uint64_t sign = std::uint64_t{1} << (bits - 1);
      field = static_cast<Field>(std::is_signed_v<Field> ? raw - sign : raw);
    });
  }

  static void ExpectSameOrTruncated(RtcmMessage& in, RtcmMessage& out) {
    std::vector<std::int64_t> fields;
    VisitFields(in, [&](auto& field, int) { fields.push_back(std::int64_t(field)); });
    std::size_t place = 0;
    VisitFields(out, [&](auto& field, int bits) {
      const std::int64_t before = fields.at(place++);
      const std::int64_t after = std::int64_t(field);
      const std::int64_t nearer = before - (before > 0) + (before < 0);
      EXPECT_TRUE(after == before || (bits > kCodeBits && after == nearer))
          << "field " << place << " of 10" << in.messageType << ": " << before << " " << after;
    });
    EXPECT_EQ(place, fields.size());
  }

  /// Ingests a set into new files and builds it again from them.
  template <class Set>
  Set ThereAndBack(Set in) {
    std::filesystem::remove_all(directory_ / "new");
    EXPECT_EQ(Ingest(in, kAllParts), kSuccess);
    const RTCMGenerator generator = Generator(in.datum.targetName);
    Set out;
    const auto datum = generator.getRtcmDatumMessage(in.datum.phiV * kTwoSeconds,
                                                     in.datum.lambdaV * kTwoSeconds, 0);
    if constexpr (std::is_same_v<Set, BadekasSet>) {
      out.datum = dynamic_cast<Rtcm1022&>(*datum);
    } else {
      static_cast<RtcmBasicTransformMessage&>(out.datum) = *datum;
    }
    out.grid = *generator.get1023(in.grid.phi0 * kHalfSecond, in.grid.lambda0 * kHalfSecond, 0);
    out.planeGrid = *generator.get1024(in.planeGrid.north0 * 10.0, in.planeGrid.east0 * 10.0, 0);
    out.projection = dynamic_cast<decltype(out.projection)&>(*generator.getRtcmProjMessage());
    EXPECT_EQ(in.datum.computationIndicator, out.datum.computationIndicator);
    ExpectSameOrTruncated(in.datum, out.datum);
    ExpectSameOrTruncated(in.grid, out.grid);
    ExpectSameOrTruncated(in.planeGrid, out.planeGrid);
    ExpectSameOrTruncated(in.projection, out.projection);
    return out;
  }

  template <class Set>
  void TakeTours(Set set) {
    set.datum.targetName = "Tour";
    for (RtcmMessage* const message :
         std::initializer_list<RtcmMessage*>{&set.datum, &set.grid, &set.planeGrid}) {
      Randomise(*message);
    }
    Randomise(set.projection);
    if constexpr (std::is_same_v<Set, HelmertSet>) {
      set.datum.computationIndicator = static_cast<std::uint32_t>(random_() % 3);
      set.projection.projectionType = std::array{1U, 6U, 8U, 9U}[random_() % 4];
      if (set.projection.projectionType % 3 == 0) set.projection.addSNO = 0;
    } else {
      set.projection.diffARSG *= set.projection.rectificationFlag;
    }
    ThereAndBack(ThereAndBack(ThereAndBack(set)));
  }

  std::mt19937_64 random_{2024};
};

TEST_F(RoundTripTest, EveryFieldReturnsFromItsFile) {
  for (int tour = 0; tour < 50 && !HasFailure(); ++tour) {
    TakeTours(Dhdn());
    TakeTours(Badekas());
  }
}

}  // namespace
}  // namespace velta_test
