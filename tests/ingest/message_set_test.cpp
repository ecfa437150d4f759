// Which messages of a set are taken, and in which order.

#include <functional>

#include "support/rtcm_test.h"

namespace velta_test {
namespace {

class MessageSetTest : public RtcmTest {};

TEST_F(MessageSetTest, IndicatorTellsWhatToWaitFor) {
  RtcmBasicTransformMessage message;
  for (message.systemId = 0xFFFFFFF0; message.systemId != 0x60; ++message.systemId) {
    const std::uint32_t indicator = message.utilizedMsgIndicator = message.systemId;
    const UtilizedMsgInfo& info = support_.GetUtilizedMessageInfo(message);
    const std::uint32_t flags = info.use1023 * 1U + info.use1024 * 2U + info.use1025 * 4U +
                                info.use1026 * 8U + info.use1027 * 16U;
    EXPECT_EQ(flags, indicator & 0x1F);
    EXPECT_EQ(info.systemId, static_cast<std::int32_t>(indicator));
  }
}

TEST_F(MessageSetTest, IsCheckedAndTakenInOrder) {
  const HelmertSet dhdn = Dhdn();
  const BadekasSet badekas = Badekas();
  Rtcm1021 bad = dhdn.datum, nameless = dhdn.datum;
  bad.computationIndicator = 4;
  nameless.targetName.clear();
  Rtcm1025 lambert = dhdn.projection;
  lambert.projectionType = 3;
  const Rtcm1026 ignored;
  using Set = MsgUtilized;
  const struct {
    ResultCode result;
    const char* files;  ///< datum and projection file of the DHDN and of the other datum
    std::function<void(Set&)> change;  ///< of a set of a 1021, its 1023 and its 1025
  } cases[] = {
      {kSuccess, "dp..", [](Set&) {}},
      {kNoDatumMessage, "....", [](Set& s) { s = Set(); }},
      {kNoDatumMessage, "....", [](Set& s) { s.msg1021 = nullptr; }},
      {kMissing1023, "....", [](Set& s) { s.msg1023 = nullptr; }},
      {kMissing1023, "....", [](Set& s) { s.info.use1023 = false; }},
      {kNoDatumName, "....", [&](Set& s) { s.msg1021 = &nameless; }},
      {kSuccess, "d...", [](Set& s) { s.info.use1025 = false; }},
      {kMissingProjectionPart, "d...", [](Set& s) { s.msg1025 = nullptr; }},
      {kMissingProjectionPart, "d...", [](Set& s) { s.info.use1024 = true; }},
      {kSuccess, "d...", [](Set& s) { s.info.use1024 = true, s.info.use1025 = false; }},
      {kMissingProjectionPart, "dp..", [](Set& s) { s.info.use1027 = true; }},
      {kSuccess, "dp..", [&](Set& s) { s.msg1026 = &ignored, s.info.use1026 = true; }},
      {kBadComputationIndicator, "....", [&](Set& s) { s.msg1021 = &bad; }},
      {kSuccess, "..dp", [&](Set& s) { s.msg1021 = &bad, s.msg1022 = &badekas.datum; }},
      {kUnsupportedProjection, "d...", [&](Set& s) { s.msg1025 = &lambert; }},
      {kSuccess, "dp..",
       [&](Set& s) {
         s.msg1025 = &lambert, s.msg1027 = &badekas.projection, s.info.use1027 = true;
       }},
  };
  for (const auto& c : cases) {
    MsgUtilized set;
    set.msg1021 = &dhdn.datum, set.msg1023 = &dhdn.grid, set.msg1025 = &dhdn.projection;
    set.info.use1023 = set.info.use1025 = true;
    c.change(set);
    EXPECT_EQ(support_.ParseRTCMMEssages(set), c.result) << "case " << &c - cases;
    std::string files;
    for (const char* const name : {kDhdn, kBadekas}) {
      files += std::filesystem::exists(DatumFile(name)) ? "d" : ".";
      files += std::filesystem::exists(ProjectionFile(name)) ? "p" : ".";
    }
    EXPECT_EQ(files, c.files) << "case " << &c - cases;
    std::filesystem::remove_all(directory_ / "new");
  }
}

}  // namespace
}  // namespace velta_test
