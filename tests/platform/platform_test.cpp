#include <gtest/gtest.h>

#include <cstdlib>
#include <cwctype>
#include <future>
#include <limits>
#include <numbers>

#include "orxutils/dll_func_loader.h"
#include "orxutils/file_funcs.h"
#include "projmath/ellipsoid.h"
#include "projmath/geo_proj.h"
#include "projmath/rect_rgn.h"
#include "registry_fixture.h"
#include "userdirs/user_dirs.h"

#ifndef _WIN32
#include <pwd.h>
#include <unistd.h>
#endif

#ifndef _WIN32
namespace {
bool isTurkish = false;
}  // namespace

/// In the place of the C library's, for the libraries too.
extern "C" __attribute__((visibility("default"))) std::wint_t towlower(std::wint_t c) noexcept {
  if (isTurkish && c == L'I') return 0x131;  // without its dot
  if (c == 0x130) return L'i';               // with its dot
  return c >= L'A' && c <= L'Z' ? c - L'A' + L'a' : c;
}
#endif

namespace velta_test {
namespace {

using namespace orx::cs::projmath;

TEST(OrxString, KeepsEveryCharacterThatTheOtherFormHas) {
  EXPECT_EQ(orx::Narrow(orx::Widen("S\xFC!") + L" \u20AC"), "S\xFC! ?");
  const std::wstring odd = std::wstring(L"a\U0001F4CD") + static_cast<wchar_t>(0xD800) + L"b";
  EXPECT_EQ(orx::ToUtf16(odd), std::u16string(u"a\U0001F4CD") + char16_t{0xD800} + u"b");
  EXPECT_EQ(orx::FromUtf16(orx::ToUtf16(odd)), odd);
  EXPECT_TRUE(orx::EqualsIgnoringCase(L"Dhdn", L"dHDN"));
  EXPECT_FALSE(orx::EqualsIgnoringCase(L"DHDN", L"DHDN "));
}

TEST(OrxString, KnowsLettersAndDigitsAsWindowsDoes) {
  std::wstring found;
  for (wchar_t c = 0; c < 0x180; ++c) {
    if (orx::IsLetterOrDigit(c)) found += c;
  }
  EXPECT_EQ(found,
            L"0123456789ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz\u00B2\u00B3\u00B9"
            L"\u00C0\u00C1\u00C2\u00C3\u00C4\u00C5\u00C6\u00C7\u00C8\u00C9\u00CA\u00CB\u00CC\u00CD"
            L"\u00CE\u00CF\u00D0\u00D1\u00D2\u00D3\u00D4\u00D5\u00D6\u00D8\u00D9\u00DA\u00DB\u00DC"
            L"\u00DD\u00DE\u00DF\u00E0\u00E1\u00E2\u00E3\u00E4\u00E5\u00E6\u00E7\u00E8\u00E9\u00EA"
            L"\u00EB\u00EC\u00ED\u00EE\u00EF\u00F0\u00F1\u00F2\u00F3\u00F4\u00F5\u00F6\u00F8\u00F9"
            L"\u00FA\u00FB\u00FC\u00FD\u00FE\u00FF");
}

#ifndef _WIN32
TEST(OrxString, ComparesLettersOfAsciiAlikeInEveryLocale) {
  isTurkish = true;
  EXPECT_EQ(std::towlower(L'I'), 0x131U) << "what the libraries would get";
  EXPECT_TRUE(orx::EqualsIgnoringCase(L"CASSINI", L"cassini"));
  isTurkish = false;
  EXPECT_FALSE(orx::EqualsIgnoringCase(L"CASS\u0130NI", L"cassini"));
}
#endif

constexpr char8_t kAnyLanguage[] = u8"g\u00E9\u4E2D \U0001F4CD";
constexpr bool kIsWindows = std::filesystem::path::preferred_separator == '\\';

/// The directory with an environment of the test's own, or the error that there is none.
class UserDirs : public ::testing::Test {
 protected:
  static std::string Directory() try {
    return orx::ToUtf8(orx::GetUserGeoDir());
  } catch (const std::runtime_error& error) {
    return error.what();
  }
  static void Set(const std::string& name, const std::string& value) {
#ifdef _WIN32
    _putenv_s(name.c_str(), value.c_str());
#else
    setenv(name.c_str(), value.c_str(), 1);
#endif
  }
  ~UserDirs() override { Set("ORX_USER_GEO_DIR", ""); }
};

TEST_F(UserDirs, TheVariableReplacesTheDirectoryWhole) {
  EXPECT_TRUE(orx::GetUserGeoDir().ends_with(L"orx/geodata"));
  Set("ORX_USER_GEO_DIR", "/geo/data/");
  EXPECT_EQ(Directory(), "/geo/data");
}

#ifdef _WIN32
TEST_F(UserDirs, WithoutAnyItIsAnErrorThatNamesTheVariable) {
  const std::string error = "LOCALAPPDATA names no directory; set it or ORX_USER_GEO_DIR";
  for (const char* const none : {"", "relative"}) {
    Set("LOCALAPPDATA", none);
    EXPECT_EQ(Directory(), error);
  }
}
#else
TEST_F(UserDirs, WithoutHomeItIsThatOfThePasswordDatabase) {
  const std::string known = getpwuid(getuid())->pw_dir;
  for (const char* const none : {"", "relative"}) {
    Set("HOME", none);
    Set("XDG_DATA_HOME", none);
    EXPECT_EQ(Directory(), known + "/.local/share/orx/geodata");
  }
}

TEST_F(UserDirs, NameThatIsNoTextIsAnErrorThatNamesTheVariable) {
  Set("HOME", "/home/\xFF");
  Set("XDG_DATA_HOME", "");
  EXPECT_EQ(Directory(), "HOME is not UTF-8; set ORX_USER_GEO_DIR");
  Set("XDG_DATA_HOME", "/data/\xFF");
  EXPECT_EQ(Directory(), "XDG_DATA_HOME is not UTF-8; set ORX_USER_GEO_DIR");
}
#endif

/// The sibling library, called as the library does.
class GridHost : public ::testing::Test {
 protected:
  using Get = std::int32_t(const wchar_t*, orx::TCSInFileKey**);

