// Files that are large, or large inside, for no good reason: bounded time and memory, and a clear
// answer. The times are far above what is needed and far below a hang.

#include <gtest/gtest.h>

#include <chrono>
#include <filesystem>

#include "platform/registry_fixture.h"
#include "velta/rtcm_generator.h"

namespace velta_test {
namespace {

using Clock = std::chrono::steady_clock;
using orx::TCSInFileKey;

constexpr int kMany = 1'000'000;

class HostileFile : public ::testing::Test {
 protected:
  ~HostileFile() override {
    EXPECT_LT(Clock::now() - start_, std::chrono::seconds(60)) << "this is a hang";
  }
  /// What a generator makes of it.
  void Query() const {
    const orx::cs::velta::RTCMGenerator generator(1, file.path.wstring(), file.path.wstring());
    EXPECT_TRUE(generator.getAllDatums().empty());
    EXPECT_EQ(generator.getRtcmDatumMessage(0.9, 0.15, 0), nullptr);
    EXPECT_EQ(generator.get1024(5e6, 3e6, 0), nullptr);
    EXPECT_EQ(generator.getRtcmProjMessage(), nullptr);
  }

  RegistryFile file;

 private:
  Clock::time_point start_ = Clock::now();
};

TEST_F(HostileFile, AGibibyteOfZerosIsNotReadToItsEnd) {
  file.SetBytes("");
  std::filesystem::resize_file(file.path, std::uintmax_t{1} << 30);
  EXPECT_EQ(file.Load().GetErrorState(), orx::kNotARegistryFile);
  Query();
}

TEST_F(HostileFile, ZerosBehindGoodSegmentsAreASaveThatNeverFinished) {
  file.Create("kept");
  std::filesystem::resize_file(file.path, std::uintmax_t{1} << 28);
  TCSInFileKey tree = file.Load();
  EXPECT_EQ(tree.GetErrorState(), orx::kRegistryOk);
  RegistryFile::AddEntry(tree, L"S_1", "next");
  EXPECT_TRUE(tree.Save(false, 512));
  EXPECT_LT(std::filesystem::file_size(file.path), 1000U) << "and is cut off";
}

TEST_F(HostileFile, AMillionEmptyKeysAreWalkedAndFound) {
  TCSInFileKey made = RegistryFile::New();
  const orx::TGenericRegistryKey container = Open(RootOf(made), L"container");
  for (int i = 0; i < kMany; ++i) Open(container, std::to_wstring(i));
  ASSERT_TRUE(made.Save(file.path.wstring(), false, 512));
  const TCSInFileKey tree = file.Load();
  const orx::TGenericRegistryKey loaded = Open(RootOf(tree), L"container");
  EXPECT_TRUE(loaded.HasKey(L"999999"));
  int count = 0;
  for (orx::TGenRegKeyIterator walk(loaded); walk; ++count) walk++;
  EXPECT_EQ(count, kMany);
  Query();
}

TEST_F(HostileFile, AHundredThousandValuesInOneKeyAreNoHang) {
  TCSInFileKey made = RegistryFile::New();
  orx::TGenericRegistryKey key = Open(Open(RootOf(made), L"container"), L"entry");
  for (int i = 0; i < kMany / 10; ++i) {
    key.AddValue(std::to_wstring(i), RawValue::Block("x"), 1, true);
  }
  ASSERT_TRUE(made.Save(file.path.wstring(), false, 512));
  const TCSInFileKey tree = file.Load();
  EXPECT_EQ(Open(Open(RootOf(tree), L"container"), L"entry").GetValueNames().size(),
            static_cast<std::size_t>(kMany / 10));
  Query();
}

}  // namespace
}  // namespace velta_test
