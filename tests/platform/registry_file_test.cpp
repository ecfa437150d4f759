#include <gtest/gtest.h>

#include <vector>

#include "registry_fixture.h"

namespace velta_test {
namespace {

using orx::TCSInFileKey;
using orx::TGenericRegistryKey;

TEST(RegistryFile, KeepsNamesDescriptionsBytesAndOrder) {
  const RegistryFile file;
  TCSInFileKey tree = RegistryFile::New();
  const TGenericRegistryKey container(RootOf(tree), L"Z\u00FCrich", 7, true);
  TGenericRegistryKey entry = Open(container, L"b");
  EXPECT_TRUE(entry.AddValue(L"text", RawValue::Text(L"S\u00FCd \U0001F4CD"), 1, true));
  EXPECT_TRUE(entry.AddValue(L"block", RawValue::Block("0123456789"), 1, true));
  EXPECT_TRUE(entry.AddValue(L"byte", RawValue(orx::kSignedInteger, 1, "x"), 2, true));
  Open(container, L"a");
  EXPECT_EQ(Open(container, L"b").GetName(), L"b") << "an existing key is opened, not made again";
  ASSERT_TRUE(tree.Save(file.path.wstring(), false, 512));

  const TCSInFileKey loaded = file.Load();
  EXPECT_EQ(loaded.GetErrorState(), orx::kRegistryOk);
  EXPECT_EQ(Describe(loaded), Describe(tree));
  const TGenericRegistryKey read = Open(Open(RootOf(loaded), L"Z\u00FCrich"), L"b");
  EXPECT_EQ(orx::GetRegValue<std::wstring>(read, L"text", L"", 0), L"S\u00FCd \U0001F4CD");
  EXPECT_EQ(read.GetValueSize(L"text"), 14U) << "4 characters, a pair of surrogates, the end";
  EXPECT_EQ(read.GetValueDim(L"byte"), 2);
  EXPECT_EQ(Open(RootOf(loaded), L"Z\u00FCrich").GetKeyDim(), 7);
  EXPECT_EQ(orx::GetRegValue<std::wstring>(read, L"block", L"none", 0), L"none");
  EXPECT_FALSE(read.HasValue(L"Text")) << "names are exact";
}

TEST(RegistryFile, AValueWhoseDescriptionAndBytesDisagreeIsRefused) {
  TCSInFileKey tree = RegistryFile::New();
  TGenericRegistryKey key = RootOf(tree);
  EXPECT_FALSE(key.AddValue(L"v", RawValue(), 1, true)) << "empty adaptor";
  EXPECT_FALSE(key.AddValue(L"v", RawValue(orx::kByteBlock, 4, "123"), 1, true));
  EXPECT_FALSE(key.AddValue(L"v", RawValue(orx::kWideString, 0, "ab"), 1, true)) << "no end";
  EXPECT_FALSE(key.AddValue(std::wstring(70'000, L'n'), RawValue::Block("1"), 1, true));
  EXPECT_FALSE(key.HasValue(L"v"));
  EXPECT_TRUE(TGenericRegistryKey(key, std::wstring(70'000, L'n'), 0, true).IsNull());
  EXPECT_FALSE(TGenericRegistryKey(nullptr).AddValue(L"v", RawValue::Block("1"), 1, true));
}

TEST(RegistryFile, ASaveAppendsWhatIsNewAndNothingElse) {
  const RegistryFile file;
  file.Create(std::string(10'000, 'x'));
  const std::string before = file.Bytes();
  ASSERT_TRUE(file.Append(L"S_1", "second"));
  const std::string after = file.Bytes();
  EXPECT_EQ(after.substr(0, before.size()), before);
  EXPECT_LT(after.size() - before.size(), 250U);

  TCSInFileKey tree = file.Load();
  RegistryFile::AddEntry(tree, L"S_1", "second");
  EXPECT_TRUE(tree.Save(false, 512));
  EXPECT_EQ(file.Bytes(), after) << "the same value again is no change";
  EXPECT_FALSE(tree.Save(false, 511)) << "no such registry version";
}

TEST(RegistryFile, ManySiblingsKeepTheirOrderAndAreFound) {
  const RegistryFile file;
  TCSInFileKey tree = RegistryFile::New();
  constexpr int kCount = 300;
  const auto name = [](int i) { return L"S_" + std::to_wstring(i * 7919 % kCount); };
  for (int i = 0; i < kCount; ++i) RegistryFile::AddEntry(tree, name(i), std::to_string(i));
  ASSERT_TRUE(tree.Save(file.path.wstring(), false, 512));
  const TCSInFileKey loaded = file.Load();
  const TGenericRegistryKey container = Open(RootOf(loaded), L"container");
  orx::TGenRegKeyIterator walk(container);
  for (int i = 0; i < kCount; ++i) {
    EXPECT_EQ(TGenericRegistryKey(walk++).GetName(), name(i));
    EXPECT_TRUE(container.HasKey(name(i)));
  }
  EXPECT_FALSE(walk);
  EXPECT_EQ(walk++, nullptr);
  EXPECT_FALSE(container.HasKey(L"S_300"));
}

TEST(RegistryFile, IsWrittenAfreshWhenMoreThanHalfIsSuperseded) {
  const RegistryFile file;
  file.Create();
  std::size_t largest = 0;
  TCSInFileKey tree = file.Load();
  for (int i = 0; i < 40; ++i) {
    RegistryFile::AddEntry(tree, L"S_0", std::string(1000, static_cast<char>('a' + i % 26)));
    ASSERT_TRUE(tree.Save(false, 512));
    largest = std::max(largest, file.Bytes().size());
    EXPECT_EQ(Describe(file.Load()), Describe(tree));
  }
  EXPECT_LT(largest, 5000U);
  ASSERT_TRUE(file.Append(L"S_1", "behind"));
  EXPECT_NE(Describe(file.Load()).find("S_1(0 value=1:1:behind)"), std::string::npos);
}

TEST(RegistryFile, SavesOfTwoTreesOfOneFileLoseNothing) {
  const RegistryFile file;
  file.Create();
  TCSInFileKey one = file.Load();
  TCSInFileKey other = file.Load();
  for (int i = 1; i < 6; ++i) {
    RegistryFile::AddEntry(one, L"one" + std::to_wstring(i), "1");
    ASSERT_TRUE(one.Save(false, 512));
    RegistryFile::AddEntry(other, L"other" + std::to_wstring(i), "2");
    // Values that replace one another make the file be written afresh now and then.
    RegistryFile::AddEntry(other, L"S_0", std::string(900, static_cast<char>('a' + i)));
    ASSERT_TRUE(other.Save(false, 512));
  }
  const std::string text = Describe(file.Load());
  for (int i = 1; i < 6; ++i) {
    EXPECT_NE(text.find("one" + std::to_string(i)), std::string::npos) << i;
    EXPECT_NE(text.find("other" + std::to_string(i)), std::string::npos) << i;
  }
  EXPECT_NE(text.find(std::string(900, 'f')), std::string::npos);
}

TEST(RegistryFile, ANewFileNeverReplacesOne) {
  const RegistryFile file;
  file.Create();
  const std::string before = file.Bytes();
  TCSInFileKey tree = RegistryFile::New();
  EXPECT_FALSE(tree.Save(file.path.wstring(), false, 512));
  EXPECT_FALSE(TCSInFileKey(file.path.wstring(), nullptr, nullptr, false, 97).Save(false, 512));
  EXPECT_FALSE(tree.Save((file.directory / "no" / "such").wstring(), false, 512));
  EXPECT_EQ(file.Bytes(), before);
  EXPECT_EQ(std::distance(std::filesystem::directory_iterator(file.directory.path()), {}), 1)
      << "nothing is left beside it";
}

TEST(RegistryFile, ALostFileIsNotASuccess) {
  const RegistryFile file;
  TCSInFileKey tree(file.path.wstring(), nullptr, nullptr, false, 97U);
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
  TCSInFileKey tree = RegistryFile::New();
  TCSInFileKey other = RegistryFile::New();
  TGenericRegistryKey target = Open(RootOf(tree), L"target");
  TGenericRegistryKey source = Open(RootOf(other), L"source");
  target.AddValue(L"both", RawValue::Block("old"), 1, true);
  target.AddValue(L"mine", RawValue::Block("kept"), 1, true);
  Open(target, L"sub").AddValue(L"v", RawValue::Block("1"), 1, true);
  source.AddValue(L"both", RawValue::Block("new"), 1, true);
  Open(source, L"sub").AddValue(L"w", RawValue::Block("2"), 1, true);
  target.DeepCopy(source);
  EXPECT_EQ(Describe(target), "(0 both=1:1:new mine=1:1:kept sub(0 v=1:1:1 w=1:1:2))");

  const std::string before = Describe(target);
  target.DeepCopy(target);
  EXPECT_EQ(Describe(target), before);
  Open(target, L"inside").DeepCopy(target);
  EXPECT_EQ(Describe(Open(target, L"inside")).substr(0, 16), "(0 both=1:1:new ");
}

TEST(RegistryKey, KeysOutliveTheirTree) {
  auto tree = std::make_unique<TCSInFileKey>(L"", nullptr, nullptr, false, 97U);
  TGenericRegistryKey key = Open(RootOf(*tree), L"kept");
  tree.reset();
  EXPECT_TRUE(key.AddValue(L"v", RawValue::Block("1"), 1, true));
  EXPECT_EQ(key.GetName(), L"kept");
}

}  // namespace
}  // namespace velta_test
