// What truncation takes of a message set on its way through files stays small, however often the
// set travels.

#include <array>
#include <random>

#include "rtcm3/fields.h"
#include "support/rtcm_test.h"

namespace velta_test {
namespace {

namespace rtcm3 = orx::cs::velta::rtcm3;

/// The units that fields may lose in all. Fields that are not there are not kept, or set by the
/// test.
const Json kLimits = Json::parse(ReadBytes(ROUND_TRIP_LIMITS));

/// Visits the numbers that have a limit.
template <class Visit>
struct Kept {
  Visit visit;
  void Text(const char* /*name*/, auto& /*text*/, auto& /*counter*/) {}
  void Number(const char* name, unsigned width, auto& value) {
    if (kLimits.contains(name)) visit(name, width, value);
  }
  void BitSet(const char* /*name*/, unsigned /*width*/, auto& /*value*/) {}
  void Points(unsigned width, auto... columns) { rtcm3::VisitPoints(*this, width, columns...); }
};

using Numbers = std::vector<std::pair<std::string, std::int64_t>>;

class RoundTripTest : public RtcmTest {
 protected:
  template <class Datum, class Projection>
  void TravelUntilNothingChanges(Datum& datum, Projection& projection, int parts) {
    const auto visitSet = [&](auto visit) {
      Kept<decltype(visit)> kept{visit};
      rtcm3::VisitFields(kept, datum);
      rtcm3::VisitFields(kept, m1023_);
      rtcm3::VisitFields(kept, m1024_);
      rtcm3::VisitFields(kept, projection);
    };
    const auto numbersOfSet = [&] {
      Numbers numbers;
      visitSet([&](const char* name, unsigned, auto& value) { numbers.emplace_back(name, value); });
      return numbers;
    };
    visitSet([&]<class Value>(const char*, unsigned width, Value& value) {
      const auto range = rtcm3::FieldRange::Of<Value>(width);
      value = static_cast<Value>(std::uniform_int_distribution(range.min, range.max)(random_));
    });
    if constexpr (std::is_same_v<Projection, Rtcm1025>) {
      datum.computationIndicator = static_cast<std::uint32_t>(random_() % 3);
      projection.projectionType = std::array{1U, 6U, 8U, 9U}[random_() % 4];
      if (projection.projectionType % 3 == 0) projection.addSNO = 0;
    } else if (!projection.rectificationFlag) {
      projection.diffARSG = 0;
    }
    const Numbers sent = numbersOfSet();
    Numbers before;
    Numbers now = sent;
    for (int tour = 0; tour < 500 && now != before; ++tour) {
      Travel(datum, projection, parts);
      before = std::exchange(now, numbersOfSet());
    }
    EXPECT_EQ(now, before);
    for (std::size_t i = 0; i < sent.size(); ++i) {
      const auto& [name, first] = sent[i];
      EXPECT_LE(std::abs(first - now.at(i).second), kLimits[name].get<std::int64_t>())
          << name << " of " << first;
    }
  }

  /// Ingests a set into new files and builds it again from them.
  template <class Datum, class Projection>
  void Travel(Datum& datum, Projection& projection, int parts) {
    std::filesystem::remove_all(directory_ / "new");
    ASSERT_EQ(Ingest(parts), kSuccess);
    const RTCMGenerator generator = Generator(parts == kDhdnSet ? kDhdn : kLocal);
    constexpr double kTwoSeconds = 9.69627362219072e-06;  // radians
    const auto made =
        generator.getRtcmDatumMessage(datum.phiV * kTwoSeconds, datum.lambdaV * kTwoSeconds, 0);
    EXPECT_EQ(made->computationIndicator, datum.computationIndicator);
    if constexpr (std::is_same_v<Datum, Rtcm1022>) {
      datum = dynamic_cast<Rtcm1022&>(*made);
    } else {
      static_cast<RtcmBasicTransformMessage&>(datum) = *made;
    }
    m1023_ = *generator.get1023(m1023_.phi0 * kHalfSecond, m1023_.lambda0 * kHalfSecond, 0);
    m1024_ = *generator.get1024(m1024_.north0 * 10.0, m1024_.east0 * 10.0, 0);
    projection = dynamic_cast<Projection&>(*generator.getRtcmProjMessage());
  }

  std::mt19937_64 random_{2024};
};

TEST_F(RoundTripTest, TruncationStaysWithinItsLimitHoweverOftenASetTravels) {
  for (int set = 0; set < 5 && !HasFailure(); ++set) {
    TravelUntilNothingChanges(m1021_, m1025_, kDhdnSet);
    TravelUntilNothingChanges(m1022_, m1027_, kLocalSet);
  }
}

}  // namespace
}  // namespace velta_test
