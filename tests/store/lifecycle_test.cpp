// The ingestion object's life and the shared files.

#include "support/operating_system.h"
#include "support/rtcm_test.h"
#include "userdirs/user_dirs.h"

namespace velta_test {
namespace {

class LifecycleTest : public RtcmTest {};

TEST_F(LifecycleTest, DirectoriesAreTakenAsGivenOrTheUsers) {
  const RTCMDataSupport given(L"C:\\datums\\", nullptr);
  EXPECT_EQ(given.GetDatumPath(), L"C:\\datums\\");
  EXPECT_EQ(given.GetProjectionPath(), orx::GetUserGeoDir() + L"/projections/rtcmdata/");
  EXPECT_EQ(RTCMDataSupport().GetDatumPath(), orx::GetUserGeoDir() + L"/datums/rtcmdata/");
}

TEST_F(LifecycleTest, SummariesFollowTheLastSetAndAnAssignment) {
  CustomDatumData datum;
  CustomProjectionData projection;
  EXPECT_FALSE(support_.GetCustomDatumData(datum) || support_.GetCustomProjectionData(projection));
  EXPECT_EQ(datum.datumGroup + datum.transformationDll + datum.datumName, L"RTCMRTCMGridHost.dll");
  EXPECT_EQ(projection.projectionGroup + projection.transformationDll + projection.unitName +
                projection.projectionName + projection.datumName + projection.projectionType,
            L"RTCMRTCMGridHost.dllMeters");
  support_.SetDatumEllipsoidName(L"Bessel");
  ASSERT_EQ(Ingest(Dhdn(), kAllParts), kSuccess);
  EXPECT_TRUE(support_.GetCustomDatumData(datum) && support_.GetCustomProjectionData(projection));
  EXPECT_EQ(datum.datumName + datum.ellipsoidName, L"AUTO_DHDN_BESELBessel");
  EXPECT_EQ(projection.projectionName + projection.datumName + projection.projectionType,
            L"AUTO_DHDN_BESELAUTO_DHDN_BESELTMERC");
  EXPECT_EQ(support_.GetDatumSourceEllipsoid().second, 6356752.314);
  EXPECT_EQ(support_.GetDatumTargetEllipsoid().kind, orx::cs::projmath::Ellipsoid::kSemiMinorAxis);

  RTCMDataSupport other(L"a/", L"b/");
  other = support_;
  EXPECT_EQ(other.GetDatumPath() + other.GetProjectionPath(), datumPath_ + projectionPath_);
  EXPECT_EQ(other.GetTargetDatumName() + other.GetSourceDatumName() + other.GetRegionName(),
            L"AUTO_DHDN_BESELETRF89_ETRF89Europe");
  EXPECT_FALSE(other.GetCustomDatumData(datum) || other.GetCustomProjectionData(projection));
  EXPECT_EQ(projection.projectionName + projection.projectionType, L"AUTO_DHDN_BESEL");
}

TEST_F(LifecycleTest, OneObjectsEndUnloadsTheSiblingAndTheOtherGoesOn) {
  EXPECT_TRUE(RTCMDataSupport::DLLdatum && RTCMDataSupport::DLLprojection);
  ASSERT_EQ(Ingest(Dhdn(), kGrid), kSuccess);
  EXPECT_TRUE(IsSiblingLoaded());
  { const RTCMDataSupport other; }
  EXPECT_FALSE(IsSiblingLoaded());
  EXPECT_FALSE(RTCMDataSupport::DLLdatum || RTCMDataSupport::DLLprojection);
  RTCMDataSupport::ReleasePtrDatumGFF(DatumFile().wstring());
  RTCMDataSupport::ReleasePtrProjectionGFF(ProjectionFile().wstring());
  ASSERT_EQ(Ingest(Dhdn(), kAllParts), kSuccess);
  EXPECT_TRUE(IsSiblingLoaded());
  orx::TCSInFileKey* file = nullptr;
  const std::wstring path = DatumFile().wstring();
  EXPECT_EQ(RTCMDataSupport::GetUnlockedPtrDatumGFF(path, &file), kSuccess);
  EXPECT_EQ(file, RTCMDataSupport::GFFDatumFile);
  RTCMDataSupport::ReleasePtrDatumGFF(path);
  EXPECT_EQ(RTCMDataSupport::GetUnlockedPtrDatumGFF(path + L"x", &file), kNoSuchFile);
  EXPECT_EQ(RTCMDataSupport::GetUnlockedPtrProjectionGFF(path + L"x", &file), kNoSuchFile);
}

}  // namespace
}  // namespace velta_test
