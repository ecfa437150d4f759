// The ingestion object's life and the shared files.

#ifdef _WIN32
#include <windows.h>
#endif

#include "support/rtcm_test.h"
#include "userdirs/user_dirs.h"

namespace velta_test {
namespace {

bool IsSiblingLoaded() {
#ifdef _WIN32
  return GetModuleHandleA("RTCMGridHost.dll") != nullptr;
#else
  return ReadBytes("/proc/self/maps").find("RTCMGridHost.so") != std::string::npos;
#endif
}

static_assert(std::is_convertible_v<const wchar_t*, RTCMDataSupport>, "a path may stand for it");

using LifecycleTest = RtcmTest;

TEST_F(LifecycleTest, DirectoriesAreTakenAsGivenOrTheUsers) {
  const RTCMDataSupport given(L"C:\\datums\\", nullptr);
  EXPECT_EQ(given.GetDatumPath(), L"C:\\datums\\");
  EXPECT_EQ(given.GetProjectionPath(), orx::GetUserGeoDir() + L"/projections/rtcmdata/");
  EXPECT_EQ(RTCMDataSupport().GetDatumPath(), orx::GetUserGeoDir() + L"/datums/rtcmdata/");
}

TEST_F(LifecycleTest, SummariesFollowTheLastSetAndAnAssignment) {
  CustomDatumData d;
  CustomProjectionData p;
  EXPECT_FALSE(support_.GetCustomDatumData(d));
  EXPECT_FALSE(support_.GetCustomProjectionData(p));
  EXPECT_EQ(d.datumGroup, L"RTCM");
  EXPECT_EQ(d.transformationDll, L"RTCMGridHost.dll");
  EXPECT_EQ(p.projectionGroup, L"RTCM");
  EXPECT_EQ(p.transformationDll, L"RTCMGridHost.dll");
  EXPECT_EQ(p.unitName, L"Meters");
  support_.SetDatumEllipsoidName(L"Bessel");
  m1021_.targetName = "D";
  ASSERT_EQ(Ingest(kDhdnSet), kSuccess);
  EXPECT_TRUE(support_.GetCustomDatumData(d));
  EXPECT_TRUE(support_.GetCustomProjectionData(p));
  EXPECT_EQ(d.datumName, L"D");
  EXPECT_EQ(d.ellipsoidName, L"Bessel");
  EXPECT_EQ(p.projectionName, L"D");
  EXPECT_EQ(p.datumName, L"D");
  EXPECT_EQ(p.projectionType, L"TMERC");
  EXPECT_EQ(support_.GetDatumSourceEllipsoid().second, 6356752.314);
  EXPECT_EQ(support_.GetDatumTargetEllipsoid().kind, orx::cs::projmath::Ellipsoid::kSemiMinorAxis);
  RTCMDataSupport other(L"a/", L"b/");
  other = support_;
  EXPECT_FALSE(other.GetCustomDatumData(d));
  EXPECT_FALSE(other.GetCustomProjectionData(p));
  EXPECT_EQ(d.datumName, L"D");
  EXPECT_EQ(p.projectionName, L"D");
  EXPECT_EQ(p.projectionType, L"");
  EXPECT_EQ(other.GetSourceDatumName(), L"ETRF89_ETRF89");
  EXPECT_EQ(other.GetRegionName(), L"Europe");
  EXPECT_EQ(other.GetDatumPath(), datumPath_);
  EXPECT_EQ(other.GetProjectionPath(), projectionPath_);
  ProjectionData projection;
  projection = ProjectionData();
  EXPECT_TRUE(projection.geoProj);
  const ProjectionData moved(std::move(projection));
  EXPECT_TRUE(moved.geoProj);
}

TEST_F(LifecycleTest, OneObjectsEndUnloadsTheSiblingAndTheOtherGoesOn) {
  const std::wstring path = DatumFile().wstring();
  ASSERT_EQ(Ingest(k1021 | k1023), kSuccess);
  EXPECT_TRUE(RTCMDataSupport::DLLdatum);
  EXPECT_TRUE(RTCMDataSupport::DLLprojection);
  EXPECT_TRUE(IsSiblingLoaded());
  { const RTCMDataSupport other; }
  EXPECT_FALSE(RTCMDataSupport::DLLdatum);
  EXPECT_FALSE(RTCMDataSupport::DLLprojection);
  EXPECT_FALSE(IsSiblingLoaded());
  RTCMDataSupport::ReleasePtrDatumGFF(path);
  RTCMDataSupport::ReleasePtrProjectionGFF(path);
  ASSERT_EQ(Ingest(kDhdnSet), kSuccess);
  orx::TCSInFileKey* file = nullptr;
  EXPECT_EQ(RTCMDataSupport::GetUnlockedPtrDatumGFF(path, &file), kSuccess);
  EXPECT_EQ(file, RTCMDataSupport::GFFDatumFile);
}

}  // namespace
}  // namespace velta_test
