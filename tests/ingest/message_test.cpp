// What the fields of the messages become.

#include <limits>

#include "support/rtcm_test.h"

namespace velta_test {
namespace {

class MessageTest : public RtcmTest {
 protected:
  GffKey Standard(const std::string& name) {
    return ReadGff(DatumFile(name)).Entry()[L"StandardDatum"];
  }
  /// Type string and parameters of the last entry of a projection file.
  std::string Projection(const std::string& name) {
    GffKey standard = ReadGff(ProjectionFile(name)).Container().keys.back()[L"StandardPrj"];
    GffValue& parameters = standard.Value(L"PrjStandardParameters");
    EXPECT_EQ(parameters.bytes.substr(64), std::string(64, '\0'));
    parameters.bytes.resize(64);
    return standard.Value(L"PrjType").Content() + parameters.Content();
  }

  HelmertSet dhdn_ = Dhdn();
};

TEST_F(MessageTest, NamesAreCleanedAndKeptWhole) {
  const struct {
    const char* target;
    const wchar_t* cleanTarget;
    const char* source;
    const wchar_t* cleanSource;
    std::uint32_t plate;
    const wchar_t* region;
  } cases[] = {
      {"A  B", L"A_B", "xWGS84 ETRS89", L"WGS84", 0, L""},
      {"./.", L"_", "ITRF97/ETRS89", L"ETRS89", 1, L"Africa"},
      {"AABBCC11", L"ABC1", "in ITRF2014", L"ITRF", 9, L"North America"},
      {"x_.-y", L"x_y", "wgs84", L"wgs84", 13, L"Juan de Fuca"},
      {"Z", L"Z", "", L"", 16, L"Scotia"},
      {"Q", L"Q", "\xC9", L"\u00C9", 17, L""},
  };
  constexpr auto kLowest = std::numeric_limits<std::int32_t>::min();
  auto& [datum, grid, plane, projection] = dhdn_;
  datum.phiV = datum.lambdaV = grid.phi0 = grid.lambda0 = kLowest;
  for (const auto& c : cases) {
    datum.targetName = c.target, datum.sourceName = c.source;
    datum.sourceNameCounter = 99, datum.plateNumber = c.plate;
    EXPECT_EQ(Ingest(dhdn_, kGrid), kSuccess) << c.target;
    EXPECT_EQ(support_.GetTargetDatumName(), c.cleanTarget);
    EXPECT_EQ(support_.GetSourceDatumName(), c.cleanSource);
    EXPECT_EQ(support_.GetRegionName(), c.region);
    EXPECT_EQ(ReadGff(datumPath_ + c.cleanTarget + L".dff").Entry().name,
              L"S_-2147483648_-2147483648_T_-2147483648_-2147483648");
  }
  datum.targetName.clear();
  EXPECT_EQ(Ingest(dhdn_, kGrid), kNoDatumName);
  EXPECT_EQ(ReadGff(DatumFile("")).Container().Value(L"rtcm_datumName").Content(), " ");
}

TEST_F(MessageTest, WithoutAGridADatumKeepsTheObjectsAndAProjectionHasNone) {
  dhdn_.datum.utilizedMsgIndicator = 0xFE;
  ASSERT_EQ(Ingest(dhdn_, kDatum), kSuccess);
  ASSERT_EQ(Ingest(dhdn_, kAllParts), kSuccess);
  dhdn_.datum.phiV = -5, dhdn_.projection.systemId = 99;
  ASSERT_EQ(Ingest(dhdn_, kProjection), kSuccess);
  GffKey root = ReadGff(DatumFile());
  EXPECT_EQ(root.Entry(0).name, L"S_91984_18653");
  EXPECT_EQ(root.Entry(0)[L"TargetDatum"].Value(L"NRowsT").Content(), " 4");
  EXPECT_EQ(root.Entry(0)[L"TargetDatum"].Value(L"dMeanValue").Content(), " 0 0 0");
  EXPECT_EQ(root.Entry(2).name, L"S_-5_18653");
  EXPECT_EQ(root.Entry(2)[L"TargetDatum"], root.Entry(1)[L"TargetDatum"]);
  root = ReadGff(ProjectionFile());
  EXPECT_EQ(root.Entry(1).name, L"S_0_818181818");
  EXPECT_EQ(root.Entry(1)[L"TableProj"].Value(L"dMeanValue").Content(), " 0 0 0");
  EXPECT_EQ(root.Container().Value(L"system_identification_number").Content(), " 23");
}

TEST_F(MessageTest, BadekasAddsARotationPointThatTheNextHelmertKeeps) {
  ASSERT_EQ(Ingest(Badekas(), kGrid), kSuccess);
  GffKey standard = Standard(kBadekas);
  EXPECT_EQ(standard.Value(L"StandardMethod").Content(), " 3");
  EXPECT_EQ(standard.Value(L"HtIndicator").Content(), " 3");
  EXPECT_EQ(standard.Value(L"RTCMRefDatumName").Content(), " WGS84");
  // No extent is the whole globe, centred on the message's position.
  EXPECT_EQ(standard.Value(L"BoundariesStandardDatum").Content(),
            " -2.1645379457761234 3.141592653589793 -5.0819236644000005 6.283185307179586");
  ASSERT_EQ(Ingest(dhdn_, kGrid), kSuccess);
  for (const char* const name : {kBadekas, kDhdn}) {
    const std::string parameters = Standard(name).Value(L"DatumStandardParameters").Content();
    EXPECT_TRUE(parameters.ends_with(" -4123456.789 2987654.321 -1 0 0 0")) << parameters;
  }
}

TEST_F(MessageTest, RefusedDatumWritesNothing) {
  BadekasSet badekas = Badekas();
  for (const std::uint32_t indicator : {0U, 2U, 4U}) {
    badekas.datum.computationIndicator = indicator;
    EXPECT_EQ(Ingest(badekas, kGrid), kBadComputationIndicator);
  }
  EXPECT_EQ(Ingest(dhdn_, kDatum), kMissing1023);
  EXPECT_EQ(support_.GetTargetDatumName() + support_.GetRegionName(), L"");
  dhdn_.datum.computationIndicator = 4;
  EXPECT_EQ(Ingest(dhdn_, kGrid), kBadComputationIndicator);
  EXPECT_EQ(support_.GetTargetDatumName() + support_.GetRegionName(), L"AUTO_DHDN_BESELEurope");
  EXPECT_FALSE(std::filesystem::exists(datums_));
  dhdn_.datum.computationIndicator = 3;
  EXPECT_EQ(Ingest(dhdn_, kGrid), kSuccess);
}

TEST_F(MessageTest, ParametersFollowTheProjectionType) {
  const std::string five = " 8.999999998 1 -7.699999999999999e-08 18446744073709552 -0.005 0 0 0";
  const std::string four = " 8.999999998 -7.699999999999999e-08 18446744073709552 -0.005 0 0 0 0";
  const std::pair<std::uint32_t, std::string> types[] = {
      {1, " TMERC" + five}, {2, " TMERC" + five},    {6, " CASSINI" + four}, {7, " OM" + five},
      {8, " STER" + five},  {9, " MERCATOR" + four}, {10, " STER" + five},   {100, " ROM" + five}};
  auto& [datum, grid, plane, projection] = dhdn_;
  projection.fe = 0xFFFFFFFFFFFFFFFF, projection.fn = -5, projection.laNO = -7;
  for (const auto& [type, expected] : types) {
    projection.projectionType = type;
    datum.targetName = static_cast<char>('a' + type % 26);
    ASSERT_EQ(Ingest(dhdn_, kGrid | kProjection), kSuccess);
    EXPECT_EQ(Projection(datum.targetName), expected);
  }
  BadekasSet oblique = Badekas();
  const std::string six =
      " 53.329999998 0.9995999999999999 -111.172222216 -34.019999991999995 5e+05 -10000";
  ASSERT_EQ(Ingest(oblique, kGrid | kProjection), kSuccess);
  EXPECT_EQ(Projection(kBadekas), " ROM" + six + " 53.316664202999995 0");
  oblique.projection.rectificationFlag = false;
  ASSERT_EQ(Ingest(oblique, kAllParts), kSuccess);
  EXPECT_EQ(Projection(kBadekas), " OM" + six + " 0 0");
  EXPECT_EQ(ReadGff(ProjectionFile(kBadekas)).Entry(1).name,
            L"S_-3092727272_-10106565656_T_540000_340000");
}

TEST_F(MessageTest, UnsupportedProjectionIsRefusedAndNothingWritten) {
  EXPECT_EQ(support_.ParseProjectionMessages(dhdn_.projection, nullptr), kNoDatumName);
  EXPECT_EQ(support_.ParseProjectionMessages(Badekas().projection, nullptr), kNoDatumName);
  for (const std::uint32_t type : {0U, 3U, 4U, 5U, 11U, 99U, 101U, 0xFFFFFFFFU}) {
    dhdn_.projection.projectionType = type;
    EXPECT_EQ(Ingest(dhdn_, kAllParts), kUnsupportedProjection) << type;
    CustomProjectionData summary;
    EXPECT_TRUE(support_.GetCustomProjectionData(summary));
    EXPECT_EQ(summary.projectionType, type == 0 ? L"" : L"LC");
  }
  EXPECT_EQ(support_.ParseProjectionMessages(Rtcm1026(), nullptr), kUnsupportedProjection);
  EXPECT_FALSE(std::filesystem::exists(projections_));
}

}  // namespace
}  // namespace velta_test
