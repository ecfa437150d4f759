#include "transform_work.h"

#include <algorithm>
#include <cmath>
#include <fstream>
#include <random>
#include <string>
#include <utility>
#include <vector>

#include "support/run_program.h"
#include "velta/rtcm_data_support.h"
#include "workload.h"

namespace velta_bench {
namespace {

namespace fs = std::filesystem;
namespace velta = orx::cs::velta;

constexpr int kColumns = 40;
/// A window is three steps of 5" by 7" wide; the same in half arc-seconds.
constexpr int kNorthStep = 10;
constexpr int kEastStep = 14;
constexpr int kFirstPhi = 374415;
constexpr int kFirstLambda = 64815;

/// A window of a grid in which neighbours have the points on their edges in common.
velta::Rtcm1023 WindowOf(int row, int column) {
  velta::Rtcm1023 grid;
  grid.horShiftIndicator = true;
  grid.vertShiftIndicator = true;
  grid.phi0 = kFirstPhi - row * 3 * kNorthStep;
  grid.lambda0 = kFirstLambda + column * 3 * kEastStep;
  grid.dPhi = kNorthStep;
  grid.dLambda = kEastStep;
  grid.meanDPhi = 12;
  grid.meanDLambda = -7;
  grid.meanDH = 4342;
  for (int i = 0; i < velta::kResidualGridPoints; ++i) {
    const int y = row * 3 + i / 4;
    const int x = column * 3 + i % 4;
    grid.residualPhi[i] = x - y + x * y / 100;
    grid.residualLambda[i] = y - x + x * x / 100;
    grid.residualH[i] = x + y - x * y / 50;
  }
  return grid;
}

velta::Rtcm1021 Datum() {
  velta::Rtcm1021 datum = MessageSet(0).datum;
  datum.targetName = "NET";
  datum.heightIndicator = 1;
  datum.phiV = kFirstPhi / 4;
  datum.lambdaV = kFirstLambda / 4;
  datum.dPhiV = 1800;
  datum.dLambdaV = 1800;
  datum.r1 = 55776;
  datum.dS = -799217;
  datum.addAt = 7397155;
  datum.addBt = 6078963;
  return datum;
}

velta::Rtcm1025 TransverseMercator() {
  velta::Rtcm1025 projection;
  projection.projectionType = velta::ProjectionData::TM;
  projection.loNO = 818181818;
  projection.addSNO = 700000000;
  projection.fe = 3500000000;
  return projection;
}

void Run(const std::vector<std::string>& call, const fs::path& out, const fs::path& err) {
  Require(velta_test::RunProgram(call, "/dev/null", out, err) == 0, call[0] + " " + call[1]);
}

}  // namespace

TransformWork::TransformWork(const fs::path& directory) : directory_(directory) {
  fs::create_directories(directory_);
  MakeFiles();
  MakePositions();
  ByVelta();
  ByCct();
  Compare();
}

void TransformWork::ByVelta() const {
  Run({PROGRAM, "transform", "--datum", In("NET.dff"), "--projection", In("NET.prj"),
       In("positions")},
      In("velta.out"), In("velta.err"));
}

void TransformWork::ByCct() const {
  Run({"cct", "-d", "5", "@" + In("pipeline").string(), In("positions")}, In("cct.out"),
      In("cct.err"));
}

void TransformWork::MakeFiles() const {
  const std::wstring place = (directory_ / "").wstring();
  velta::RTCMDataSupport support(place.c_str(), place.c_str());
  const velta::Rtcm1021 datum = Datum();
  const velta::Rtcm1025 projection = TransverseMercator();
  for (int i = 0; i < kWindows; ++i) {
    const velta::Rtcm1023 grid = WindowOf(i / kColumns, i % kColumns);
    velta::MsgUtilized set;
    set.msg1021 = &datum;
    set.msg1023 = &grid;
    set.msg1025 = &projection;
    set.info = {true, false, true, false, false};
    Require(support.ParseRTCMMEssages(set) == 0, "ingesting a set");
  }
  Run({PROGRAM, "export", "--format", "gtg", In("NET.dff"), "--hgrid", In("hor.tif"), "--vgrid",
       In("ver.tif")},
      In("export.out"), In("export.err"));
  Run({PROGRAM, "export", "--format", "proj", In("NET.dff"), In("NET.prj"), "--hgrid",
       In("hor.tif"), "--vgrid", In("ver.tif"), "-o", In("pipeline")},
      In("export.out"), In("export.err"));
}

void TransformWork::MakePositions() const {
  constexpr double kHalvesInDegree = 7200;
  const double north = (kFirstPhi + 1.5 * kNorthStep) / kHalvesInDegree;
  const double west = (kFirstLambda - 1.5 * kEastStep) / kHalvesInDegree;
  const double height = kWindows / kColumns * 3 * kNorthStep / kHalvesInDegree;
  const double width = kColumns * 3 * kEastStep / kHalvesInDegree;
  std::mt19937 random(1);
  std::uniform_real_distribution<> share(0.001, 0.999);
  std::ofstream positions(In("positions"));
  positions.precision(12);
  for (int i = 0; i < kPositions; ++i) {
    const double latitude = north - share(random) * height;
    const double longitude = west + share(random) * width;
    positions << latitude << ' ' << longitude << ' ' << 1000 * share(random) << '\n';
  }
}

void TransformWork::Compare() const {
  constexpr double kSame = 1e-4;  // metres
  std::ifstream ours(In("velta.out"));
  std::ifstream theirs(In("cct.out"));
  int count = 0;
  std::string time;
  for (double a[3], b[3]; ours >> a[0] >> a[1] >> a[2]; ++count) {
    Require(static_cast<bool>(theirs >> b[0] >> b[1] >> b[2] >> time), "reading what cct printed");
    for (int i = 0; i < 3; ++i) Require(std::abs(a[i] - b[i]) < kSame, "agreeing with cct");
  }
  Require(count == kPositions, "transforming all positions");
}

}  // namespace velta_bench
