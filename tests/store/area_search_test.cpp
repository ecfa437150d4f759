// What a query finds through the index of a file is what a walk over all entries finds, whatever
// they are and however they came into the file.

#include "store/area_search.h"

#include <gtest/gtest.h>

#include <cmath>
#include <functional>
#include <numbers>
#include <random>

#include "fuzz/record_tree.h"
#include "store/gff_layout.h"
#include "store/registry_tree.h"
#include "store/residual_grid.h"
#include "support/file_bytes.h"
#include "support/query_outcomes.h"
#include "support/temporary_directory.h"
#include "velta/rtcm_data_support.h"

namespace velta_test {
namespace {

using namespace orx::cs::velta;
using orx::TGenericRegistryKey;

constexpr double kPi = std::numbers::pi;

/// Makes files of entries that are for random areas, some of them odd, some of them broken.
class RandomFile {
 public:
  explicit RandomFile(unsigned seed) : random_(seed) {}

  /// Makes the file, with nodes of a few items.
  void Create() {
    orx::TInFileKey tree(L"", kTreeDescription, nullptr, false, orx::kRegistryFlags);
    tree.IndexBy(IsOneIn(2) ? DatumAreas() : ProjectionAreas());
    AddEntries(tree, 1);
    AddText(Container(tree), layout::kContainerDatum, L"target");
    ASSERT_TRUE(tree.Save(Name(), false, orx::kRegistryVersion));
    SetBytes(velta_fuzz::WithFanOut(2 + Below(3), Bytes()));
  }

  /// Saves some entries more, or now and then something that is more than entries.
  void Grow() {
    orx::TInFileKey tree(Name(), nullptr, nullptr, true, orx::kRegistryFlags);
    AddEntries(tree, 1 + Below(3));
    if (IsOneIn(40)) AddText(Container(tree), layout::kContainerDatum, L"renamed");
    if (IsOneIn(40)) Open(RootOf(tree), L"other container");
    if (IsOneIn(40)) FillEntry(Open(Container(tree), L"S_0"));
    ASSERT_TRUE(tree.Save(false, orx::kRegistryVersion));
  }

  /// Merges another file, which has some of the names.
  void Merge() {
    const std::wstring source = (directory_ / "other.dff").wstring();
    orx::TInFileKey tree(L"", kTreeDescription, nullptr, false, orx::kRegistryFlags);
    if (IsOneIn(2)) nextEntry_ -= std::min(nextEntry_, 2U);
    AddEntries(tree, 1 + Below(10));
    ASSERT_TRUE(tree.Save(source, false, orx::kRegistryVersion));
    ASSERT_EQ(RTCMDataSupport::MergeRTCMDatumfiles(Name(), source), 0);
    std::filesystem::remove(source);
  }

  /// Where to look: on edges, whole turns away, anywhere, nowhere.
  std::vector<Position> Positions() {
    std::vector<Position> positions{{NAN, 0.1}, {INFINITY, 0.1}, {0.5, 1e17}};
    for (int i = 0; i < 30; ++i) positions.push_back({Any(norths_), Any(easts_)});
    return positions;
  }

  /// Bytes one bit of which is not what it was.
  std::string Damaged(std::string bytes) {
    const std::size_t place = Below(bytes.size());
    bytes[place] = static_cast<char>(bytes[place] ^ 1 << Below(8));
    return bytes;
  }

  std::wstring Name() const { return path_.wstring(); }
  std::string Bytes() const { return ReadBytes(path_); }
  void SetBytes(const std::string& bytes) const { WriteBytes(path_, bytes); }
  bool IsOneIn(unsigned cases) { return Below(cases) == 0; }

 private:
  static TGenericRegistryKey RootOf(const orx::TInFileKey& tree) {
    return TGenericRegistryKey(orx::TGenericRegistryKeyPtr(tree));
  }
  static TGenericRegistryKey Open(const TGenericRegistryKey& parent, const std::wstring& name) {
    return {parent, name, 0, true};
  }
  static TGenericRegistryKey Container(const orx::TInFileKey& tree) {
    return Open(RootOf(tree), L"container");
  }

  unsigned Below(std::size_t number) { return static_cast<unsigned>(random_() % number); }

  double Any(const std::vector<double>& edges) {
    if (edges.empty() || IsOneIn(4)) return std::uniform_real_distribution(-4.0, 4.0)(random_);
    constexpr double kTurns[] = {0, 0, 0, 2 * kPi, -2 * kPi, 1e-15};
    return edges[Below(edges.size())] + kTurns[Below(std::size(kTurns))];
  }

  double Extent() {
    constexpr double kOdd[] = {0, -0.0, -0.1, kPi, 2 * kPi, 7, 1e300, NAN, INFINITY};
    if (IsOneIn(20)) return kOdd[Below(std::size(kOdd))];
    return std::uniform_real_distribution(0.0, 0.4)(random_);
  }