  GridHost() {
    file.path = file.directory.path() / kAnyLanguage / "a" / kAnyLanguage;
    EXPECT_TRUE(orx::FileFuncs::createDirectoryTree(orx::ToName(file.path.parent_path())));
    file.Create();
  }
  orx::TCSInFileKey* Obtain(const std::filesystem::path& path) {
    orx::TCSInFileKey* tree = nullptr;
    result = host->GetFunc<Get>("GetPtrDatumGFF")(orx::ToName(path).c_str(), &tree);
    return tree;
  }
  void GiveBack() {
    host->GetFunc<void(const wchar_t*)>("ResetRTCMDatumFile")(file.Name().c_str());
  }

  RegistryFile file;
  orx::TDLLFuncWrapper host = orx::TDLLFuncLoader::LoadDLL(L"RTCMGridHost.dll");
  std::int32_t result = 0;
};

TEST_F(GridHost, HandsOutOneTreeReadAgainWhenTheFileChangedOrNobodySaved) {
  orx::TCSInFileKey* const tree = Obtain(file.path);
  ASSERT_NE(tree, nullptr);
  RegistryFile::AddEntry(*tree, L"mine", "unsaved");
  EXPECT_TRUE(file.Append(L"theirs", "saved"));
  const auto above = file.path.parent_path().parent_path();
  EXPECT_EQ(Obtain(above / (kIsWindows ? "A" : "a") / "x" / ".." / kAnyLanguage), tree)
      << "another name";
  EXPECT_NE(Describe(*tree).find("mine"), std::string::npos) << "somebody works on it";
  GiveBack();
  GiveBack();
  Obtain(file.path);
  EXPECT_EQ(Describe(*tree), Describe(file.Load())) << "given back unsaved";
}

TEST_F(GridHost, CountsAUserWhoCameWhileAnotherWaited) {
  orx::TCSInFileKey* const tree = Obtain(file.path);
  GiveBack();
  tree->GetMutex().lock();
  auto other = std::async(std::launch::async, [this] { Obtain(file.path); });
  EXPECT_EQ(other.wait_for(std::chrono::milliseconds(50)), std::future_status::timeout);
  Obtain(file.path);
  RegistryFile::AddEntry(*tree, L"mine", "unsaved");
  tree->GetMutex().unlock();
  other.wait();
  EXPECT_NE(Describe(*tree).find("mine"), std::string::npos);
}

TEST_F(GridHost, ReportsAMissingFileAndHandsOutADamagedOne) {
  EXPECT_EQ(Obtain(file.directory / "none.dff"), nullptr);
  EXPECT_LT(result, 0);
  file.SetBytes("damaged");
  orx::TCSInFileKey* const tree = Obtain(file.path);
  ASSERT_NE(tree, nullptr);
  EXPECT_EQ(tree->GetErrorState(), orx::kNotARegistryFile);
  std::filesystem::remove(file.path);
  file.Create();
  EXPECT_EQ(Obtain(file.path)->GetErrorState(), orx::kRegistryOk) << "mended meanwhile";
}

TEST(Ellipsoid, IsCompletedFromEitherDefinitionWhichStaysAsItIs) {
  const Ellipsoid wgs84 = Ellipsoid::Wgs84();
  EXPECT_EQ(wgs84.second, 298.257223563);
  EXPECT_NEAR(wgs84.semiMinorAxis, 6356752.314245, 1e-6);
  EXPECT_NEAR(wgs84.eccentricitySquared, 0.00669437999014, 1e-14);
  EXPECT_NEAR(1.0 / Ellipsoid::FromAxes(6377397.155, 6356078.963).flattening, 299.1528, 1e-4);
}

TEST(TGeoProj, HoldsItsParametersAndNoOthers) {
  TMercatorProj mercator(1.0, 2.0, 0, 0, 0, 0);
  for (int i = -1; i < 20; ++i) mercator.SetParam(i + 10.0, i, kDegreesMetresRatios);
  TGeoProj copy;
  copy.CopyGeoProj(mercator);
  EXPECT_EQ(copy.ellipsoidSecond, 2.0);
  EXPECT_EQ(copy.GetParam(3, kDegreesMetresRatios), 13.0);
  for (const int none : {-1, 4}) EXPECT_EQ(copy.GetParam(none, kDegreesMetresRatios), 0.0);
}

TEST(TRectRgn, HoldsItsEdgesAndEveryNumberOfAMeridian) {
  constexpr double kDegree = std::numbers::pi / 180;
  constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();
  // A region and a point in degrees, whether it is inside, and whether it is on the plane.
  const std::tuple<const char*, TRectRgn, double, double, bool, bool> cases[] = {
      {"north-east corner", {50, 2, 8, 3}, 52, 11, true, true},
      {"south-west corner", {50, 2, 8, 3}, 50, 8, true, true},
      {"north of it", {50, 2, 8, 3}, 52.0001, 9, false, false},
      {"west of it", {50, 2, 8, 3}, 51, 7.9999, false, false},
      {"east of it", {50, 2, 8, 3}, 51, 11.0001, false, false},
      {"two turns back", {50, 2, 8, 3}, 51, -711, true, false},
      {"west edge by another number", {50, 2, -1, 3}, 51, 359, true, false},
      {"east edge by another number", {50, 2, -4, 3}, 51, 359, true, false},
      {"across the 180th meridian", {50, 2, 179, 3}, 51, -179, true, false},
      {"across the 180th meridian, beyond", {50, 2, 179, 3}, 51, -177.9, false, false},
      {"every latitude", {10, 180, 0, 10}, -90, 5, true, false},
      {"every longitude", {10, 5, 100, 360}, 12, 99, true, false},
      {"not quite every longitude", {10, 5, 100, 359}, 12, 99.5, false, false},
      {"no extent", {10, 0, 20, 0}, 10, 20, true, true},
      {"no latitude", {0, 180, 0, 360}, kNaN, 5, false, false},
      {"no longitude", {0, 180, 0, 360}, 5, kNaN, false, false},
  };
  for (const auto& [what, region, latitude, longitude, inside, insidePlane] : cases) {
    const TRectRgn radians{region.south * kDegree, region.northExtent * kDegree,
                           region.west * kDegree, region.eastExtent * kDegree};
    EXPECT_EQ(radians.Inside(latitude * kDegree, longitude * kDegree, false), inside) << what;
    EXPECT_EQ(region.Inside(latitude, longitude, true), insidePlane) << what;
  }
}

}  // namespace
}  // namespace velta_test
