// What becomes of a message in its file, which is the same for datums and projections.

#include <boost/thread/lock_types.hpp>
#include <thread>

#include "projmath/geo_proj.h"
#include "support/operating_system.h"
#include "support/rtcm_test.h"

namespace velta_test {
namespace {

constexpr const char* kDatumDump = R"([AUTO_DHDN_BESEL]
rtcm_datumName 5 0 1 AUTO_DHDN_BESEL
[S_91984_18653_T_374415_64815]
Version 3 2 1 256
[StandardDatum]
Ellipsoid 1 16 1 6377397.155 6356078.963
StandardMethod 1 4 1 1
DatumStandardParameters 1 104 1 -584.957 -70.27 -405.17 1.11552 -0.165 -3.0890000000000004 -7.992170000000001 0 0 0 0 0 0
RTCMRefDatumName 5 0 1 ETRF89_ETRF89
RefEllipsoid 1 16 1 6378137 6356752.314
BoundariesStandardDatum 1 32 1 0.8569954478237045 0.06981317007977318 0.14595800683483692 0.06981317007977318
HtIndicator 2 1 1 1
[TargetDatum]
NRowsT 2 4 1 4
NColsT 2 4 1 4
BoundariesTargetDatum 1 48 1 0.9074984889848849 0.00021816615649929117 0.15700691062732325 0.00021816615649929117 7.27220521664304e-05 7.27220521664304e-05
DoApplyHorShiftsForAreaIndex 3 1 1 1
DoApplyVertShiftsForAreaIndex 3 1 1 0
HorInterpolationForAreaIndex 2 1 1 -2
VertInterpolationForAreaIndex 2 1 1 3
dMeanValue 1 24 1 -1.454441043328608e-08 6.787391535533503e-08 0.33
dNdLatData 1 128 1 1.5998851476614686e-09 1.3089969389957473e-09 1.0181087303300257e-09 -2.3271056693257727e-09
dEdLonData 1 128 1 -1.4544410433286082e-09 -1.0181087303300257e-09 -5.817764173314432e-10 -5.817764173314432e-10
dHData 1 128 1 -0.003 -0.004 -0.001 -0.003
)";

constexpr const char* kProjectionDump = R"([AUTO_DHDN_BESEL]
rtcm_projectionName 5 0 1 AUTO_DHDN_BESEL
system_identification_number 3 4 1 23
[S_0_818181818_T_540000_340000]
Version 3 2 1 256
[StandardPrj]
RTCMProjName 5 0 1 AUTO_DHDN_BESEL
DatumName 5 0 1 AUTO_DHDN_BESEL
Ellipsoid 1 16 1 6377397.155 6356078.963
PrjType 5 0 1 TMERC
PrjStandardParameters 1 128 1 8.999999998 1 0 0
[TableProj]
NRowsT 2 4 1 4
NColsT 2 4 1 4
BoundariesTableProj 1 48 1 5398500 3000 3398200 3600 1000 1200
DoApplyHorShiftsForAreaIndex 3 1 1 0
DoApplyVertShiftsForAreaIndex 3 1 1 1
HorInterpolationForAreaIndex 2 1 1 1
VertInterpolationForAreaIndex 2 1 1 2
dMeanValue 1 24 1 0.07 -0.12 -3.45
dNdLatData 1 128 1 -0.12 -0.10400000000000001 -0.088 0.12
dEdLonData 1 128 1 0.1 0.08700000000000001 0.074 -0.095
dHData 1 128 1 0.255 0.221 0.187 -0.255
)";

struct Kind {
  ResultCode trouble;
  orx::TCSInFileKey*& current;
  const char* dump;
};
const Kind kDatumKind{kDatumFileTrouble, RTCMDataSupport::GFFDatumFile, kDatumDump};
const Kind kProjectionKind{kProjectionFileTrouble, RTCMDataSupport::GFFProjectionFile,
                           kProjectionDump};

class RecordFileTest : public RtcmTest, public testing::WithParamInterface<bool> {
 protected:
  bool isDatum_ = GetParam();
  const Kind& kind_ = isDatum_ ? kDatumKind : kProjectionKind;
  std::filesystem::path path_ = isDatum_ ? DatumFile() : ProjectionFile();
  HelmertSet dhdn_ = Dhdn();

  /// Ingests the set, or the same with another place for its entry.
  ResultCode IngestEntry(int number = 0) {
    HelmertSet set = dhdn_;
    (isDatum_ ? set.datum.phiV : set.planeGrid.north0) += number;
    return Ingest(set, isDatum_ ? kGrid : kAllParts);
  }
  /// Ingests three entries and damages what the second added.
  std::string Damage() {
    std::size_t sizes[3] = {};
    for (const int number : {0, 1, 2}) {
      EXPECT_EQ(IngestEntry(number), kSuccess);
      sizes[number] = ReadBytes(path_).size();
    }
    std::string bytes = ReadBytes(path_);
    bytes[(sizes[0] + sizes[1]) / 2] ^= 1;
    WriteBytes(path_, bytes);
    return bytes;
  }
  /// How many entries the file holds, when nobody holds its lock.
  std::size_t Entries() {
    std::thread([this] {
      boost::recursive_mutex& mutex = kind_.current->GetMutex();
      EXPECT_TRUE(boost::unique_lock<boost::recursive_mutex>(mutex, boost::try_to_lock));
    }).join();
    return ReadGff(path_).Container().keys.size();
  }
};

