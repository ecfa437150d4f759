// Files as the library writes them, and files that were cut, altered or made up.

#include <gtest/gtest.h>

#include "fuzz/record_tree.h"
#include "registry_fixture.h"

namespace velta_test {
namespace {

using namespace std::string_view_literals;
using orx::TCSInFileKey;

velta_fuzz::Value Value(const std::u16string& name, std::uint8_t type, std::uint32_t elementSize,
                        const std::string& data, std::uint8_t dimension = 1) {
  return {elementSize, type, dimension, Units(name), data};
}

velta_fuzz::Key Key(const std::u16string& name, const std::vector<velta_fuzz::Value>& values,
                    const std::vector<velta_fuzz::Key>& keys, std::uint8_t dimension = 0) {
  return {dimension, Units(name), values, keys};
}

std::string File(const std::vector<velta_fuzz::Segment>& segments) {
  return velta_fuzz::PutTogether({Units(u"ab"), {}, 64, segments});
}

TEST(RegistryFormat, IsReadAndWrittenAsDocumented) {
  const RegistryFile file;
  const velta_fuzz::Value a = Value(u"a", 1, 2, "xy");
  const velta_fuzz::Value text = Value(u"t", 5, 0, Units(u"S\u00FC! \U0001F4CD\0"sv));
  const velta_fuzz::Value replaced = Value(u"a", 2, 1, "z", 2);
  const velta_fuzz::Key first = Key(u"e", {a, text}, {Key(u"k", {a}, {}, 3)});
  const velta_fuzz::Key second = Key(u"f", {a, text}, {Key(u"k", {a}, {}, 3)}, 2);
  const velta_fuzz::Key other = Key(u"l", {}, {});
  const auto tree = [&](const velta_fuzz::Value& value, const std::vector<velta_fuzz::Value>& its) {
    return ContentOf(Key(u"", {value}, {Key(u"Z\u00FC", its, {}, 7), other}));
  };
  const auto added = ContentOf(Key(u"", {replaced}, {other, Key(u"Z\u00FC", {a}, {}, 9)}));
  file.SetBytes(
      File({SegmentOf(ContentOf(Key(u"", {a}, {Key(u"Z\u00FC", {text}, {}, 7)})), {first}),
            SegmentOf(added, {second, Key(u"e", {replaced}, {})})}));
  TCSInFileKey read = file.Load();
  const std::string shown = " t=5:1:" + orx::Narrow(L"S\u00FC! \U0001F4CD");
  const std::string k = shown + " k(3 a=1:1:xy))";
  EXPECT_EQ(Describe(read), "(0 a=2:2:z Z\xFC(7" + shown + " a=1:1:xy e(0 a=2:2:z" + k +
                                " f(2 a=1:1:xy" + k + ") l(0))");
  const orx::TGenericRegistryKey key = Open(RootOf(read), L"Z\u00FC");
  EXPECT_EQ(orx::GetRegValue<std::wstring>(key, L"t", L"", 0), L"S\u00FC! \U0001F4CD");
  EXPECT_EQ(orx::GetRegValue<std::wstring>(key, L"a", L"no text", 0), L"no text");
  EXPECT_EQ(key.GetValueSize(L"t"), 14U) << "4 characters, a pair of surrogates, the end";
  EXPECT_FALSE(key.HasValue(L"T")) << "names are exact";

  std::filesystem::remove(file.path);
  EXPECT_TRUE(read.Save(file.Name(), false, orx::kRegistryVersion));
  const velta_fuzz::Key changed = Key(u"e", {replaced, text}, first.keys);
  EXPECT_EQ(file.Bytes(), File({SegmentOf(tree(replaced, {text, a}), {changed, second})}));
}

TEST(RegistryDamage, AtAnyPlaceIsDamageOrASaveThatNeverFinished) {
  const RegistryFile file;
  file.Create();
  const std::string first = Describe(file.Load());
  const std::size_t firstEnd = file.Bytes().size();
  ASSERT_TRUE(file.Append(L"S_1", "value"));
  const std::string second = Describe(file.Load());
  const std::size_t secondEnd = file.Bytes().size();
  ASSERT_TRUE(file.Append(L"S_2", "value"));
  const std::string whole = file.Bytes();
  const std::string third = Describe(file.Load());
  const auto check = [&](const std::string& bytes, bool isDamaged, const std::string& before) {
    file.SetBytes(bytes);
    TCSInFileKey tree = file.Load();
    EXPECT_EQ(tree.GetErrorState() != orx::kRegistryOk, isDamaged);
    const std::string seen = Describe(tree);
    if (!isDamaged || seen != "(0)") {
      EXPECT_EQ(seen, before);
    }
    // What the index leads to may be whole where the rest is not.
    const std::string walked = file.Walked();
    const bool isRight = walked == seen || (isDamaged && (walked == third || seen == "(0)"));
    EXPECT_TRUE(isRight) << walked << " " << seen;
    RegistryFile::AddEntry(tree, L"S_9", "next");
    EXPECT_EQ(tree.Save(false, orx::kRegistryVersion), !isDamaged);
    EXPECT_EQ(file.Bytes() == bytes, isDamaged);
    EXPECT_EQ(Describe(file.Load()) == Describe(tree), !isDamaged);
  };
  for (std::size_t place = 0; place < whole.size() && !HasFailure(); ++place) {
    SCOPED_TRACE(place);
    const std::string& before = place < secondEnd ? first : second;
    check(whole.substr(0, place), place < firstEnd, before);
    std::string flipped = whole;
    flipped[place] = static_cast<char>(flipped[place] ^ 1 << place % 8);
    check(flipped, place < secondEnd, before);
  }
}

TEST(RegistryRecords, ThatLieAreDamage) {
  const velta_fuzz::Value good = Value(u"a", 1, 2, "xy");
  velta_fuzz::Content longName = ContentOf(Key(u"", {good, good}, {}));
  longName.shape[32 + 14 + 8] = '\x7F';
  velta_fuzz::Content half = ContentOf(Key(u"", {good}, {Key(u"k", {}, {})}));
  half.shape.pop_back();
  velta_fuzz::Content wrapping = ContentOf(Key(u"", {good}, {}));
  wrapping.shape.replace(0, 8, 8, '\xFF');
  velta_fuzz::Content noData = ContentOf(Key(u"", {good}, {}));
  noData.data.pop_back();
  velta_fuzz::Content more = ContentOf(Key(u"", {good}, {}));
  more.data += "x";
  const velta_fuzz::Key entry = Key(u"e", {good}, {});
  const velta_fuzz::Segment lonely = SegmentOf(ContentOf(Key(u"", {good}, {})), {entry});
  velta_fuzz::Segment shapeless = SegmentOf(Key(u"", {good}, {Key(u"c", {}, {entry})}));
  shapeless.pieces.erase(shapeless.pieces.begin() + 1);
  const std::pair<const char*, velta_fuzz::Segment> cases[] = {
      {"text without an end", SegmentOf(Key(u"", {good, Value(u"t", 5, 0, "ab")}, {}))},
      {"text of no bytes", SegmentOf(Key(u"", {good, Value(u"t", 5, 0, "")}, {}))},
      {"size and bytes disagree", SegmentOf(Key(u"", {good, Value(u"t", 1, 3, "ab")}, {}))},
      {"no type", SegmentOf(Key(u"", {good, Value(u"t", 0, 2, "ab")}, {}))},
      {"name beyond the end", SegmentOf(longName)},
      {"half a key", SegmentOf(half)},
      {"sizes that wrap around", SegmentOf(wrapping)},
      {"less data than the shape says", SegmentOf(noData)},
      {"more data than the shape says", SegmentOf(more)},
      {"no root", SegmentOf(velta_fuzz::Content{})},
      {"an entry and no key to be in", lonely},
      {"an entry without its shape", shapeless},
  };
  for (const auto& [what, segment] : cases) {
    const RegistryFile file;
    file.SetBytes(File({segment}));
    const TCSInFileKey tree = file.Load();
    const std::string seen = Describe(tree);
    EXPECT_EQ(tree.GetErrorState(), orx::kDamaged) << what;
    if (seen != "(0)") {
      EXPECT_TRUE(seen.starts_with("(0 a=1:1:xy")) << what << seen;
    }
  }
}

TEST(RegistryFormat, WhatIsNoRegistryFileSaysSo) {
  RegistryFile file;
  EXPECT_EQ(file.Load().GetErrorState(), orx::kCannotBeOpened);
  file.SetBytes(std::string(100'000, '\0'));
  EXPECT_EQ(file.Load().GetErrorState(), orx::kNotARegistryFile);
  file.SetBytes(File({}));
  EXPECT_EQ(file.Load().GetErrorState(), orx::kDamaged) << "a file comes with its first segment";
  file.path = file.directory.path();
  EXPECT_EQ(file.Load().GetErrorState(), orx::kCannotBeOpened) << "a directory";
}

TEST(RegistryFile, AValueWhoseDescriptionAndBytesDisagreeIsRefused) {
  TCSInFileKey tree = RegistryFile::New();
  orx::TGenericRegistryKey key = RootOf(tree);
  EXPECT_FALSE(key.AddValue(L"v", RawValue(), 1, true)) << "empty adaptor";
  EXPECT_FALSE(key.AddValue(L"v", RawValue(orx::kByteBlock, 4, "123"), 1, true));
  EXPECT_FALSE(key.AddValue(L"v", RawValue(orx::kWideString, 0, "ab"), 1, true)) << "no end";
  const std::wstring tooLong(70'000, L'n');
  EXPECT_FALSE(key.AddValue(tooLong, RawValue::Block("1"), 1, true));
  EXPECT_TRUE(orx::TGenericRegistryKey(key, tooLong, 0, true).IsNull());
  EXPECT_EQ(Describe(tree), "(0)");
}

TEST(RegistryFile, ASaveAppendsWhatIsNewAndNothingElse) {
  const RegistryFile file;
  file.Create(std::string(10'000, 'x'));
  const std::string before = file.Bytes();
  ASSERT_TRUE(file.Append(L"S_1", "second"));
  const std::string after = file.Bytes();
  EXPECT_TRUE(after.starts_with(before));
  EXPECT_LT(after.size() - before.size(), 300U);

  EXPECT_TRUE(file.Append(L"S_1", "second"));
  EXPECT_EQ(file.Bytes(), after) << "the same value again is no change";
  EXPECT_FALSE(file.Load().Save(false, 511)) << "no such registry version";
}

TEST(RegistryKey, OutlivesItsTreeAndFindsManySubKeysInTheirOrder) {
  const orx::TGenericRegistryKey key = RootOf(RegistryFile::New());
  std::vector<std::wstring> names;
  for (int i = 0; i < 300; ++i) Open(key, names.emplace_back(std::to_wstring(i * 7919 % 300)));
  orx::TGenRegKeyIterator walk(key);
  for (const std::wstring& name : names) {
    EXPECT_EQ(orx::TGenericRegistryKey(walk++).GetName(), name);
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
    const std::string name(1, letter);
    const std::string replacing(1000, letter);
    RegistryFile::AddEntry(one, orx::Widen(name), "1");
    RegistryFile::AddEntry(other, L"S_0", replacing);
    ASSERT_TRUE(one.Save(false, orx::kRegistryVersion));
    ASSERT_TRUE(other.Save(false, orx::kRegistryVersion));
    entries += " " + name + "(0 value=1:1:1)";
    EXPECT_EQ(Describe(file.Load()),
              "(0 container(0 S_0(0 value=1:1:" + replacing + ")" + entries + "))");
    EXPECT_LT(file.Bytes().size(), 6000U) << "half of it is superseded at most";
  }
}

TEST(RegistryFile, ANewFileNeverReplacesOne) {
  const RegistryFile file;
  file.Create();
  EXPECT_FALSE(RegistryFile::New().Save(file.Name(), false, orx::kRegistryVersion));
  EXPECT_FALSE(TCSInFileKey(file.Name(), nullptr, nullptr, false, orx::kRegistryFlags)
                   .Save(false, orx::kRegistryVersion));
  EXPECT_EQ(Describe(file.Load()), "(0 container(0 S_0(0 value=1:1:first)))");
  EXPECT_EQ(std::distance(std::filesystem::directory_iterator(file.directory.path()), {}), 1)
      << "nothing is left beside it";
}

TEST(RegistryFile, IsMadeBesideWhatIsInItsWay) {
  namespace fs = std::filesystem;
  const RegistryFile file;
  const fs::path beside = file.directory / "tree.dff.new";
  WriteBytes(beside, "what a stopped process left");
  file.Create();
  EXPECT_EQ(Describe(file.Load()), "(0 container(0 S_0(0 value=1:1:first)))");
  EXPECT_FALSE(fs::exists(beside)) << "it is gone";
  fs::remove(file.path);
  fs::create_directory(beside);
  file.Create("second");
  EXPECT_EQ(Describe(file.Load()), "(0 container(0 S_0(0 value=1:1:second)))");
  EXPECT_TRUE(fs::is_directory(beside)) << "it is somebody else's";
}

#ifdef _WIN32
TEST(RegistryFile, ThatWasMovedAsideToBeReplacedIsPutBack) {
  const RegistryFile file;
  file.Create();
  std::filesystem::rename(file.path, file.directory / "tree.dff.replaced");
  EXPECT_FALSE(RegistryFile::New().Save(file.Name(), false, orx::kRegistryVersion))
      << "it is there";
  EXPECT_TRUE(std::filesystem::exists(file.path));
  std::filesystem::rename(file.path, file.directory / "tree.dff.replaced");
  EXPECT_EQ(Describe(file.Load()), "(0 container(0 S_0(0 value=1:1:first)))");
}
#endif

TEST(RegistryFile, ALostFileIsNotASuccess) {
  const RegistryFile file;
  TCSInFileKey tree(file.Name(), nullptr, nullptr, false, orx::kRegistryFlags);
  EXPECT_TRUE(tree.Save(false, orx::kRegistryVersion)) << "a new tree makes its file";
  EXPECT_TRUE(tree.Save(false, orx::kRegistryVersion)) << "and then goes on with it";
  std::filesystem::remove(file.path);
  EXPECT_FALSE(tree.Save(false, orx::kRegistryVersion))
      << "nothing to write, but nothing is safe either";
  RegistryFile::AddEntry(tree, L"S_1", "new");
  EXPECT_FALSE(tree.Save(false, orx::kRegistryVersion));
  file.Create();
  EXPECT_TRUE(tree.Save(false, orx::kRegistryVersion))
      << "what a failed save left is kept for another try";
  EXPECT_NE(Describe(file.Load()).find("S_1"), std::string::npos);
}

TEST(RegistryFile, ThatWasPutInThePlaceOfAnotherGetsWhatIsSavedWhereItBelongs) {
  const RegistryFile file;
  file.Create();
  const std::string old = file.Bytes();
  const auto save = [&](orx::TInFileKey& other) {
    file.SetBytes(old);
    TCSInFileKey tree = file.Load();
    Open(RootOf(tree), L"second").AddValue(L"value", RawValue::Block("x"), 1, true);
    RegistryFile::AddEntry(tree, L"S_1", "saved");
    std::filesystem::remove(file.path);
    EXPECT_TRUE(other.Save(file.Name(), false, orx::kRegistryVersion));
    EXPECT_TRUE(tree.Save(false, orx::kRegistryVersion));
    return Describe(file.Load());
  };
  const std::string saved = "second(0 value=1:1:x) container(0 S_1(0 value=1:1:saved))";
  TCSInFileKey empty = RegistryFile::New();
  EXPECT_EQ(save(empty), "(0 " + saved + ")");
  TCSInFileKey other = RegistryFile::New();
  Open(Open(RootOf(other), L"first"), L"S_1");
  EXPECT_EQ(save(other), "(0 first(0 S_1(0)) " + saved + ")");
}

TEST(RegistryFile, IsNotIndexedByAreasThatItsHeaderCannotHold) {
  TCSInFileKey tree = RegistryFile::New();
  const orx::EntryArea area{u"key", u"value", 32, {}, false};
  EXPECT_TRUE(tree.IndexBy({area, area}));
  EXPECT_FALSE(tree.IndexBy({area, area, area}));
  EXPECT_FALSE(tree.IndexBy({{u"key", u"value", 24, {}, false}})) << "less than four doubles";
  EXPECT_FALSE(tree.IndexBy({{std::u16string(3000, u'k'), u"value", 32, {}, false}}));
}

TEST(RegistryKey, IsCopiedAsItIsAlsoIntoItself) {
  const TCSInFileKey tree = RegistryFile::New();
  const TCSInFileKey other = RegistryFile::New();
  RegistryFile::AddEntry(tree, L"S_1", "first");
  orx::TGenericRegistryKey(RootOf(other), L"key", 3, true)
      .AddValue(L"value", RawValue::Block("never saved"), 1, true);
  RootOf(tree).DeepCopy(RootOf(other));
  const std::string content = "(0 container(0 S_1(0 value=1:1:first)) key(3 value=1:1:never saved)";
  Open(RootOf(tree), L"inside").DeepCopy(RootOf(tree));
  EXPECT_TRUE(Describe(Open(RootOf(tree), L"inside")).starts_with(content));
  EXPECT_TRUE(Describe(tree).starts_with(content + " inside"));
}

TEST(RegistryKey, ACopyOutlivesItsFileAndIsSavedWithWhatWasChangedInIt) {
  const RegistryFile source;
  const RegistryFile target;
  target.Create();
  const velta_fuzz::Key lie = Key(u"lie", {Value(u"a", 1, 1, "x"), Value(u"b", 0, 1, "y")}, {});
  const velta_fuzz::Key entry = Key(u"S_0", {Value(u"value", 1, 1, "x")}, {}, 7);
  source.SetBytes(File({SegmentOf(Key(u"", {}, {Key(u"container", {}, {lie, entry})}))}));
  TCSInFileKey tree = target.Load();
  {
    const TCSInFileKey other = source.Load();
    const orx::TGenericRegistryKey from = Open(RootOf(other), L"container");
    for (const std::wstring name : {L"lie", L"S_0", L"S_1"}) {
      const std::wstring copied = name == L"lie" ? name : L"S_0";
      Open(Open(RootOf(tree), L"container"), name).DeepCopy(Open(from, copied));
    }
    EXPECT_EQ(other.GetErrorState(), orx::kDamaged);
  }
  source.SetBytes("");
  Open(Open(RootOf(tree), L"container"), L"S_1")
      .AddValue(L"value", RawValue::Block("changed"), 1, true);
  RegistryFile::AddEntry(tree, L"S_2", "new");
  const std::string content = Describe(tree);
  EXPECT_NE(content.find(" lie(0 a=1:1:x) S_1(0 value=1:1:changed)"), std::string::npos) << content;
  EXPECT_TRUE(tree.Save(false, orx::kRegistryVersion));
  EXPECT_EQ(Describe(target.Load()), content);
}

}  // namespace
}  // namespace velta_test
