// Files made by hand: which entry a query picks, and what it makes of values that are missing or
// other than they should be.

#include <cmath>
#include <cstdint>

#include "support/message_fields.h"
#include "support/rtcm_test.h"

namespace velta_test {
namespace {

using Doubles = std::vector<double>;

// Within the areas of the DHDN set.
constexpr double kLatitude = 374415 * kHalfSecond, kLongitude = 64815 * kHalfSecond;
constexpr double kNorthing = 5400000, kEasting = 3400000;

/// The DHDN set's files, to be changed and asked about.
class StoredValueTest : public RtcmTest {
 protected:
  StoredValueTest() {
    HelmertSet dhdn = Dhdn();
    dhdn.datum.phiV = 374415 / 4, dhdn.datum.lambdaV = 64815 / 4;
    Ingest(dhdn, kAllParts);
    datum_ = ReadGff(DatumFile());
    projection_ = ReadGff(ProjectionFile());
  }

  GffKey& Standard(std::size_t entry = 0) { return datum_.Entry(entry)[L"StandardDatum"]; }
  GffKey& Grid(std::size_t entry = 0) { return datum_.Entry(entry)[L"TargetDatum"]; }
  GffKey& Projection() { return projection_.Entry()[L"StandardPrj"]; }
  GffKey& Table() { return projection_.Entry()[L"TableProj"]; }
  void RepeatEntry(GffKey& root) {
    root.Container().keys.push_back(root.Entry());
    root.Entry(1).name = L"S_1";
  }
  RTCMGenerator Written() {
    WriteGff(DatumFile(), datum_);
    WriteGff(ProjectionFile(), projection_);
    return Generator();
  }
  /// A letter for each query that finds something: the list of datums, a datum message, a 1023, a
  /// 1024, a projection message.
  std::string Found() {
    const RTCMGenerator generator = Written();
    std::string found;
    if (!generator.getAllDatums().empty()) found += "L";
    if (generator.getRtcmDatumMessage(kLatitude, kLongitude, 0)) found += "D";
    if (generator.get1023(kLatitude, kLongitude, 0)) found += "3";
    if (generator.get1024(kNorthing, kEasting, 0)) found += "4";
    if (generator.getRtcmProjMessage()) found += "P";
    return found;
  }

