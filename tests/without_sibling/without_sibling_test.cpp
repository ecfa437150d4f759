// Run in a directory without the sibling library.

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>

#include "velta/rtcm_data_support.h"

namespace orx::cs::velta {
namespace {

class WithoutSiblingTest : public testing::Test {
 protected:
  WithoutSiblingTest() { std::filesystem::remove(SIBLING_FILE); }

  void ExpectOfBothKinds(ResultCode loaded, ResultCode obtained) {
    EXPECT_EQ(RTCMDataSupport::GetUnlockedPtrDatumGFF(L"x.dff", &file_), obtained);
    EXPECT_EQ(RTCMDataSupport::GetUnlockedPtrProjectionGFF(L"x.prj", &file_), obtained);
    EXPECT_EQ(RTCMDataSupport::GetDatumTransformationDLL(), loaded);
    EXPECT_EQ(RTCMDataSupport::GetPrjTransformationDLL(), loaded);
    RTCMDataSupport::ReleasePtrDatumGFF(L"x.dff");
    RTCMDataSupport::ReleasePtrProjectionGFF(L"x.prj");
    EXPECT_EQ(file_, nullptr);
  }

  TCSInFileKey* file_ = nullptr;
};

TEST_F(WithoutSiblingTest, AbsentLibraryIsReportedByTheFirstUse) {
  const RTCMDataSupport support;
  EXPECT_FALSE(RTCMDataSupport::DLLdatum);
  EXPECT_FALSE(RTCMDataSupport::DLLprojection);
  ExpectOfBothKinds(kNoSiblingLibrary, kNoSiblingLibrary);
}

TEST_F(WithoutSiblingTest, FileThatIsNoLibraryGivesTheLoadersStatus) {
  std::ofstream(SIBLING_FILE) << "no library";
  EXPECT_EQ(RTCMDataSupport::GetUnlockedPtrDatumGFF(L"x.dff", &file_), kSiblingNotLoadable);
  EXPECT_EQ(RTCMDataSupport::GetUnlockedPtrProjectionGFF(L"x.prj", &file_), kSiblingNotLoadable);
  EXPECT_FALSE(RTCMDataSupport::DLLdatum);
  EXPECT_FALSE(RTCMDataSupport::DLLprojection);
  // Once the half-loaded library is held, it is the entry point that is missing.
  const RTCMDataSupport support;
  ExpectOfBothKinds(kSiblingNotLoadable, kNoSiblingLibrary);
}

TEST_F(WithoutSiblingTest, LibraryThatHandsOutNoTreeIsTroubleOfItsKind) {
  std::filesystem::copy_file(EMPTY_HANDED_FILE, SIBLING_FILE);
  RTCMDataSupport support(L"./", L"./");
  Rtcm1021 datum;
  datum.targetName = "D";
  Rtcm1025 projection;
  projection.projectionType = ProjectionData::TM;
  EXPECT_EQ(support.ParseDatumMessages(datum, nullptr), kDatumFileTrouble);
  EXPECT_EQ(support.ParseProjectionMessages(projection, nullptr), kProjectionFileTrouble);
  EXPECT_EQ(RTCMDataSupport::MergeRTCMDatumfiles(L"D.dff", L"D.dff"), kDatumFileTrouble);
  EXPECT_EQ(RTCMDataSupport::MergeRTCMProjectionfiles(L"D.prj", L"D.prj"), kProjectionFileTrouble);
}

TEST_F(WithoutSiblingTest, LibraryWithoutTheEntryPointsIsNoSibling) {
  std::filesystem::copy_file(OTHER_FILE, SIBLING_FILE);
  const RTCMDataSupport support;
  ExpectOfBothKinds(kSuccess, kNoSiblingLibrary);
}

}  // namespace
}  // namespace orx::cs::velta
