// Which messages of a set are taken, in which order, and what their fields become.

#include <functional>

#include "support/rtcm_test.h"

namespace velta_test {
namespace {

using MessageSetTest = RtcmTest;
using MessageTest = RtcmTest;

TEST_F(MessageSetTest, IsCheckedAndTakenInOrder) {
  EXPECT_EQ(support_.GetUtilizedMessageInfo(m1021_).systemId, 23);
  Rtcm1021 bad;
  Rtcm1021 nameless = m1021_;
  bad.computationIndicator = 4;
  nameless.utilizedMsgIndicator = 0;
  nameless.targetName.clear();
  const Rtcm1025 unsupported;
  const Rtcm1026 ignored;
  using All = MsgUtilized;
  // The result, the datum and projection files of the DHDN and of the other datum that are there
  // then, and what is other than in a set of a 1021, its 1023 and its 1025.
  const std::tuple<ResultCode, const char*, std::function<void(All&)>> cases[] = {
      {kNoDatumMessage, "", [](All& m) { m.msg1021 = nullptr; }},
      {kMissing1023, "",
       [&](All& m) {
         m.msg1021 = &nameless;
         m.msg1023 = nullptr;
       }},
      {kNoDatumName, "", [&](All& m) { m.msg1021 = &nameless; }},
      {kSuccess, "datum", [](All& m) { m.info.use1025 = false; }},
      {kMissingProjectionPart, "datum", [](All& m) { m.msg1025 = nullptr; }},
      {kMissingProjectionPart, "datum",
       [](All& m) {
         m.info.use1024 = true;
         m.msg1024 = nullptr;
       }},
      {kSuccess, "datum",
       [](All& m) {
         m.info = {true, true};
         m.msg1024 = nullptr;
       }},
      {kMissingProjectionPart, "datum",
       [](All& m) {
         m.info.use1027 = true;
         m.msg1027 = nullptr;
       }},
      {kSuccess, "datum, projection",
       [&](All& m) {
         m.info.use1026 = true;
         m.msg1026 = &ignored;
       }},
      {kBadComputationIndicator, "", [&](All& m) { m.msg1021 = &bad; }},
      {kSuccess, "other datum, other projection",
       [&](All& m) {
         m.msg1021 = &bad;
         m.msg1022 = &m1022_;
       }},
      {kUnsupportedProjection, "datum", [&](All& m) { m.msg1025 = &unsupported; }},
      {kSuccess, "datum, projection",
       [&](All& m) {
         m.msg1025 = &unsupported;
         m.info.use1027 = true;
       }},
  };
  for (const auto& [result, expected, change] : cases) {
    MsgUtilized set = Set(k1021 | k1023 | k1025);
    change(set);
    EXPECT_EQ(support_.ParseRTCMMEssages(set), result);
    std::string files;
    const auto add = [&files](const char* what, const std::filesystem::path& file) {
      if (!std::filesystem::exists(file)) return;
      files += files.empty() ? "" : ", ";
      files += what;
    };
    add("datum", DatumFile(kDhdn));
    add("projection", ProjectionFile(kDhdn));
    add("other datum", DatumFile(kLocal));
    add("other projection", ProjectionFile(kLocal));
    EXPECT_EQ(files, expected) << result;
    std::filesystem::remove_all(directory_ / "new");
  }
}

TEST_F(MessageTest, FirstOfEachKindMakesAFileWithItsEntry) {
  m1023_.vertShiftIndicator = false;
  m1023_.meanDPhi = -124;
  m1027_.diffARSG = -1212342;
  m1023_.horInterpolationMethod = 0x1FE;
  m1023_.vertInterpolationMethod = 3;
  // The 1021 has no rotation point and keeps that of the 1022.
  EXPECT_EQ(Ingest(kLocalSet), kSuccess);
  EXPECT_EQ(Ingest(kDhdnSet), kSuccess);
  const Json files = Json::parse(ReadBytes(FIRST_ENTRIES));
  for (const auto& [file, content] : files.items()) {
    EXPECT_EQ(ReadGff(directory_ / "new" / file), content) << file;
  }
}

TEST_F(MessageTest, NamesAreCleanedAndKeptWhole) {
  using Text = const wchar_t*;
  const std::tuple<const char*, Text, const char*, Text, unsigned, Text> cases[] = {
      {"A  B", L"A_B", "xWGS84 ETRS89", L"WGS84", 0, L""},
      {"./.", L"_", "ITRF97/ETRS89", L"ETRS89", 1, L"Africa"},
      {"AABBCC11", L"ABC1", "in ITRF2014", L"ITRF", 9, L"North America"},
      {"x_.-y", L"x_y", "wgs84", L"wgs84", 13, L"Juan de Fuca"},
      {"Z", L"Z", "", L"", 16, L"Scotia"},
      {"Q", L"Q", "\xC9", L"\u00C9", 17, L""},
  };
  m1021_.phiV = m1021_.lambdaV = m1023_.phi0 = m1023_.lambda0 = INT32_MIN;
  const char* const entry = "S_-2147483648_-2147483648_T_-2147483648_-2147483648";
  for (const auto& [target, cleanTarget, source, cleanSource, plate, region] : cases) {
    m1021_.targetName = target;
    m1021_.sourceName = source;
    m1021_.plateNumber = plate;
    EXPECT_EQ(Ingest(k1021 | k1023), kSuccess) << target;
    EXPECT_EQ(support_.GetTargetDatumName(), cleanTarget);
    EXPECT_EQ(support_.GetSourceDatumName(), cleanSource);
    EXPECT_EQ(support_.GetRegionName(), region);
    EXPECT_TRUE(ReadGff(datumPath_ + cleanTarget + L".dff").back().contains(entry));
  }
  m1021_.targetName.clear();
  EXPECT_EQ(Ingest(k1021 | k1023), kNoDatumName);
  EXPECT_EQ(ReadGff(DatumFile("")).back()["rtcm_datumName"][kContent], "");
}

TEST_F(MessageTest, WithoutAGridADatumKeepsTheObjectsAndAProjectionHasNone) {
  m1021_.utilizedMsgIndicator = 0xFE;
  EXPECT_EQ(Ingest(k1021), kSuccess);
  EXPECT_EQ(Ingest(kDhdnSet), kSuccess);
  m1021_.phiV = -5;
  m1025_.systemId = 99;
  EXPECT_EQ(Ingest(k1021 | k1025), kSuccess);
  Json datum = ReadGff(DatumFile())[kDhdn];
  Json projection = ReadGff(ProjectionFile())[kDhdn];
  const Json none = {0.0, 0.0, 0.0};
  EXPECT_EQ(datum["S_91984_18653"]["TargetDatum"]["dMeanValue"][kContent], none);
  EXPECT_EQ(datum["S_-5_18653"]["TargetDatum"],
            datum["S_91984_18653_T_374415_64815"]["TargetDatum"]);
  EXPECT_EQ(projection["S_0_818181818"]["TableProj"]["dMeanValue"][kContent], none);
  EXPECT_EQ(projection["system_identification_number"][kContent], Json({23}));
}

TEST_F(MessageTest, RefusedDatumWritesNothing) {
  for (const unsigned indicator : {0U, 2U, 4U}) {
    m1022_.computationIndicator = m1021_.computationIndicator = indicator;
    EXPECT_EQ(Ingest(kLocalSet), kBadComputationIndicator);
  }
  EXPECT_EQ(Ingest(k1021), kMissing1023);
  EXPECT_EQ(support_.GetTargetDatumName(), L"");
  EXPECT_EQ(support_.GetRegionName(), L"");
  EXPECT_EQ(Ingest(kDhdnSet), kBadComputationIndicator);
  EXPECT_EQ(support_.GetTargetDatumName(), L"AUTO_DHDN_BESEL");
  EXPECT_EQ(support_.GetRegionName(), L"Europe");
  EXPECT_FALSE(std::filesystem::exists(datums_));
}

TEST_F(MessageTest, ParametersFollowTheProjectionType) {
  m1025_.fe = 0xFFFFFFFFFFFFFFFF;
  m1025_.fn = -5;
  m1025_.laNO = -7;
  const Json tests = Json::parse(ReadBytes(PROJECTION_TYPES));
  std::string name = "a";
  for (const Json& test : tests) {
    m1021_.targetName = m1022_.targetName = name;
    m1025_.projectionType = m1027_.projectionType = test["projectionType"];
    m1027_.rectificationFlag = test.value("rectificationFlag", false);
    ASSERT_EQ(Ingest(test["message"] == 1025 ? kDhdnSet : kLocalSet), kSuccess);
    const Json standard = ReadGff(ProjectionFile(name)).back().back()["StandardPrj"];
    EXPECT_EQ(standard["PrjType"][kContent], test["PrjType"]);
    EXPECT_EQ(standard["PrjStandardParameters"][kContent], test["PrjStandardParameters"]) << test;
    ++name[0];
  }
}

TEST_F(MessageTest, UnsupportedProjectionIsRefusedAndNothingWritten) {
  EXPECT_EQ(support_.ParseProjectionMessages(m1025_, nullptr), kNoDatumName);
  EXPECT_EQ(support_.ParseProjectionMessages(m1027_, nullptr), kNoDatumName);
  EXPECT_EQ(support_.ParseProjectionMessages(Rtcm1026(), nullptr), kUnsupportedProjection);
  CustomProjectionData summary;
  for (const std::uint32_t type : {0U, 5U, 3U, 4U, 11U, 99U, 101U, 0xFFFFFFFFU}) {
    m1025_.projectionType = type;
    EXPECT_EQ(Ingest(kDhdnSet), kUnsupportedProjection) << type;
    EXPECT_TRUE(support_.GetCustomProjectionData(summary));
    EXPECT_EQ(summary.projectionName, L"AUTO_DHDN_BESEL");
    EXPECT_EQ(summary.datumName, L"AUTO_DHDN_BESEL");
    EXPECT_EQ(summary.projectionType, type == 0 ? L"" : L"LC");
  }
  EXPECT_FALSE(std::filesystem::exists(projections_));
}

}  // namespace
}  // namespace velta_test