  GffKey datum_;
  GffKey projection_;
};

constexpr auto *kAll = "LD34P", *kNoTable = "LD3P", *kNoProjection = "LD34";
constexpr auto *kNoDatum = "34P", *kNoGrid = "D4P";  // not listed either

TEST_F(StoredValueTest, EveryValueIsCheckedAsItsQueryDoes) {
  using Names = std::vector<std::wstring>;
  const Names gridNumbers = {L"dMeanValue", L"dNdLatData", L"dEdLonData", L"dHData"};
  Names gridCodes = {L"NRowsT", L"NColsT"};
  for (const auto* name :
       {L"DoApplyHorShifts", L"DoApplyVertShifts", L"HorInterpolation", L"VertInterpolation"})
    gridCodes.push_back(std::wstring(name) + L"ForAreaIndex");
  // What matters of presence, type, size and dimension, and what is found when that is wrong.
  const std::tuple<GffKey&, const wchar_t*, const char*, const char*, Names> cases[] = {
      {datum_, L"", "ptd", kNoDatum, {L"rtcm_datumName"}},
      {datum_, L"StandardDatum", "ps", kNoDatum, {L"BoundariesStandardDatum", L"Ellipsoid"}},
      {datum_, L"StandardDatum", "ps", kNoDatum, {L"RefEllipsoid", L"DatumStandardParameters"}},
      {datum_, L"StandardDatum", "p", kNoDatum, {L"StandardMethod"}},
      {datum_, L"StandardDatum", "ptsd", kNoDatum, {L"HtIndicator"}},
      {datum_, L"StandardDatum", "ptd", kNoDatum, {L"RTCMRefDatumName"}},
      {datum_, L"TargetDatum", "pts", kNoGrid, gridCodes},
      {datum_, L"TargetDatum", "ps", kNoGrid, gridNumbers},
      {datum_, L"TargetDatum", "ps", kNoGrid, {L"BoundariesTargetDatum"}},
      {projection_, L"StandardPrj", "", kAll, {L"Ellipsoid", L"RTCMProjName", L"DatumName"}},
      {projection_, L"StandardPrj", "ptsd", kNoProjection, {L"PrjType"}},
      {projection_, L"StandardPrj", "ps", kNoProjection, {L"PrjStandardParameters"}},
      {projection_, L"TableProj", "pts", kNoTable, gridCodes},
      {projection_, L"TableProj", "ps", kNoTable, gridNumbers},
      {projection_, L"TableProj", "ps", kNoTable, {L"BoundariesTableProj"}},
  };
  ASSERT_EQ(Found(), kAll);
  const auto spoil = [](GffKey& key, const std::wstring& name, char what) {
    GffValue& value = key.Value(name);
    const bool isText = value.size == 0;
    if (what == 't') value.type = value.type == 2 ? 3 : 2;
    if (what == 't' && isText) value.size = static_cast<std::uint32_t>(value.bytes.size());
    if (what == 's') value.bytes.insert(0, 8, '\1'), value.size += isText ? 0 : 8;
    if (what == 'd') value.dimension = 2;
    if (what == 'p') key.Remove(name);
  };
  for (const auto& [root, key, matters, found, values] : cases) {
    for (const std::wstring& value : values) {
      for (const char what : {'p', 't', 's', 'd'}) {
        const GffKey before = root;
        spoil(*key ? root.Entry()[key] : root.Container(), value, what);
        const bool isWrong = std::string(matters).find(what) != std::string::npos;
        EXPECT_EQ(Found(), isWrong ? found : kAll) << orx::Narrow(value) << " " << what;
        root = before;
      }
    }
  }
}

TEST_F(StoredValueTest, MissingKeysAndFilesGiveNothing) {
  RTCMGenerator copy = RTCMGenerator(Generator("missing"));
  EXPECT_TRUE(copy.getAllDatums().empty());
  copy.setDatumFileName(DatumFile().wstring());
  EXPECT_EQ(copy.getAllDatums().size(), 1U);
  EXPECT_FALSE(copy.get1024(kNorthing, kEasting, 0) || copy.getRtcmProjMessage());
  copy.setProjFileName(ProjectionFile().wstring());
  EXPECT_EQ(copy.getRtcmProjMessage()->systemId, 77U);
  const GffKey datum = datum_, projection = projection_;
  datum_.Entry().Remove(L"StandardDatum"), projection_.Entry().Remove(L"StandardPrj");
  EXPECT_EQ(Found(), "34");
  datum_ = datum, projection_ = projection;
  datum_.Entry().Remove(L"TargetDatum"), projection_.Entry().Remove(L"TableProj");
  EXPECT_EQ(Found(), "DP");
  datum_.Container().keys.clear(), projection_.Container().keys.clear();
  EXPECT_EQ(Found(), "");
  datum_.keys.clear(), projection_.keys.clear();
  EXPECT_EQ(Found(), "");
}

TEST_F(StoredValueTest, FirstEntryWinsAndAMalformedOneInFrontEndsTheSearchesButNotTheList) {
  RepeatEntry(datum_), RepeatEntry(projection_);
  Standard(1).Set<double>(L"Ellipsoid", {6370001.0, 6350001.0});
  Grid(1).Set<double>(L"dMeanValue", {0, 0, 9});
  projection_.Entry(1).Remove(L"StandardPrj");
  EXPECT_EQ(Found(), kAll);
  EXPECT_EQ(Generator().getRtcmDatumMessage(kLatitude, kLongitude, 9)->addAt, 7397155U);
  EXPECT_EQ(Generator().get1023(kLatitude, kLongitude, -9)->meanDH, 33);
  EXPECT_EQ(Generator().getAllDatums().at(1).targetDatumName, L"AUTO_DHDN_BESEL");
  std::swap(projection_.Entry(0), projection_.Entry(1));
  EXPECT_EQ(Found(), kNoProjection);
  Standard().Remove(L"Ellipsoid"), Grid().Remove(L"dHData");
  EXPECT_EQ(Found(), "L4");
  EXPECT_EQ(Generator().getAllDatums().size(), 1U);

  Standard().Set<double>(L"BoundariesStandardDatum", {-1.0, 0.1, -1.0, 0.1});
  Grid().Set<double>(L"BoundariesTargetDatum", {-1.0, 0.1, -1.0, 0.1, 0, 0});
  EXPECT_EQ(Found(), kNoProjection);  // far away, no more of it is looked at
  Standard().Remove(L"BoundariesStandardDatum"), Grid().Remove(L"NRowsT");
  EXPECT_EQ(Found(), "L4");
  std::swap(datum_.Entry(0), datum_.Entry(1));
  EXPECT_EQ(Found(), kNoProjection);
  // Text of the size of the boundaries that ends before them.
  Grid().Value(L"BoundariesTargetDatum") = {L"BoundariesTargetDatum", 5, 0, 1, std::string(48, 0)};
  EXPECT_EQ(Found(), "D4");
}

TEST_F(StoredValueTest, GridsOfAnyShapeAreSafe) {
  const std::tuple<int, int, const char*> cases[] = {
      {4, 4, kAll},   {2, 2, kAll},   {2, 8, kAll},         {1, 1, "LDP"},         {1, 4, "LDP"},
      {16, 1, "LDP"}, {5, 5, "DP"},   {17, 1, "DP"},        {0, 0, "DP"},          {0, 4, "DP"},
      {4, 0, "DP"},   {-4, -4, "DP"}, {65536, 65536, "DP"}, {INT32_MIN, -1, "DP"}, {-1, 1, "DP"}};
  for (const auto& [rows, columns, found] : cases) {
    for (GffKey* const key : {&Grid(), &Table()}) {
      key->Set<int>(L"NRowsT", {rows}), key->Set<int>(L"NColsT", {columns});
      const std::int64_t points = std::int64_t{rows} * columns;
      if (points < 1 || points > 25) continue;
      for (const wchar_t* const name : {L"dNdLatData", L"dEdLonData", L"dHData"}) {
        key->Set(name, Doubles(static_cast<std::size_t>(points), 0.5));
      }
    }
    EXPECT_EQ(Found(), found) << rows << " by " << columns;
    if (columns == 2) {
      const auto plane = Generator().get1024(kNorthing, kEasting, 0);
      EXPECT_EQ(plane->residualN[3], 500);
      EXPECT_EQ(plane->residualN[4] + plane->residualE[15] + plane->residualH[4], 0);
    }
    if (rows == 1) {
      EXPECT_TRUE(std::isinf(Generator().getAllDatums().at(0).grid.bounds[4]));
      EXPECT_EQ(Generator().getAllDatums().at(0).grid.dHData[4], 0.0);
    }
  }
}

TEST_F(StoredValueTest, PositionsAreFoundOnEdgesPolesAndAcrossTheDateLine) {
  const double d = kPi / 180;
  const std::tuple<Doubles, double, double, bool> cases[] = {
      {{0.1, 0.25, 0.5, 0.5}, 0.1, 0.5, true},
      {{0.1, 0.25, 0.5, 0.5}, 0.35, 1.0, true},
      {{0.1, 0.25, 0.5, 0.5}, 0.0999, 0.7, false},
      {{80 * d, 10 * d, -2 * kPi, 2 * kPi}, 90 * d, 3.0, true},
      {{0.1, 0.0, 0.2, 0.0}, -90 * d, -3.0, true},
      {{0, 1, 170 * d, 20 * d}, 0.5, -175 * d, true},
      {{0, 1, -2 * d, 2 * d}, 0.5, 359 * d, true},
  };
  for (const auto& [area, latitude, longitude, isInside] : cases) {
    Standard().Set(L"BoundariesStandardDatum", area);
    Grid().Set<double>(L"BoundariesTargetDatum", {area[0], area[1], area[2], area[3], 9, 9});
    EXPECT_EQ(!!Written().getRtcmDatumMessage(latitude, longitude, 0), isInside) << longitude;
    const bool isInGrid = isInside && area[1] != 0;  // whose extent of 0 is just that
    EXPECT_EQ(!!Generator().get1023(latitude, longitude, 0), isInGrid) << longitude;
  }
  Table().Set<double>(L"BoundariesTableProj", {10, 5, 400, 1, 0, 0});
  EXPECT_TRUE(Written().get1024(15, 401, 0));
  EXPECT_FALSE(Generator().get1024(15, 400.5 - 2 * kPi, 0));
}

TEST_F(StoredValueTest, DatumNumbersAreTruncated) {
  Standard().Set<double>(L"BoundariesStandardDatum", {0.5, 32766 * kTwoSeconds, 0.25, 0.0});
  Standard().Set<double>(L"Ellipsoid", {6378137.0, 6356752.314245});
  Standard().Set<double>(L"RefEllipsoid", {std::nan(""), 6349999.999});
  Standard().Set<double>(L"DatumStandardParameters",
                         {1e9, -0.0019, 0.0019, 0, 1e-5, -3e-5, 1, 7.0019, -1e18, -8, 1, 1, 1});
  Standard().Value(L"HtIndicator").bytes = "\xFF";
  auto made = Written().getRtcmDatumMessage(0.6, 0.3, 0);
  EXPECT_EQ(Describe(made.get()),
            "21 77: 67949 349783 32766 0 -2147483648 -1 1 0 0 -1 99999 2147483648 4294967295 "
            "8137000 6752314 4294967295");
  EXPECT_EQ(made->sourceName + made->targetName, "ETRF89_ETRF89AUTO_DHDN_BESEL");
  EXPECT_EQ(made->sourceNameCounter * 100 + made->targetNameCounter, 1315U);
  const DatumData helmert = Generator().getAllDatums().at(0);
  EXPECT_EQ(helmert.parameters[7], 0.0);
  EXPECT_EQ(helmert.heightIndicator, 0xFFFFFFFFU);
  EXPECT_EQ(helmert.validityArea[3], 2 * kPi);

  Standard().Set<double>(L"BoundariesStandardDatum", {0.5, 32767 * kTwoSeconds, 0.25, 0.1});
  Standard().Set<unsigned>(L"StandardMethod", {3});
  made = Written().getRtcmDatumMessage(0.6, 0.3, 0);
  EXPECT_EQ(Describe(made.get()),
            "22 77: 67949 30939 0 10313 -2147483648 -1 1 0 0 -1 99999 2147483648 4294967295 "
            "8137000 6752314 4294967295 7001 -9223372036854775808 -8000");
  const DatumData badekas = Generator().getAllDatums().at(0);
  EXPECT_EQ(badekas.parameters[9], -8.0);
  EXPECT_EQ(badekas.validityCentre[1], 0.25 + 0.1 * 0.5);
  Standard().Set<unsigned>(L"StandardMethod", {4});
  EXPECT_FALSE(Written().getRtcmDatumMessage(0.6, 0.3, 0));
  EXPECT_EQ(Generator().getAllDatums().at(0).parameters[7], 0.0);
  Standard().Set<unsigned>(L"StandardMethod", {3});
  Standard().Value(L"StandardMethod").type = 2;  // of another kind: reads as 0
  made = Written().getRtcmDatumMessage(0.6, 0.3, 0);
  EXPECT_EQ(made->messageType * 10 + made->computationIndicator, 210U);
}

TEST_F(StoredValueTest, GridNumbersAreTruncated) {
  Grid().Set<double>(L"BoundariesTargetDatum",
                     {0.9053895494720584, 0.004363323129985824, 0.1, 3.0e-4, 9, 9});
  Grid().Set<double>(L"dMeanValue", {4.84813681109536e-09, 0, -0.0299});
  Grid().Value(L"HorInterpolationForAreaIndex").bytes = "\xFE";
  EXPECT_EQ(Describe(Written().get1023(0.907, 0.1001, 0).get()),
            "23 77: 1 1 4294967294 0 374400 41314 600 41 1 0 -2 10 -10 -3");
  const TableData listed = Generator().getAllDatums().at(0).grid;
  EXPECT_EQ(listed.bounds[5], 9.999999999999999e-05);
  EXPECT_EQ(listed.horInterpolation, -2);
  EXPECT_FALSE(listed.hasTable || listed.centerN != 0.0);

  Table().Set<double>(L"BoundariesTableProj", {5000000.0, 3000.0, 400.0, 1e12, 0, 0});
  Table().Set<double>(L"dMeanValue", {0.0199, -0.0199, 1e300});
  Table().Set<double>(L"dEdLonData", Doubles(16, 0.0125));
  EXPECT_EQ(Describe(Written().get1024(5000001, 500, 0).get()),
            "24 77: 0 1 1 2 500150 2147483648 100 3268562261 1 -1 -2147483648 -120 12 255");
}

TEST_F(StoredValueTest, ProjectionMessageFollowsTheTypeString) {
  const Doubles tm = {9.0, 0.9996, 0.0, 500000.0, -0.0019};
  const Doubles om = {44, 0.9996, -91, -27, 1e16, 0.5, 43};
  const std::tuple<const wchar_t*, Doubles, const char*> cases[] = {
      {L"TMERC", tm, "25 77: 1 0 818181818 660000000 500000000 -1"},
      {L"STER", tm, "25 77: 8 0 818181818 660000000 500000000 -1"},
      {L"LC", {0, 1.02}, "25 77: 3 0 0 2700000000 0 0"},
      {L"CASSINI", tm, "25 77: 6 90872727 818181818 0 0 500000000"},
      {L"MERCATOR", tm, "25 77: 9 90872727 818181818 0 0 500000000"},
      {L"OM", om,
       "27 77: 7 -2454545454 -8272727272 4000000000 660000000 10000000000000000000 500 0 0"},
      {L"ROM", om,
       "27 77: 7 -2454545454 -8272727272 4000000000 660000000 10000000000000000000 500 1 "
       "-90909090"},
      {L"tmerc", {0, (1073741823 * 1e-5 + 993000) * 1e-6}, "25 77: 1 0 0 1073741822 0 0"},
      {L"TM", tm, "nothing"},
  };
  for (auto [type, parameters, message] : cases) {
    const std::u16string units = orx::ToUtf16(type) + u'\0';
    Projection().Set<char16_t>(L"PrjType", {units.begin(), units.end()});
    parameters.resize(16);
    Projection().Set(L"PrjStandardParameters", parameters);
    const auto made = Written().getRtcmProjMessage();
    EXPECT_EQ(Describe(made.get()), message);
  }
}

}  // namespace
}  // namespace velta_test
