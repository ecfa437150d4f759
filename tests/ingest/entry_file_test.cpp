// What becomes of messages, and of other files, in a file: the same for datums and projections.

#include <boost/thread/lock_types.hpp>
#include <cmath>
#include <thread>

#include "projmath/geo_proj.h"
#include "support/rtcm_test.h"

namespace velta_test {
namespace {

class EntryFileTest : public RtcmTest, public testing::WithParamInterface<bool> {
 protected:
  /// Ingests the messages, or the same with another place for their entry.
  ResultCode IngestEntry(int number = 0) {
    m1021_.phiV = number;
    m1024_.north0 = number;
    return Ingest(isDatum_ ? k1021 | k1023 : kDhdnSet);
  }
  /// A file of entries that hold the file's name and a value of its own.
  void Make(const std::string& name, const std::vector<std::string>& entries) {
    const Json value = {5, 0, 1, name};
    Json container = {{"of", value}};
    for (const std::string& entry : entries) {
      container[entry] = {{"of", value}, {name, value}, {"sub", {{"of", value}}}};
    }
    WriteGff(directory_ / name, {{"container of " + name, container}});
  }
  ResultCode Merge(const std::string& target, const std::string& source) const {
    const std::wstring to = (directory_ / target).wstring();
    const std::wstring from = (directory_ / source).wstring();
    return isDatum_ ? RTCMDataSupport::MergeRTCMDatumfiles(to, from)
                    : RTCMDataSupport::MergeRTCMProjectionfiles(to, from);
  }
  void ExpectUnlocked() const {
    std::thread([this] {
      EXPECT_TRUE(boost::unique_lock(current_->GetMutex(), boost::try_to_lock));
    }).join();
  }

