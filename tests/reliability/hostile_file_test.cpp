// Files that are large, or large inside, for no good reason: bounded time and memory, and a clear
// answer. The bounds are some times what is needed and far below what hurts.

#include <gtest/gtest.h>

#ifndef _WIN32
#include <malloc.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>
#endif

#include <cmath>
#include <functional>

#include "fleet.h"
#include "fuzz/record_tree.h"
#include "platform/registry_fixture.h"
#include "velta/rtcm_generator.h"

namespace velta_test {
namespace {

using velta_fuzz::Key;

constexpr unsigned kMaxSeconds = 60;
constexpr double kMaxExtraMemory = 16e6;  // bytes
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
constexpr bool kMemoryIsOurs = false;
#else
constexpr bool kMemoryIsOurs = true;
#endif

std::string FileOf(const velta_fuzz::Segment& segment) {
  return velta_fuzz::PutTogether({{}, {}, 64, {segment}});
}

/// A container of so many keys with so many values each, the names of both by their number.
std::string Keys(int count, int values, const std::function<std::string(int)>& name) {
  Key container;
  for (int i = 0; i < count; ++i) {
    Key& key = container.keys.emplace_back(Key{0, name(i), {}, {}});
    for (int j = 0; j < values; ++j) key.values.push_back({1, 1, 1, name(j), "x"});
  }
  return FileOf(SegmentOf(Key{0, "", {}, {container}}));
}
std::string Number(int i) { return {reinterpret_cast<const char*>(&i), sizeof i}; }
std::string Unit(int i) { return Number(i).substr(0, 2); }
std::string Same(int) { return "same"; }
std::string Long(int i) { return std::string(0x1FFFE, static_cast<char>(i)); }

std::string Nested(std::uint64_t depth) {
  velta_fuzz::Content tree;
  while (depth-- > 0) {
    velta_fuzz::Append(tree.shape, std::uint64_t{0});
    velta_fuzz::Append(tree.shape, depth * 36);
    tree.shape.append(depth > 0 ? 20 : 16, '\0');
  }
  return FileOf(velta_fuzz::SegmentOf(tree));
}
/// A key with a value; of one of the two the sizes are the largest there are.
std::string Lying(std::size_t place, std::size_t bytes) {
  velta_fuzz::Content tree = ContentOf(Key{0, "", {{1, 1, 1, "", "x"}}, {}});
  tree.shape.replace(place, bytes, bytes, '\xFF');
  return FileOf(velta_fuzz::SegmentOf(tree));
}

const struct Hostile {
  const char* what;
  std::function<std::string()> bytes;
  std::uintmax_t zeros;  ///< behind the bytes
  orx::RegistryError answer;
  double memory;  ///< at most so many times the file's size, and kMaxExtraMemory
} kFiles[] = {
    {"Zeros", [] { return ""; }, 1U << 30, orx::kNotARegistryFile, 0},
    {"ZerosBehindASegment", [] { return Nested(1); }, 1U << 28, orx::kRegistryOk, 1},
    {"EmptyKeys", [] { return Keys(1'000'000, 0, Number); }, 0, orx::kRegistryOk, 12},
    {"KeysOfOneName", [] { return Keys(1'000'000, 0, Same); }, 0, orx::kRegistryOk, 4},
    {"Values", [] { return Keys(1, 300'000, Number); }, 0, orx::kRegistryOk, 12},
    {"ValuesOfOneName", [] { return Keys(300, 1000, Same); }, 0, orx::kRegistryOk, 4},
    {"EveryUnitAsAName", [] { return Keys(0x10000, 1, Unit); }, 0, orx::kRegistryOk, 12},
    {"LongestNames", [] { return Keys(100, 1, Long); }, 0, orx::kRegistryOk, 4},
    {"DeepNesting", [] { return Nested(100'000); }, 0, orx::kDamaged, 4},
    {"FourGigabytesInAValue", [] { return Lying(32, 8); }, 0, orx::kDamaged, 0},
    {"ExabytesInAKey", [] { return Lying(0, 31); }, 0, orx::kDamaged, 0},
};

/// Asks for everything and looks at everything.
void Look(const RegistryFile& file, orx::RegistryError answer) {
  const orx::cs::velta::RTCMGenerator generator(1, file.Name(), file.Name());
  EXPECT_TRUE(generator.getAllDatums().empty());
  EXPECT_FALSE(generator.getRtcmDatumMessage(0.9, 0.15, 0));
  EXPECT_FALSE(generator.get1023(0.9, 0.15, 0));
  EXPECT_FALSE(generator.get1024(5e6, 3e6, 0));
  EXPECT_FALSE(generator.getRtcmProjMessage());
  orx::TCSInFileKey tree = file.Load();
  Describe(tree);
  EXPECT_EQ(tree.GetErrorState(), answer);
  RegistryFile::AddEntry(tree, L"S_1", "next");
  EXPECT_EQ(tree.Save(false, orx::kRegistryVersion), answer == orx::kRegistryOk);
}

/// Does something in a process of its own, and fails when that does.
/// \return its peak memory in bytes; on Windows 0: it is done here and not measured
double PeakMemory(const std::function<void()>& work) {
#ifdef _WIN32
  work();
  return 0;
#else
  malloc_trim(0);
  const pid_t child = fork();
  if (child == 0) {
    alarm(kMaxSeconds);
    work();
    _exit(testing::Test::HasFailure() ? 1 : 0);
  }
  int status = 0;
  rusage used = {};
  wait4(child, &status, 0, &used);
  EXPECT_TRUE(WIFEXITED(status)) << "a hang, or a crash";
  EXPECT_EQ(WEXITSTATUS(status), 0);
  return 1024.0 * static_cast<double>(used.ru_maxrss);
#endif
}

class HostileFile : public testing::TestWithParam<Hostile> {};

TEST_P(HostileFile, IsAnsweredInBoundedTimeAndMemory) {
  const auto& [what, bytes, zeros, answer, memory] = GetParam();
  const RegistryFile file;
  file.SetBytes(bytes());
  const auto size = std::max(std::filesystem::file_size(file.path), zeros);
  std::filesystem::resize_file(file.path, size);
  const double idle = PeakMemory([] {});
  const double used = PeakMemory([&, right = answer] { Look(file, right); }) - idle;
  const auto allowed = memory * static_cast<double>(size) + kMaxExtraMemory;
  if (kMemoryIsOurs) {
    EXPECT_LT(used, allowed) << "bytes";
  }
}

/// A file whose index leads to entries each of which has a shape of its own, as large as it may be:
/// a shape ends where its entry begins, so each contains those behind it and the entries up to its
/// own.
class NestedShapes {
 public:
  explicit NestedShapes(std::size_t entries) {
    velta_fuzz::File start{{}, AreasOfDatums(), 1024, {SegmentOf(Key{0, "", {}, {{}}})}};
    start.segments[0].pieces.resize(1);
    bytes_ = PutTogether(start);
    const std::uint64_t segmentAt = velta_fuzz::TakeApart(bytes_).segments[0].at;
    const std::uint64_t shapes = bytes_.size();
    bytes_.append(entries * kShape, '\0');
    std::vector<std::uint64_t> places;
    for (std::size_t i = 0; i < entries; ++i) {
      places.push_back(AddPiece(velta_fuzz::EntryOf(shapes + i * kShape, kEntry)));
    }
    for (std::size_t i = entries; i-- > 0;) PutShape(shapes + i * kShape, places[i]);
    const std::uint64_t root = AddNode(places);
    velta_fuzz::Piece trailer{velta_fuzz::kTrailer, {}, 0};
    for (const std::uint64_t place : {segmentAt, root, bytes_.size() + 40}) {
      velta_fuzz::Append(trailer.content, place);
    }
    AddPiece(trailer);
  }

  const std::string& bytes() const { return bytes_; }

 private:
  static std::string AreasOfDatums() {
    const TemporaryDirectory directory;
    Fleet fleet((directory / "").wstring());
    fleet.Ingest(0);
    return velta_fuzz::TakeApart(ReadBytes(fleet.datums)).areas;
  }

  std::uint64_t AddPiece(const velta_fuzz::Piece& piece) {
    const std::uint64_t at = bytes_.size();
    std::string checked;
    velta_fuzz::Append(checked, std::uint64_t{piece.content.size()} << 8 | piece.kind);
    checked += piece.content;
    velta_fuzz::Append(bytes_, velta_fuzz::Checksum(checked, at));
    bytes_ += checked;
    return at;
  }

  /// A shape like that of the entries, but for one more sub-key that takes the rest.
  void PutShape(std::uint64_t at, std::uint64_t end) {
    std::string start;
    velta_fuzz::Append(start, (end - at - 16) << 8 | velta_fuzz::kShape);
    for (const std::uint64_t size : {std::uint64_t{0}, end - at - 48, std::uint64_t{0}}) {
      velta_fuzz::Append(start, size);
    }
    velta_fuzz::Append(start, std::uint64_t{kArea.size()});
    start += velta_fuzz::HeadOf(kEntry.keys[0]) + ContentOf(kEntry.keys[0]).shape;
    bytes_.replace(at + 8, start.size(), start);
    std::string checksum;
    const std::string_view checked = std::string_view(bytes_).substr(at + 8, end - at - 8);
    velta_fuzz::Append(checksum, velta_fuzz::Checksum(checked, at));
    bytes_.replace(at, checksum.size(), checksum);
  }

  std::uint64_t AddNode(const std::vector<std::uint64_t>& places) {
    constexpr float kAll[] = {-INFINITY, -INFINITY, INFINITY, INFINITY};
    velta_fuzz::Piece node{velta_fuzz::kNode, {}, 0};
    velta_fuzz::Append(node.content, std::uint32_t{0});
    velta_fuzz::Append(node.content, static_cast<std::uint32_t>(places.size()));
    for (const std::uint64_t place : places) {
      velta_fuzz::Append(node.content, place);
      for (int area = 0; area < 2; ++area) {
        for (const float edge : kAll) velta_fuzz::Append(node.content, edge);
      }
    }
    return AddPiece(node);
  }

  static std::string Area() {
    std::string area;
    for (const double number : {50.0, 1.0, 50.0, 1.0}) velta_fuzz::Append(area, number);
    return area;
  }

  static inline const std::string kArea = Area();  ///< that holds no position
  static inline const Key kEntry{
      0,
      Units(u"e"),
      {},
      {{0, Units(u"StandardDatum"), {{32, 1, 1, Units(u"BoundariesStandardDatum"), kArea}}, {}}}};
  static inline const std::size_t kShape =
      48 + velta_fuzz::HeadOf(kEntry.keys[0]).size() + ContentOf(kEntry.keys[0]).shape.size();

  std::string bytes_;
};

TEST(HostileIndex, OfShapesInOneAnotherTakesMemoryByTheFilesSize) {
  const RegistryFile file;
  file.SetBytes(NestedShapes(1024).bytes());
  const auto query = [&] {
    const orx::cs::velta::RTCMGenerator generator(1, file.Name(), file.Name());
    EXPECT_FALSE(generator.getRtcmDatumMessage(0.9, 0.15, 0));
  };
  const double idle = PeakMemory([] {});
  const double used = PeakMemory(query) - idle;
  if (kMemoryIsOurs) {
    EXPECT_LT(used, kMaxExtraMemory) << "bytes";
  }
}

TEST(HostileMerge, OfManyValuesThatAreReplacedTakesTimeByTheirNumber) {
  const auto make = [](const char* value) {
    Key key{0, Units(u"many"), {}, {}};
    for (int i = 0; i < 1'000'000; ++i) key.values.push_back({1, 1, 1, Number(i), value});
    return FileOf(SegmentOf(Key{0, "", {}, {key}}));
  };
  const RegistryFile target;
  const RegistryFile source;
  target.SetBytes(make("a"));
  source.SetBytes(make("b"));
  orx::TCSInFileKey tree = target.Load();
  Open(RootOf(tree), L"many").DeepCopy(Open(RootOf(source.Load()), L"many"));
  EXPECT_TRUE(tree.Save(false, orx::kRegistryVersion));
  const orx::TGenericRegistryKey many = Open(RootOf(target.Load()), L"many");
  RawValue last;
  EXPECT_TRUE(many.GetValue(many.GetValueNames().back(), last, 0, true));
  EXPECT_EQ(last.bytes(), "b");
}

INSTANTIATE_TEST_SUITE_P(With, HostileFile, testing::ValuesIn(kFiles),
                         [](const auto& test) { return test.param.what; });

}  // namespace
}  // namespace velta_test