INSTANTIATE_TEST_SUITE_P(Kinds, RecordFileTest, testing::Bool(), [](const auto& isDatum) {
  return isDatum.param ? "Datum" : "Projection";
});

TEST_P(RecordFileTest, FirstMessageMakesTheFileWithItsEntry) {
  dhdn_.grid.vertShiftIndicator = false;
  dhdn_.grid.horInterpolationMethod = 0x1FE, dhdn_.grid.vertInterpolationMethod = 3;
  ASSERT_EQ(IngestEntry(), kSuccess);
  EXPECT_EQ(ReadGff(path_).Dump(), kind_.dump);
}

TEST_P(RecordFileTest, EntryAlreadyPresentIsLeftAloneAndAnotherAppended) {
  ASSERT_EQ(IngestEntry(), kSuccess);
  GffKey root = ReadGff(path_);
  root.Container().name = L"first of two", root.Container().dimension = 3;
  root.keys.push_back({L"AUTO_DHDN_BESEL"});
  WriteGff(path_, root);
  const std::string one = ReadBytes(path_);
  dhdn_.datum.dX = 1, dhdn_.projection.fe = 1;
  EXPECT_EQ(IngestEntry(), kSuccess);
  EXPECT_EQ(ReadBytes(path_), one);
  ASSERT_EQ(IngestEntry(1), kSuccess);
  ASSERT_EQ(IngestEntry(2), kSuccess);
  const std::string three = ReadBytes(path_);
  EXPECT_EQ(three.substr(0, one.size()), one);
  EXPECT_LE(three.size(), 3 * one.size());
  EXPECT_EQ(Entries(), 3U);
  EXPECT_EQ(ReadGff(path_).Entry(2).dimension, 3);
}

TEST_P(RecordFileTest, DirectoryOrFileThatCannotBeUsedIsReported) {
  const std::filesystem::path directory = path_.parent_path();
  std::filesystem::create_directories(datums_);
  std::filesystem::remove(directory);
  WriteBytes(directory, "a file where the directory should be");
  EXPECT_EQ(IngestEntry(), kNoDirectory);
  std::filesystem::remove(directory);
  std::filesystem::create_directories(path_);
  EXPECT_EQ(IngestEntry(), kNoSuchFile);
  std::filesystem::remove(path_);
  const std::string bytes = Damage();
  EXPECT_EQ(IngestEntry(3), kind_.trouble);
  EXPECT_EQ(ReadBytes(path_), bytes);
  WriteBytes(path_, "no registry file");
  EXPECT_EQ(IngestEntry(), kind_.trouble);
}

#ifndef _WIN32
TEST_P(RecordFileTest, FileThatCannotGrowKeepsItsContentAndRecovers) {
  {
    const FileSizeLimit nothing(0);
    EXPECT_EQ(IngestEntry(), kNoSuchFile);
  }
  ASSERT_EQ(IngestEntry(), kSuccess);
  const std::string bytes = ReadBytes(path_);
  {
    const FileSizeLimit full(bytes.size());
    EXPECT_EQ(IngestEntry(1), kEntryNotWritten);
  }
  EXPECT_EQ(Entries(), 1U);
  EXPECT_EQ(ReadBytes(path_).substr(0, bytes.size()), bytes);
  EXPECT_EQ(IngestEntry(1), kSuccess);  // a file not given back would still hold the entry
  EXPECT_EQ(Entries(), 2U);
}
#endif

TEST_P(RecordFileTest, OnlyTheCurrentDescriptionIsAdded) {
  ASSERT_EQ(IngestEntry(), kSuccess);
  ProjectionData projection;
  projection.rtcmProjName = L"AUTO_DHDN_BESEL", projection.prjType = L"tmerc";
  projection.geoProj = std::make_unique<orx::cs::projmath::TUTMProj>(
      6377397.155, 6356078.963, 8.999999998, 1.0, 0.0, 3500000.0, 0.0);
  DatumData datum(Ingest(dhdn_, kGrid) == kSuccess ? Generator().getAllDatums()[0] : DatumData());
  datum.targetDatumName = L"auto_dhdn_besel";
  const auto add = [&] {
    return isDatum_ ? support_.AddDatumToGFF(datum) : support_.AddProjectionToGFF(projection);
  };
  EXPECT_EQ(add(), kSuccess);
  std::filesystem::remove(path_);
  Damage();
  orx::TCSInFileKey bad(path_.wstring(), nullptr, nullptr, true, 97);
  orx::TCSInFileKey empty(L"", nullptr, nullptr, false, 97);
  for (orx::TCSInFileKey* const file : {&bad, &empty, static_cast<orx::TCSInFileKey*>(nullptr)}) {
    kind_.current = file;
    EXPECT_EQ(add(), kind_.trouble);
  }
  kind_.current = &empty;
  datum.parameters[0] += 2e-5, projection.geoProj->SetParam(1e-6, 4, 3);
  EXPECT_EQ(add(), kNotTheCurrentDescription);
}

}  // namespace
}  // namespace velta_test