  const bool isDatum_ = GetParam();
  const ResultCode trouble_ = isDatum_ ? kDatumFileTrouble : kProjectionFileTrouble;
  const std::filesystem::path path_ = isDatum_ ? DatumFile() : ProjectionFile();
  orx::TCSInFileKey*& current_ =
      isDatum_ ? RTCMDataSupport::GFFDatumFile : RTCMDataSupport::GFFProjectionFile;
};

INSTANTIATE_TEST_SUITE_P(IsDatum, EntryFileTest, testing::Bool(),
                         testing::PrintToStringParamName());

TEST_P(EntryFileTest, EntryAlreadyPresentIsLeftAloneAndAnotherAppendedToTheFirstContainer) {
  ASSERT_EQ(IngestEntry(), kSuccess);
  Json root = ReadGff(path_);
  root[kDhdn]["dimension"] = 3;
  WriteGff(path_, {{"first of two", root[kDhdn]}, {kDhdn, Json::object()}});
  const std::string one = ReadBytes(path_);
  m1021_.dX = 1;
  m1025_.fe = 1;
  EXPECT_EQ(IngestEntry(), kSuccess);
  EXPECT_EQ(ReadBytes(path_), one);
  EXPECT_EQ(IngestEntry(1), kSuccess);
  EXPECT_EQ(IngestEntry(2), kSuccess);
  ExpectUnlocked();
  EXPECT_EQ(ReadBytes(path_).substr(0, one.size()), one);
  root = ReadGff(path_)["first of two"];
  EXPECT_EQ(root.back()["dimension"], 3);
  EXPECT_EQ(root.size(), isDatum_ ? 5U : 6U);  // with its dimension, its name and the system
}

TEST_P(EntryFileTest, DirectoryOrFileThatCannotBeUsedIsReported) {
  const std::filesystem::path directory = path_.parent_path();
  std::filesystem::create_directories(directory.parent_path());
  WriteBytes(directory, "a file where the directory should be");
  EXPECT_EQ(IngestEntry(), kNoDirectory);
  std::filesystem::remove(directory);
  std::filesystem::create_directories(path_);
  EXPECT_EQ(IngestEntry(), kNoSharedFile);
  std::filesystem::remove(path_);
  WriteBytes(path_, "no registry file");
  EXPECT_EQ(IngestEntry(), trouble_);
  std::filesystem::remove(path_);
  for (const int number : {0, 1, 2}) {
    EXPECT_EQ(IngestEntry(number), kSuccess) << number;
  }
  Damage(path_);
  const std::string bytes = ReadBytes(path_);
  EXPECT_EQ(IngestEntry(3), trouble_);
  EXPECT_EQ(ReadBytes(path_), bytes);
}

TEST_P(EntryFileTest, MergedEntriesAreLaidOverTheTargets) {
  Make("target", {"B", "C"});
  Make("source", {"A", "B"});
  Make("empty", {});
  EXPECT_EQ(Merge("target", "source"), kSuccess);
  const Json t = {5, 0, 1, "target"};
  const Json s = {5, 0, 1, "source"};
  const Json merged = {
      {"of", t},
      {"B", {{"of", s}, {"target", t}, {"source", s}, {"sub", {{"of", s}}}}},
      {"C", {{"of", t}, {"target", t}, {"sub", {{"of", t}}}}},
      {"A", {{"of", s}, {"source", s}, {"sub", {{"of", s}}}}},
  };
  EXPECT_EQ(Merge("target", "empty"), kSuccess);
  EXPECT_EQ(Merge("target", "target"), kSuccess);
  EXPECT_EQ(ReadGff(directory_ / "target"), Json({{"container of target", merged}}));
  EXPECT_EQ(Merge("empty", "target"), kSuccess);
  EXPECT_EQ(ReadGff(directory_ / "empty")["container of empty"]["B"], merged["B"]);
}

TEST_P(EntryFileTest, MergeWithAFileThatCannotBeUsedLeavesTheTargetAlone) {
  Make("target", {"B"});
  Make("source", {"A"});
  Make("damaged", {"C"});
  const std::size_t size = ReadBytes(directory_ / "damaged").size();
  ASSERT_EQ(Merge("damaged", "source"), kSuccess);
  ASSERT_EQ(Merge("damaged", "target"), kSuccess);
  Damage(directory_ / "damaged", size + 80);  // in what the first merge added
  WriteBytes(directory_ / "garbage", "no registry file");
  WriteGff(directory_ / "rootless", Json::object());
  const std::string before = ReadBytes(directory_ / "target");
  for (const char* const source : {"damaged", "garbage", "rootless", "missing"}) {
    EXPECT_EQ(Merge("target", source), trouble_) << source;
    EXPECT_EQ(ReadBytes(directory_ / "target"), before) << source;
  }
  EXPECT_EQ(Merge("rootless", "source"), trouble_);
  EXPECT_EQ(Merge("missing", "source"), kNoSharedFile);
  EXPECT_FALSE(std::filesystem::exists(directory_ / "missing"));
}

class DescriptionTest : public RtcmTest {
 protected:
  const ResultCode ingested_ = Ingest(kDhdnSet);
  const DatumData current_{Generator().getAllDatums().at(0)};

