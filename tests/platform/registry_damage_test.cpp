// Files that were cut, altered or made up. The writer here follows docs/gff-format.md and shares no
// code with the library.

#include <gtest/gtest.h>

#include <cstring>

#include "registry_fixture.h"

#define XXH_INLINE_ALL
#include <xxhash.h>

namespace velta_test {
namespace {

using orx::TCSInFileKey;

template <class Integer>
std::string Int(Integer value) {
  std::string bytes(sizeof value, '\0');
  std::memcpy(bytes.data(), &value, sizeof value);
  return bytes;
}

std::string Units(const std::u16string& text) {
  return {reinterpret_cast<const char*>(text.data()), text.size() * 2};
}

std::string Checksum(const std::string& bytes, std::uint64_t seed = 0) {
  return Int(std::uint64_t{XXH3_64bits_withSeed(bytes.data(), bytes.size(), seed)});
}

std::string Header() {
  const std::string bytes = "\x89ORX\r\n\x1A\n" + Int(512U) + Int(4U) + Units(u"ab");
  return bytes + Checksum(bytes);
}

std::string Segment(std::size_t at, const std::string& tree) {
  const std::string header =
      "SEG1" + Int(0U) + Int(std::uint64_t{tree.size()}) + Int(std::uint64_t{0}) + Checksum(tree);
  return header + Checksum(header, at) + tree;
}

std::string Key(const std::u16string& name, const std::string& values, const std::string& keys) {
  return Int(std::uint64_t{values.size()}) + Int(std::uint64_t{keys.size()}) +
         Int(static_cast<std::uint16_t>(name.size())) + Int(std::uint16_t{0}) + Units(name) +
         values + keys;
}

std::string Value(const std::u16string& name, int type, std::uint32_t elementSize,
                  const std::string& data) {
  return Int(static_cast<std::uint32_t>(data.size())) + Int(elementSize) +
         Int(static_cast<std::uint16_t>(name.size())) + static_cast<char>(type) + '\1' +
         Units(name) + data;
}

/// A file that holds these trees, one a segment.
void Write(const RegistryFile& file, const std::vector<std::string>& trees) {
  std::string bytes = Header();
  for (const std::string& tree : trees) bytes += Segment(bytes.size(), tree);
  file.SetBytes(bytes);
}

TEST(RegistryFormat, IsAsDocumented) {
  const RegistryFile file;
  const std::string a = Value(u"a", 1, 2, "xy");
  const std::string text = Value(u"t", 5, 0, Units(u"hi") + std::string(2, '\0'));
  Write(file, {Key(u"", a, Key(u"k", text, "")),
               Key(u"", Value(u"a", 2, 1, "z"), Key(u"l", "", "") + Key(u"k", a, ""))});
  const TCSInFileKey tree = file.Load();
  EXPECT_EQ(tree.GetErrorState(), orx::kRegistryOk);
  EXPECT_EQ(Describe(tree), "(0 a=2:1:z k(0 t=5:1:hi a=1:1:xy) l(0))");
}

TEST(RegistryDamage, CutAnywhereGivesAPrefixOfTheSavesOrAnError) {
  const RegistryFile file;
  file.Create();
  std::vector<std::pair<std::size_t, std::string>> saves;  // where each ends, what it holds
  const auto note = [&] { saves.emplace_back(file.Bytes().size(), Describe(file.Load())); };
  note();
  for (const wchar_t* const entry : {L"S_1", L"S_2", L"S_3"}) {
    ASSERT_TRUE(file.Append(entry, "value"));
    note();
  }
  const std::string whole = file.Bytes();
  for (std::size_t length = 0; length < whole.size(); ++length) {
    file.SetBytes(whole.substr(0, length));
    TCSInFileKey tree = file.Load();
    if (length < saves.front().first) {
      EXPECT_NE(tree.GetErrorState(), orx::kRegistryOk) << length;
      continue;
    }
    const auto last =
        std::find_if(saves.rbegin(), saves.rend(), [&](auto& s) { return s.first <= length; });
    ASSERT_EQ(Describe(tree), last->second) << length;
    // The next save takes the place of the one that never finished.
    RegistryFile::AddEntry(tree, L"S_9", "next");
    ASSERT_TRUE(tree.Save(false, 512)) << length;
    ASSERT_EQ(Describe(file.Load()), Describe(tree)) << length;
  }
}

TEST(RegistryDamage, AFlippedBitIsNeverTakenForContent) {
  const RegistryFile file;
  file.Create();
  const std::string first = Describe(file.Load());
  ASSERT_TRUE(file.Append(L"S_1", "value"));
  const std::size_t second = file.Bytes().size();
  const std::string two = Describe(file.Load());
  ASSERT_TRUE(file.Append(L"S_2", "value"));
  const std::string whole = file.Bytes();
  for (std::size_t place = 0; place < whole.size(); ++place) {
    for (const int bit : {0, 3, 7}) {
      std::string bytes = whole;
      bytes[place] = static_cast<char>(bytes[place] ^ (1 << bit));
      file.SetBytes(bytes);
      TCSInFileKey tree = file.Load();
      if (place >= second) {
        ASSERT_EQ(Describe(tree), two) << "the last save never finished, " << place;
        continue;
      }
      ASSERT_NE(tree.GetErrorState(), orx::kRegistryOk) << place;
      const std::string seen = Describe(tree);
      ASSERT_TRUE(seen == "(0)" || seen == first) << place << " " << seen;
      RegistryFile::AddEntry(tree, L"S_9", "next");
      ASSERT_FALSE(tree.Save(false, 512)) << place;
      ASSERT_EQ(file.Bytes(), bytes) << "a damaged file is left as it is";
    }
  }
}

TEST(RegistryDamage, RecordsThatLieAreDamage) {
  const std::string good = Value(u"a", 1, 2, "xy");
  std::string deep;
  for (int i = 0; i < 100; ++i) deep = Key(u"d", "", deep);
  const std::string huge = Int(~std::uint64_t{0}) + Int(std::uint64_t{2}) + Int(0U);
  std::string longName = good;
  longName[8] = '\x7F';
  const struct {
    const char* what;
    std::string tree;
  } cases[] = {
      {"text without an end", Key(u"", good + Value(u"t", 5, 0, "ab"), "")},
      {"text of no bytes", Key(u"", good + Value(u"t", 5, 0, ""), "")},
      {"size and bytes disagree", Key(u"", good + Value(u"t", 1, 3, "ab"), "")},
      {"no type", Key(u"", good + Value(u"t", 0, 2, "ab"), "")},
      {"name beyond the end", Key(u"", good + longName, "")},
      {"half a value", Key(u"", good + good.substr(0, 13), "")},
      {"half a key", Key(u"", good, Key(u"k", "", "").substr(0, 21))},
      {"nested too deep", Key(u"", good, deep)},
      {"sizes that wrap around", huge},
      {"bytes behind the root", Key(u"", good, "") + "x"},
      {"no root", ""},
  };
  for (const auto& test : cases) {
    const RegistryFile file;
    Write(file, {test.tree});
    TCSInFileKey tree = file.Load();
    const std::string seen = Describe(tree);
    EXPECT_EQ(tree.GetErrorState(), orx::kDamaged) << test.what;
    EXPECT_TRUE(seen == "(0)" || seen.substr(0, 11) == "(0 a=1:1:xy") << test.what << seen;
    EXPECT_FALSE(tree.Save(false, 512)) << test.what;
  }
}

TEST(RegistryDamage, WhatIsNoRegistryFileSaysSo) {
  const RegistryFile file;
  EXPECT_EQ(file.Load().GetErrorState(), orx::kCannotBeOpened);
  const TCSInFileKey directory(file.directory.path().wstring(), nullptr, nullptr, true, 97);
  EXPECT_EQ(directory.GetErrorState(), orx::kCannotBeOpened);
  for (const std::string& bytes : {std::string(), std::string("text"), std::string(100'000, '\0'),
                                   std::string("\x89ORX\r\n\x1A\n"), Header().substr(0, 20)}) {
    file.SetBytes(bytes);
    const TCSInFileKey tree = file.Load();
    EXPECT_EQ(tree.GetErrorState(), orx::kNotARegistryFile);
    EXPECT_EQ(Describe(tree), "(0)");
  }
  file.SetBytes(Header());
  EXPECT_EQ(file.Load().GetErrorState(), orx::kDamaged) << "a file comes with its first segment";
}

}  // namespace
}  // namespace velta_test
