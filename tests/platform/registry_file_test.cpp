#include <gtest/gtest.h>

#include "registry_fixture.h"

namespace velta_test {
namespace {

using namespace std::string_view_literals;
using orx::TCSInFileKey;
using orx::TGenericRegistryKey;

TEST(RegistryFile, AValueWhoseDescriptionAndBytesDisagreeIsRefused) {
  TCSInFileKey tree = RegistryFile::New();
  TGenericRegistryKey key = RootOf(tree);
  EXPECT_FALSE(key.AddValue(L"v", RawValue(), 1, true)) << "empty adaptor";
  EXPECT_FALSE(key.AddValue(L"v", RawValue(orx::kByteBlock, 4, "123"), 1, true));
  EXPECT_FALSE(key.AddValue(L"v", RawValue(orx::kWideString, 0, "ab"), 1, true)) << "no end";
  const std::wstring tooLong(70'000, L'n');
  EXPECT_FALSE(key.AddValue(tooLong, RawValue::Block("1"), 1, true));
  EXPECT_TRUE(TGenericRegistryKey(key, tooLong, 0, true).IsNull());
  EXPECT_EQ(Describe(tree), "(0)");
}

TEST(RegistryFile, ASaveAppendsWhatIsNewAndNothingElse) {
  const RegistryFile file;
  file.Create(std::string(10'000, 'x'));
  const std::string before = file.Bytes();
  ASSERT_TRUE(file.Append(L"S_1", "second"));
  const std::string after = file.Bytes();
  EXPECT_TRUE(after.starts_with(before));
  EXPECT_LT(after.size() - before.size(), 250U);

  EXPECT_TRUE(file.Append(L"S_1", "second"));
  EXPECT_EQ(file.Bytes(), after) << "the same value again is no change";
  EXPECT_FALSE(file.Load().Save(false, 511)) << "no such registry version";
}

TEST(RegistryKey, OutlivesItsTreeAndFindsManySubKeysInTheirOrder) {
  const TGenericRegistryKey key = RootOf(RegistryFile::New());
  std::vector<std::wstring> names;
  for (int i = 0; i < 300; ++i) names.push_back(std::to_wstring(i * 7919 % 300));
  for (const std::wstring& name : names) Open(key, name);
  orx::TGenRegKeyIterator walk(key);
  for (const std::wstring& name : names) {
    EXPECT_EQ(TGenericRegistryKey(walk++).GetName(), name);
    EXPECT_TRUE(key.HasKey(name));
  }
  EXPECT_EQ(walk++, nullptr);
  EXPECT_FALSE(key.HasKey(L"300"));
}

TEST(RegistryFile, TwoWritersLoseNothingWhileItIsWrittenAfreshNowAndThen) {
  const RegistryFile file;
  file.Create();
  TCSInFileKey one = file.Load();
  TCSInFileKey other = file.Load();
  std::string entries;
  for (const char letter : "abcdefghijklmnopqrst"sv) {
    const std::string name(1, letter), replacing(1000, letter);
    RegistryFile::AddEntry(one, orx::Widen(name), "1");
    RegistryFile::AddEntry(other, L"S_0", replacing);
    ASSERT_TRUE(one.Save(false, 512) && other.Save(false, 512));
    entries += " " + name + "(0 value=1:1:1)";
    EXPECT_EQ(Describe(file.Load()),
              "(0 container(0 S_0(0 value=1:1:" + replacing + ")" + entries + "))");
    EXPECT_LT(file.Bytes().size(), 6000U) << "half of it is superseded at most";
  }
}

TEST(RegistryFile, ANewFileNeverReplacesOne) {
  const RegistryFile file;
  file.Create();
  const std::string before = file.Bytes();
  EXPECT_FALSE(RegistryFile::New().Save(file.Name(), false, 512));
  EXPECT_FALSE(TCSInFileKey(file.Name(), nullptr, nullptr, false, 97).Save(false, 512));
  EXPECT_EQ(file.Bytes(), before);
  EXPECT_EQ(std::distance(std::filesystem::directory_iterator(file.directory.path()), {}), 1)
      << "nothing is left beside it";
}

TEST(RegistryFile, ALostFileIsNotASuccess) {
  const RegistryFile file;
  TCSInFileKey tree(file.Name(), nullptr, nullptr, false, 97U);
  EXPECT_TRUE(tree.Save(false, 512)) << "a new tree makes its file";
  EXPECT_TRUE(tree.Save(false, 512)) << "and then goes on with it";
  std::filesystem::remove(file.path);
  EXPECT_FALSE(tree.Save(false, 512)) << "nothing to write, but nothing is safe either";
  RegistryFile::AddEntry(tree, L"S_1", "new");
  EXPECT_FALSE(tree.Save(false, 512));
  file.Create();
  EXPECT_TRUE(tree.Save(false, 512)) << "what a failed save left is kept for another try";
  EXPECT_NE(Describe(file.Load()).find("S_1"), std::string::npos);
}

TEST(RegistryKey, DeepCopyLaysTheSourceOverTheTarget) {
  const TCSInFileKey tree = RegistryFile::New(), other = RegistryFile::New();
  RegistryFile::AddEntry(tree, L"both", "old");
  RegistryFile::AddEntry(tree, L"mine", "kept");
  RegistryFile::AddEntry(other, L"theirs", "added");
  RegistryFile::AddEntry(other, L"both", "new");
  TGenericRegistryKey root = RootOf(tree);
  root.DeepCopy(RootOf(other));
  const std::string content =
      "(0 container(0 both(0 value=1:1:new) mine(0 value=1:1:kept) "
      "theirs(0 value=1:1:added))";
  EXPECT_EQ(Describe(tree), content + ")");
  Open(root, L"inside").DeepCopy(root);
  EXPECT_TRUE(Describe(Open(root, L"inside")).starts_with(content));
}

}  // namespace
}  // namespace velta_test