  /// Adds the current datum after a change to it.
  template <class Change>
  ResultCode AddDatum(const Change& change) {
    DatumData datum(current_);
    change(datum);
    return support_.AddDatumToGFF(datum);
  }
  template <class Change>
  ResultCode AddProjection(const Change& change) {
    ProjectionData projection;
    projection.rtcmProjName = L"AUTO_DHDN_BESEL";
    projection.prjType = L"TMERC";
    projection.geoProj = std::make_unique<orx::cs::projmath::TUTMProj>(
        6377397.155, 6356078.963, 8.999999998, 1.0, 0.0, 3500000.0, 0.0);
    change(projection);
    return support_.AddProjectionToGFF(projection);
  }
};

TEST_F(DescriptionTest, OnlyTheCurrentOneIsAddedWithinTolerances) {
  constexpr ResultCode kOther = kNotTheCurrentDescription;
  EXPECT_EQ(AddDatum([](auto& d) { d.parameters[3] += 5e-8; }), kSuccess);
  EXPECT_EQ(AddDatum([](auto& d) { d.parameters[5] += 2e-7; }), kOther);
  EXPECT_EQ(AddDatum([](auto& d) { d.parameters[2] += 9e-6; }), kSuccess);
  EXPECT_EQ(AddDatum([](auto& d) { d.parameters[12] -= 2e-5; }), kOther);
  EXPECT_EQ(AddDatum([](auto& d) { d.parameters[0] = std::nan(""); }), kOther);
  EXPECT_EQ(AddDatum([](auto& d) { d.targetDatumName = L"auto_dhdn_besel"; }), kSuccess);
  EXPECT_EQ(AddDatum([](auto& d) { d.sourceDatumName = L"etrf89_etrf89"; }), kSuccess);
  EXPECT_EQ(AddDatum([](auto& d) { d.sourceDatumName += L" "; }), kOther);
  EXPECT_EQ(AddDatum([](auto& d) { d.validityArea[0] = d.heightIndicator = 3; }), kSuccess);
  EXPECT_EQ(AddDatum([](auto& d) { d.computationIndicator = 2; }), kOther);
  EXPECT_EQ(AddDatum([](auto& d) { d.sourceEllipsoid.second += 1e-9; }), kOther);
  EXPECT_EQ(AddDatum([](auto& d) { d.targetEllipsoid.a = std::nan(""); }), kOther);
  EXPECT_EQ(AddProjection([](auto& p) { p.geoProj->SetParam(0.9e-7, 2, 3); }), kSuccess);
  EXPECT_EQ(AddProjection([](auto& p) { p.geoProj->SetParam(1.1e-7, 4, 3); }), kOther);
  EXPECT_EQ(AddProjection([](auto& p) { p.prjType = L"tmerc"; }), kSuccess);
  EXPECT_EQ(AddProjection([](auto& p) { p.prjType = L"OM"; }), kOther);
  EXPECT_EQ(AddProjection([](auto& p) { p.rtcmProjName = L"auto_dhdn_besel"; }), kOther);
  EXPECT_EQ(AddProjection([](auto& p) { p.geoProj->parameterCount = 4; }), kOther);
  EXPECT_EQ(AddProjection([](auto& p) { p.geoProj->semiMajorAxis += 1e-3; }), kOther);
  EXPECT_EQ(AddProjection([](auto& p) { p.geoProj->ellipsoidSecond = std::nan(""); }), kOther);
  // An unsupported one leaves no projection behind.
  m1025_.projectionType = 3;
  EXPECT_EQ(Ingest(kDhdnSet), kUnsupportedProjection);
  EXPECT_EQ(AddProjection([](auto& p) { p.prjType = L"LC"; }), kOther);
}

TEST_F(DescriptionTest, IsNotAddedToATreeThatCannotBeUsed) {
  for (const int phi : {1, 2, 91984}) {
    m1021_.phiV = phi;
    ASSERT_EQ(Ingest(k1021 | k1023), kSuccess);
  }
  Damage(DatumFile());
  orx::TCSInFileKey damaged(DatumFile().wstring(), nullptr, nullptr, true, orx::kRegistryFlags);
  orx::TCSInFileKey empty(L"", nullptr, nullptr, false, orx::kRegistryFlags);
  for (auto* const file : {&damaged, &empty, static_cast<orx::TCSInFileKey*>(nullptr)}) {
    RTCMDataSupport::GFFDatumFile = RTCMDataSupport::GFFProjectionFile = file;
    EXPECT_EQ(AddDatum([](auto&) {}), kDatumFileTrouble);
    EXPECT_EQ(AddProjection([](auto&) {}), kProjectionFileTrouble);
  }
}

}  // namespace
}  // namespace velta_test
