// Files that were cut, altered or made up. The writer here follows docs/gff-format.md and shares no
// code with the library.

#include <gtest/gtest.h>

#include <cstring>

#include "registry_fixture.h"

#define XXH_INLINE_ALL
#include <xxhash.h>

namespace velta_test {
namespace {

using namespace std::string_view_literals;
using orx::TCSInFileKey;

template <class Integer>
std::string Int(Integer value) {
  std::string bytes(sizeof value, '\0');
  std::memcpy(bytes.data(), &value, sizeof value);
  return bytes;
}

std::string Checksum(const std::string& bytes, std::uint64_t seed = 0) {
  return Int(XXH3_64bits_withSeed(bytes.data(), bytes.size(), seed));
}

std::string Key(const std::u16string& name, const std::string& values, const std::string& keys,
                std::uint16_t dimension = 0) {
  return Int(values.size()) + Int(keys.size()) + Int(static_cast<std::uint16_t>(name.size())) +
         Int(dimension) + Units(name) + values + keys;
}

std::string Value(const std::u16string& name, int type, std::uint32_t elementSize,
                  const std::string& data, char dimension = 1) {
  return Int(static_cast<std::uint32_t>(data.size())) + Int(elementSize) +
         Int(static_cast<std::uint16_t>(name.size())) + static_cast<char>(type) + dimension +
         Units(name) + data;
}

/// A file of these trees, one a segment.
std::string File(const std::vector<std::string>& trees) {
  std::string file = "\x89ORX\r\n\x1A\n" + Int(512U) + Int(4U) + Units(u"ab");
  file += Checksum(file);
  for (const std::string& tree : trees) {
    const std::string header =
        "SEG1" + Int(0U) + Int(tree.size()) + Int(std::uint64_t{0}) + Checksum(tree);
    file += header + Checksum(header, file.size()) + tree;
  }
  return file;
}

TEST(RegistryFormat, IsReadAndWrittenAsDocumented) {
  const RegistryFile file;
  const std::string a = Value(u"a", 1, 2, "xy");
  const std::string text = Value(u"t", 5, 0, Units(u"S\u00FC! \U0001F4CD\0"sv));
  const std::string replaced = Value(u"a", 2, 1, "z", 2);
  file.SetBytes(File({Key(u"", a, Key(u"Z\u00FC", text, "", 7)),
                      Key(u"", replaced, Key(u"l", "", "") + Key(u"Z\u00FC", a, "", 9))}));
  TCSInFileKey tree = file.Load();
  EXPECT_EQ(tree.GetErrorState(), orx::kRegistryOk);
  EXPECT_EQ(Describe(tree), "(0 a=2:2:z Z\xFC(7 t=5:1:S\xFC! ? a=1:1:xy) l(0))");
  const orx::TGenericRegistryKey key = Open(RootOf(tree), L"Z\u00FC");
  EXPECT_EQ(orx::GetRegValue<std::wstring>(key, L"t", L"", 0), L"S\u00FC! \U0001F4CD");
  EXPECT_EQ(orx::GetRegValue<std::wstring>(key, L"a", L"no text", 0), L"no text");
  EXPECT_EQ(key.GetValueSize(L"t"), 14U) << "4 characters, a pair of surrogates, the end";
  EXPECT_FALSE(key.HasValue(L"T")) << "names are exact";

  std::filesystem::remove(file.path);
  EXPECT_TRUE(tree.Save(file.Name(), false, 512));
  EXPECT_EQ(file.Bytes(),
            File({Key(u"", replaced, Key(u"Z\u00FC", text + a, "", 7) + Key(u"l", "", ""))}));
}

TEST(RegistryDamage, AtAnyPlaceIsDamageOrASaveThatNeverFinished) {
  const RegistryFile file;
  file.Create();
  std::vector<std::size_t> ends;
  std::vector<std::string> trees;
  for (const wchar_t* const entry : {L"S_1", L"S_2"}) {
    ends.push_back(file.Bytes().size());
    trees.push_back(Describe(file.Load()));
    ASSERT_TRUE(file.Append(entry, "value"));
  }
  const std::string whole = file.Bytes();
  const auto check = [&](const std::string& bytes, bool isDamaged, const std::string& before) {
    file.SetBytes(bytes);
    TCSInFileKey tree = file.Load();
    EXPECT_EQ(tree.GetErrorState() != orx::kRegistryOk, isDamaged);
    const std::string seen = Describe(tree);
    EXPECT_TRUE(seen == before || (isDamaged && seen == "(0)")) << seen;
    RegistryFile::AddEntry(tree, L"S_9", "next");
    EXPECT_EQ(tree.Save(false, 512), !isDamaged);
    EXPECT_EQ(file.Bytes() == bytes, isDamaged);
    EXPECT_EQ(Describe(file.Load()) == Describe(tree), !isDamaged);
  };
  for (std::size_t place = 0; place < whole.size() && !HasFailure(); ++place) {
    SCOPED_TRACE(place);
    const bool inLast = place >= ends[1];
    check(whole.substr(0, place), place < ends[0], trees[inLast ? 1 : 0]);
    std::string flipped = whole;
    flipped[place] = static_cast<char>(flipped[place] ^ 1 << place % 8);
    check(flipped, !inLast, trees[inLast ? 1 : 0]);
  }
}

TEST(RegistryRecords, ThatLieAreDamage) {
  const std::string good = Value(u"a", 1, 2, "xy");
  std::string deep;
  for (int i = 0; i < 100; ++i) deep = Key(u"d", "", deep);
  std::string longName = good;
  longName[8] = '\x7F';
  const std::pair<const char*, std::string> cases[] = {
      {"text without an end", Key(u"", good + Value(u"t", 5, 0, "ab"), "")},
      {"text of no bytes", Key(u"", good + Value(u"t", 5, 0, ""), "")},
      {"size and bytes disagree", Key(u"", good + Value(u"t", 1, 3, "ab"), "")},
      {"no type", Key(u"", good + Value(u"t", 0, 2, "ab"), "")},
      {"name beyond the end", Key(u"", good + longName, "")},
      {"half a value", Key(u"", good + good.substr(0, 13), "")},
      {"half a key", Key(u"", good, Key(u"k", "", "").substr(0, 21))},
      {"nested too deep", Key(u"", good, deep)},
      {"sizes that wrap around", Int(~std::uint64_t{0}) + Int(std::uint64_t{1}) + Int(0U)},
      {"bytes behind the root", Key(u"", good, "") + "x"},
      {"no root", ""},
  };
  for (const auto& [what, bytes] : cases) {
    const RegistryFile file;
    file.SetBytes(File({bytes}));
    const TCSInFileKey tree = file.Load();
    const std::string seen = Describe(tree);
    EXPECT_EQ(tree.GetErrorState(), orx::kDamaged) << what;
    EXPECT_TRUE(seen == "(0)" || seen.starts_with("(0 a=1:1:xy")) << what << seen;
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

}  // namespace
}  // namespace velta_test
