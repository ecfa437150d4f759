// Merging files, which is the same for both kinds.

#include "support/rtcm_test.h"

namespace velta_test {
namespace {

class MergeTest : public testing::TestWithParam<bool> {
 protected:
  std::filesystem::path Path(const std::string& name) { return directory_ / name; }
  /// A file of entries that hold the file's mark.
  void Make(const std::string& name, char mark, const std::vector<std::wstring>& entries) {
    const GffValue value{L"mark", 2, 1, 1, std::string(1, mark)};
    const GffValue own{std::wstring(L"of ") + std::to_wstring(mark), 2, 1, 1, std::string(1, mark)};
    GffKey root{L"", 0, {}, {{std::wstring(L"container ") + std::to_wstring(mark), 0, {value}}}};
    for (const std::wstring& entry : entries) {
      root.Container().keys.push_back({entry, 0, {value, own}, {{L"sub", 0, {value}}}});
    }
    WriteGff(Path(name), root);
  }
  ResultCode Merge(const std::string& target, const std::string& source) {
    const std::wstring to = Path(target).wstring(), from = Path(source).wstring();
    return GetParam() ? RTCMDataSupport::MergeRTCMDatumfiles(to, from)
                      : RTCMDataSupport::MergeRTCMProjectionfiles(to, from);
  }

  TemporaryDirectory directory_;
  const ResultCode trouble_ = GetParam() ? kDatumFileTrouble : kProjectionFileTrouble;
};

INSTANTIATE_TEST_SUITE_P(Kinds, MergeTest, testing::Bool(), [](const auto& isDatum) {
  return isDatum.param ? "Datum" : "Projection";
});

TEST_P(MergeTest, SourcesEntriesAreLaidOverTheTargets) {
  Make("target", 1, {L"B", L"C"});
  Make("source", 2, {L"A", L"B"});
  EXPECT_EQ(Merge("target", "source"), kSuccess);
  EXPECT_EQ(ReadGff(Path("target")).Dump(),
            "[container 1]\nmark 2 1 1 1\n"
            "[B]\nmark 2 1 1 2\nof 1 2 1 1 1\nof 2 2 1 1 2\n[sub]\nmark 2 1 1 2\n"
            "[C]\nmark 2 1 1 1\nof 1 2 1 1 1\n[sub]\nmark 2 1 1 1\n"
            "[A]\nmark 2 1 1 2\nof 2 2 1 1 2\n[sub]\nmark 2 1 1 2\n");
  Make("empty", 3, {});
  const GffKey before = ReadGff(Path("target"));
  EXPECT_EQ(Merge("target", "empty"), kSuccess);
  EXPECT_EQ(Merge("target", "target"), kSuccess);
  EXPECT_EQ(ReadGff(Path("target")), before);
  EXPECT_EQ(Merge("empty", "target"), kSuccess);
  EXPECT_EQ(ReadGff(Path("empty")).Container().keys, before.keys[0].keys);
}

TEST_P(MergeTest, FileThatCannotBeUsedFailsAndLeavesTheTargetAloneAndGivenBack) {
  Make("target", 1, {L"B"});
  Make("source", 2, {L"A"});
  Make("damaged", 3, {L"C"});
  const std::size_t size = ReadBytes(Path("damaged")).size();
  EXPECT_EQ(Merge("damaged", "source") + Merge("damaged", "target"), kSuccess);
  std::string damaged = ReadBytes(Path("damaged"));
  damaged[size + 80] ^= 1;  // in what the first merge added
  WriteBytes(Path("damaged"), damaged);
  WriteBytes(Path("garbage"), "no registry file");
  WriteGff(Path("rootless"), GffKey());
  const std::string before = ReadBytes(Path("target"));
  for (const char* const source : {"damaged", "garbage", "rootless", "missing"}) {
    EXPECT_EQ(Merge("target", source), trouble_) << source;
    EXPECT_EQ(ReadBytes(Path("target")), before) << source;
  }
  EXPECT_EQ(Merge("rootless", "source"), trouble_);
  EXPECT_EQ(Merge("garbage", "source"), trouble_);
  EXPECT_EQ(Merge("missing", "source"), kNoSuchFile);
  EXPECT_FALSE(std::filesystem::exists(Path("missing")));

  // An unsaved change is forgotten only when nobody works on the file.
  const std::wstring target = Path("target").wstring();
  orx::TCSInFileKey* file = nullptr;
  ASSERT_EQ(RTCMDataSupport::GetUnlockedPtrDatumGFF(target, &file), kSuccess);
  FillKey(RootOf(*file), {L"", 0, {}, {{L"unsaved"}}});
  RTCMDataSupport::ReleasePtrDatumGFF(target);
  ASSERT_EQ(RTCMDataSupport::GetUnlockedPtrDatumGFF(target, &file), kSuccess);
  EXPECT_FALSE(RootOf(*file).HasKey(L"unsaved"));
  RTCMDataSupport::ReleasePtrDatumGFF(target);
  EXPECT_EQ(Merge("target", "source"), kSuccess);
}

}  // namespace
}  // namespace velta_test
