// Files made by hand: which entry a query picks, and what it makes of values that are missing or
// other than they should be.

#include <algorithm>
#include <cmath>

#include "support/rtcm_test.h"

namespace velta_test {
namespace {

/// Puts doubles in the place of a value's content.
void Put(Json& value, const std::vector<double>& content) {
  value[kSize] = content.size() * sizeof(double);
  value[kContent] = content;
}

// Within the areas of the DHDN set.
constexpr double kLatitude = 374415 * kHalfSecond;
constexpr double kLongitude = 64815 * kHalfSecond;
constexpr const char* kAll = "list datum 1023 1024 projection";
constexpr const char* kNoGrid = "list datum projection";
constexpr const char* kNoList = "datum projection";

/// The DHDN set's files, to be changed and asked about.
class StoredValueTest : public RtcmTest {
 protected:
  StoredValueTest() {
    Ingest(kDhdnSet);
    datum_ = ReadGff(DatumFile());
    projection_ = ReadGff(ProjectionFile());
  }

  /// The first entry of a file.
  Json& DatumEntry() { return datum_.back()["S_91984_18653_T_374415_64815"]; }
  Json& ProjectionEntry() { return projection_.back()["S_0_818181818_T_-515000_50000"]; }
  RTCMGenerator Written() {
    WriteGff(DatumFile(), datum_);
    WriteGff(ProjectionFile(), projection_);
    return Generator();
  }
  /// The queries that find something.
  std::string Found() {
    const RTCMGenerator generator = Written();
    const std::string datumBefore = ReadBytes(DatumFile());
    const std::string projectionBefore = ReadBytes(ProjectionFile());
    std::string found;
    const auto add = [&found](const char* query) {
      found += (found.empty() ? "" : " ") + std::string(query);
    };
    if (!generator.getAllDatums().empty()) add("list");
    if (generator.getRtcmDatumMessage(kLatitude, kLongitude, 0)) add("datum");
    if (generator.get1023(kLatitude, kLongitude, 0)) add("1023");
    if (generator.get1024(-5150000, 500000, 0)) add("1024");
    if (generator.getRtcmProjMessage()) add("projection");
    EXPECT_EQ(ReadBytes(DatumFile()), datumBefore);
    EXPECT_EQ(ReadBytes(ProjectionFile()), projectionBefore);
    const std::filesystem::recursive_directory_iterator entries(directory_.path());
    EXPECT_EQ(std::distance(begin(entries), end(entries)), 5);  // two files, three directories
    return found;
  }

