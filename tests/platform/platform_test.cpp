#include <gtest/gtest.h>

#include <cstdlib>

#include "orxutils/dll_func_loader.h"
#include "orxutils/file_funcs.h"
#include "orxutils/path.h"
#include "registry_fixture.h"
#include "userdirs/user_dirs.h"

namespace velta_test {
namespace {

TEST(OrxString, ConvertsBothWays) {
  EXPECT_EQ(orx::Widen("S\xFC"
                       "d"),
            L"S\u00FCd");
  EXPECT_EQ(orx::Narrow(L"S\u00FCd \u20AC"),
            "S\xFC"
            "d ?");
  const std::wstring odd = std::wstring(L"a\U0001F4CD") + static_cast<wchar_t>(0xD800) + L"b";
  EXPECT_EQ(orx::ToUtf16(odd), std::u16string(u"a\U0001F4CD") + char16_t{0xD800} + u"b");
  EXPECT_EQ(orx::FromUtf16(orx::ToUtf16(odd)), odd);
  EXPECT_TRUE(orx::EqualsIgnoringCase(L"Dhdn", L"dHDN"));
  EXPECT_FALSE(orx::EqualsIgnoringCase(L"DHDN", L"DHDN "));
}

TEST(FileFuncs, TellsFilesFromDirectories) {
  const TemporaryDirectory directory;
  const std::wstring made = orx::ToName(directory.path()) + L"/a/g\u00E9\u4E2D \U0001F4CD/c/";
  EXPECT_FALSE(orx::FileFuncs::isDirExists(made));
  EXPECT_TRUE(orx::FileFuncs::createDirectoryTree(made));
  EXPECT_TRUE(orx::FileFuncs::createDirectoryTree(made)) << "there already";
  EXPECT_TRUE(orx::FileFuncs::isDirExists(made));
  EXPECT_FALSE(orx::FileFuncs::isFileExists(made));
  WriteBytes(directory / "file", "x");
  EXPECT_TRUE(orx::FileFuncs::isFileExists((directory / "file").wstring()));
  EXPECT_FALSE(orx::FileFuncs::createDirectoryTree((directory / "file" / "d").wstring()));
  EXPECT_FALSE(orx::FileFuncs::isFileExists(L""));
}

TEST(UserDirs, TheVariableReplacesTheDirectoryWhole) {
  const auto set = [](const char* value) {
#ifdef _WIN32
    _putenv_s("ORX_USER_GEO_DIR", value);
#else
    setenv("ORX_USER_GEO_DIR", value, 1);
#endif
  };
  set("/geo/data/");
  EXPECT_EQ(orx::GetUserGeoDir(), L"/geo/data");
  set("");
  const std::wstring directory = orx::GetUserGeoDir();
  EXPECT_EQ(directory.substr(directory.size() - 11), L"orx/geodata");
}

/// The sibling library, called as the library does.
class GridHost : public ::testing::Test {
 protected:
  using Get = std::int32_t(const wchar_t*, orx::TCSInFileKey**);
  using Reset = void(const wchar_t*);

  GridHost() { file.Create(); }

  orx::TCSInFileKey* Obtain() { return Obtain(file.path.wstring()); }
  orx::TCSInFileKey* Obtain(const std::wstring& name) {
    orx::TCSInFileKey* tree = nullptr;
    result = host->GetFunc<Get>("GetPtrDatumGFF")(name.c_str(), &tree);
    return tree;
  }
  void GiveBack() { host->GetFunc<Reset>("ResetRTCMDatumFile")(file.path.wstring().c_str()); }

  RegistryFile file;
  orx::TDLLFuncWrapper host = orx::TDLLFuncLoader::LoadDLL(L"RTCMGridHost.dll");
  std::int32_t result = 0;
};

TEST_F(GridHost, HandsOutOneTreeForOneFileByAnyOfItsNames) {
  orx::TCSInFileKey* const tree = Obtain();
  ASSERT_NE(tree, nullptr);
  GiveBack();
  EXPECT_EQ(Obtain(), tree);
  EXPECT_EQ(Obtain((file.directory / "x" / ".." / "tree.dff").wstring()), tree);
}

TEST_F(GridHost, TakesNamesOfAnyLanguage) {
  const std::wstring name = orx::ToName(file.directory.path()) + L"/g\u00E9\u4E2D \U0001F4CD.dff";
  EXPECT_TRUE(file.Load().Save(name, false, 512));
  ASSERT_NE(Obtain(name), nullptr);
  EXPECT_EQ(Describe(*Obtain(name)), Describe(file.Load()));
}

TEST_F(GridHost, ReadsAgainWhatChangedOnDiskAndWhatNobodySaved) {
  orx::TCSInFileKey* const tree = Obtain();
  RegistryFile::AddEntry(*tree, L"mine", "unsaved");
  EXPECT_TRUE(file.Append(L"theirs", "saved"));
  Obtain();
  EXPECT_NE(Describe(*tree).find("mine"), std::string::npos) << "somebody works on it";
  GiveBack();
  GiveBack();
  Obtain();
  EXPECT_EQ(Describe(*tree).find("mine"), std::string::npos) << "given back unsaved";
  EXPECT_NE(Describe(*tree).find("theirs"), std::string::npos);
}

TEST_F(GridHost, ReportsAMissingFileAndHandsOutADamagedOne) {
  EXPECT_EQ(Obtain((file.directory / "none.dff").wstring()), nullptr);
  EXPECT_LT(result, 0);
  file.SetBytes("damaged");
  ASSERT_NE(Obtain(), nullptr);
  EXPECT_EQ(result, 0);
  EXPECT_EQ(Obtain()->GetErrorState(), orx::kNotARegistryFile);
  std::filesystem::remove(file.path);
  file.Create();
  EXPECT_EQ(Obtain()->GetErrorState(), orx::kRegistryOk) << "mended meanwhile";
}

TEST(DllLoader, MissingAndUnloadableAreTwoThings) {
  EXPECT_EQ(orx::TDLLFuncLoader::LoadDLL(L"NoSuchLibrary.dll"), nullptr);
  const orx::TDLLFuncWrapper host = orx::TDLLFuncLoader::LoadDLL(L"RTCMGridHost.dll");
  ASSERT_NE(host, nullptr);
  EXPECT_EQ(host->GetStatus(), 0);
  EXPECT_EQ(host->GetFunc<void()>("NoSuchFunction"), nullptr);
  host->ReleaseDLL();
  EXPECT_EQ(host->GetFunc<void()>("GetPtrDatumGFF"), nullptr) << "released";
}

}  // namespace
}  // namespace velta_test