  void FillArea(double* area) {
    area[0] = std::uniform_real_distribution(-1.6, 1.6)(random_);
    area[2] = std::uniform_real_distribution(-3.2, 3.2)(random_);
    if (IsOneIn(60)) area[IsOneIn(2) ? 0 : 2] = IsOneIn(2) ? std::nan("") : -HUGE_VAL;
    area[1] = Extent();
    area[3] = Extent();
    for (const double edge : {area[0], area[0] + area[1]}) norths_.push_back(edge);
    for (const double edge : {area[2], area[2] + area[3]}) easts_.push_back(edge);
  }

  static void AddText(TGenericRegistryKey key, const layout::Text& value,
                      const std::wstring& text) {
    Add(key, value, text);
  }

  /// An entry of both kinds of files.
  void FillEntry(const TGenericRegistryKey& entry) {
    TGenericRegistryKey standard = Open(entry, layout::kStandardDatum);
    const double axes[] = {6377397.155, 6356078.963};
    double area[4];
    double parameters[13] = {static_cast<double>(nextEntry_) / 1000};
    FillArea(area);
    if (!IsOneIn(80)) Add(standard, layout::kEllipsoid, axes);
    Add(standard, layout::kMethod, {IsOneIn(3) ? 2U : 0U});
    Add(standard, layout::kDatumParameters, parameters);
    AddText(standard, layout::kSourceDatumName, L"source");
    Add(standard, layout::kSourceEllipsoid, axes);
    if (!IsOneIn(80)) Add(standard, layout::kValidityArea, area);
    Add(standard, layout::kHeightIndicator, static_cast<signed char>(1));
    TGenericRegistryKey projection = Open(entry, layout::kStandardProjection);
    const double origin[16] = {parameters[0], 1};
    AddText(projection, layout::kProjectionType, L"TMERC");
    Add(projection, layout::kProjectionParameters, origin);
    TableData table;
    table.dHData[0] = parameters[0];
    for (const layout::ResidualGrid& grid : {layout::kDatumGrid, layout::kProjectionGrid}) {
      TGenericRegistryKey key = Open(entry, grid.key);
      double boundaries[6] = {};
      FillArea(boundaries);
      if (!IsOneIn(80)) WriteResidualGrid(entry, grid, table);
      Add(key, grid.boundaries, boundaries);
      if (IsOneIn(80)) {
        const TSimpleBinValue text(orx::kWideString, u"no boundaries", 0);
        key.AddValue(grid.boundaries.name, text, 1, true);
      }
    }
  }

  void AddEntries(const orx::TInFileKey& tree, unsigned count) {
    for (; count > 0; --count) {
      FillEntry(Open(Container(tree), L"S_" + std::to_wstring(nextEntry_++)));
    }
  }

  std::mt19937 random_;
  const TemporaryDirectory directory_;
  const std::filesystem::path path_ = directory_ / "entries.dff";
  unsigned nextEntry_ = 0;
  std::vector<double> norths_;
  std::vector<double> easts_;
};

#ifdef _WIN32
constexpr int kFiles = 1;  // opening one takes long under Wine
#else
constexpr int kFiles = 8;
#endif

/// Tries some files; --gtest_repeat=N tries N times as many.
void ForFiles(const std::function<void(RandomFile& file)>& work) {
  static unsigned seed = 0;
  for (int files = 0; files < kFiles && !testing::Test::HasFailure(); ++files) {
    SCOPED_TRACE("seed " + std::to_string(seed));
    RandomFile file(seed++);
    file.Create();
    work(file);
  }
}

TEST(AreaSearch, FindsWhatAWalkOverAllEntriesFinds) {
  ForFiles([](RandomFile& file) {
    for (int save = 0; save < 40; ++save) {
      file.IsOneIn(15) ? file.Merge() : file.Grow();
      const std::vector<Position> positions = file.Positions();
      const std::string found = Outcomes(file.Name(), positions);
      const std::string bytes = file.Bytes();
      file.SetBytes(WithoutIndex(bytes));
      ASSERT_EQ(found, Outcomes(file.Name(), positions)) << "after save " << save;
      file.SetBytes(bytes);
    }
  });
}

TEST(AreaSearch, IsNotMisledByDamageOfWhatItReads) {
  ForFiles([](RandomFile& file) {
    for (int save = 0; save < 12; ++save) file.Grow();
    const std::string whole = file.Bytes();
    for (int trial = 0; trial < 30; ++trial) {
      const std::vector<Position> positions = file.Positions();
      file.SetBytes(whole);
      const std::string before = Outcomes(file.Name(), positions);
      const std::string damaged = file.Damaged(whole);
      file.SetBytes(damaged);
      const std::string found = Outcomes(file.Name(), positions);
      file.SetBytes(WithoutIndex(damaged));
      const std::string walked = Outcomes(file.Name(), positions);
      ASSERT_TRUE(IsEachOfEither(found, before, walked)) << trial;
    }
  });
}

}  // namespace
}  // namespace velta_test