  Json datum_;
  Json projection_;
};

TEST_F(StoredValueTest, EveryValueIsCheckedAsItsQueryDoes) {
  // What matters of each value: its presence, type, size, dimension.
  const Json checks = Json::parse(ReadBytes(STORED_CHECKS));
  // A key and what is found when something in it is wrong. A datum without its grid is not listed.
  const std::tuple<Json&, std::string, std::string> keys[] = {
      {DatumEntry(), "StandardDatum", "1023 1024 projection"},
      {DatumEntry(), "TargetDatum", "datum 1024 projection"},
      {ProjectionEntry(), "StandardPrj", "list datum 1023 1024"},
      {ProjectionEntry(), "TableProj", "list datum 1023 projection"},
      {datum_, kDhdn, "1023 1024 projection"}};
  for (const auto& [parent, key, found] : keys) {
    const Json whole = parent[key];
    for (const auto& [name, matters] : checks[key].items()) {
      for (const std::string what : {"presence", "type", "size", "dimension"}) {
        Json& value = (parent[key] = whole)[name];
        const bool isText = value[kSize] == 0;
        if (what == "type" && isText) Put(value, {0.5});
        if (what == "type") value[kType] = value[kType] == 2 ? 3 : 2;
        if (what == "size" && !isText) Put(value, std::vector(value[kContent].size() + 1, 1.0));
        if (what == "dimension") value[kDimension] = 2;
        if (what == "presence") parent[key].erase(name);
        const bool isWrong = std::find(matters.begin(), matters.end(), what) != matters.end();
        EXPECT_EQ(Found(), isWrong ? found : kAll) << name << " " << what;
      }
    }
    parent.erase(key);
    EXPECT_EQ(Found(), key == kDhdn ? "1024 projection" : found) << key;
    parent[key] = whole;
  }
}

TEST_F(StoredValueTest, MissingFilesAndEntriesGiveNothing) {
  RTCMGenerator copy = RTCMGenerator(Generator("missing"));
  EXPECT_TRUE(copy.getAllDatums().empty());
  copy.setDatumFileName(DatumFile().wstring());
  const auto datum = copy.getRtcmDatumMessage(kLatitude, kLongitude, 0);
  EXPECT_EQ(datum->sourceNameCounter, 13U);
  EXPECT_EQ(datum->targetNameCounter, 15U);
  EXPECT_FALSE(copy.get1024(0, 0, 0));
  EXPECT_FALSE(copy.getRtcmProjMessage());
  copy.setProjFileName(ProjectionFile().wstring());
  EXPECT_EQ(copy.getRtcmProjMessage()->systemId, 77U);
  for (const Json& root : {Json{{"no entry", Json::object()}}, Json::object()}) {
    datum_ = projection_ = root;
    EXPECT_EQ(Found(), "");
  }
}

TEST_F(StoredValueTest, FirstEntryWinsAndAMalformedOneInFrontEndsTheSearchesButNotTheList) {
  datum_.back()["S_1"] = DatumEntry();
  projection_.back()["S_1"] = ProjectionEntry();
  Json& standard = DatumEntry()["StandardDatum"];
  Json& grid = DatumEntry()["TargetDatum"];
  Json& table = ProjectionEntry()["TableProj"];
  standard.erase("Ellipsoid");
  grid.erase("dHData");
  table.erase("dHData");
  EXPECT_EQ(Found(), "list projection");
  EXPECT_EQ(Generator().getAllDatums().size(), 1U);
  // Of an entry that is far away no more is looked at.
  Put(standard["BoundariesStandardDatum"], {-1.0, 0.1, -1.0, 0.1});
  Put(grid["BoundariesTargetDatum"], {-1.0, 0.1, -1.0, 0.1, 0.0, 0.0});
  Put(table["BoundariesTableProj"], {-1.0, 0.1, -1.0, 0.1, 0.0, 0.0});
  EXPECT_EQ(Found(), kAll);
  standard.erase("BoundariesStandardDatum");
  grid.erase("NRowsT");
  table.erase("NColsT");
  ProjectionEntry().erase("StandardPrj");
  EXPECT_EQ(Found(), "list");
  // Behind the one looked for it does no harm.
  std::swap(DatumEntry(), datum_.back()["S_1"]);
  std::swap(ProjectionEntry(), projection_.back()["S_1"]);
  EXPECT_EQ(Found(), kAll);
}

TEST_F(StoredValueTest, GridsOfAnyShapeAreSafe) {
  const std::tuple<int, int, const char*> cases[] = {{4, 4, kAll},
                                                     {2, 2, kAll},
                                                     {2, 8, kAll},
                                                     {1, 1, kNoGrid},
                                                     {1, 4, kNoGrid},
                                                     {16, 1, kNoGrid},
                                                     {5, 5, kNoList},
                                                     {17, 1, kNoList},
                                                     {0, 0, kNoList},
                                                     {0, 4, kNoList},
                                                     {4, 0, kNoList},
                                                     {-4, -4, kNoList},
                                                     {65536, 65536, kNoList},
                                                     {INT32_MIN, -1, kNoList},
                                                     {-1, 1, kNoList}};
  for (const auto& [rows, columns, found] : cases) {
    for (Json* const key : {&DatumEntry()["TargetDatum"], &ProjectionEntry()["TableProj"]}) {
      (*key)["NRowsT"][kContent] = {rows};
      (*key)["NColsT"][kContent] = {columns};
      const std::int64_t points = std::int64_t{rows} * columns;
      if (points < 1 || points > 25) continue;
      for (const char* const name : {"dNdLatData", "dEdLonData", "dHData"}) {
        Put((*key)[name], std::vector(static_cast<std::size_t>(points), 0.5));
      }
    }
    EXPECT_EQ(Found(), found) << rows << " by " << columns;
    const auto datums = Generator().getAllDatums();
    if (!datums.empty()) {
      EXPECT_EQ(std::isinf(datums[0].grid.bounds[4]), rows == 1);
    }
    if (columns != 2) continue;
    const auto plane = Generator().get1024(-5150000, 500000, 0);
    EXPECT_EQ(plane->residualN[3], 500);
    EXPECT_EQ(plane->residualN[4], 0);
    EXPECT_EQ(plane->residualE[15], 0);
  }
}

TEST_F(StoredValueTest, EveryNumberIsTruncatedIntoItsField) {
  const Json datum = datum_;
  const Json projection = projection_;
  const Json tests = Json::parse(ReadBytes(STORED_NUMBERS));
  for (const Json& test : tests) {
    datum_ = datum;
    projection_ = projection;
    DatumEntry().merge_patch(test["stored"]);
    ProjectionEntry().merge_patch(test["stored"]);
    const RTCMGenerator generator = Written();
    const double first = test["at"][0];
    const double second = test["at"][1];
    const std::string query = test["query"];
    Json made = ToJson(generator.getRtcmProjMessage().get());
    if (query == "datum") made = ToJson(generator.getRtcmDatumMessage(first, second, 0).get());
    if (query == "1023") made = ToJson(generator.get1023(first, second, 0).get());
    if (query == "1024") made = ToJson(generator.get1024(first, second, 0).get());
    Json expected = made;
    expected.merge_patch(test["fields"]);
    EXPECT_EQ(made, expected) << test["stored"];
  }
}

TEST_F(StoredValueTest, DatumsAreListedInPhysicalUnits) {
  Json& standard = DatumEntry()["StandardDatum"];
  Put(standard["Ellipsoid"], {std::nan(""), 6356752.314});
  EXPECT_EQ(Written().getRtcmDatumMessage(kLatitude, kLongitude, 0)->addAt, 2147483648U);
  Put(standard["BoundariesStandardDatum"], {0.5, 0.1, 0.25, 0.0});
  Put(standard["DatumStandardParameters"], {1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13});
  Put(DatumEntry()["TargetDatum"]["BoundariesTargetDatum"], {0.9, 0.4, 0.1, 3.0e-4, 9, 9});
  for (const unsigned method : {0U, 3U, 4U}) {
    standard["StandardMethod"][kContent] = {method};
    const DatumData datum(Written().getAllDatums().at(0));
    const auto& p = datum.parameters;
    EXPECT_EQ(p[6], 7.0);
    EXPECT_EQ(p[7], method == 3 ? 8.0 : 0.0);
    EXPECT_EQ(p[9], method == 3 ? 10.0 : 0.0);
    EXPECT_EQ(p[10], 0.0);
    EXPECT_EQ(datum.validityArea[3], 2 * kPi);
    EXPECT_EQ(datum.validityCentre[1], 0.25 + kPi);
    EXPECT_EQ(datum.grid.bounds[5], 9.999999999999999e-05);
    EXPECT_FALSE(datum.grid.hasTable);
    EXPECT_EQ(datum.grid.centerN, 0.0);
  }
}

}  // namespace
}  // namespace velta_test
