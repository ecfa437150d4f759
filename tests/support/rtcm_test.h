#pragma once

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "support/file_bytes.h"
#include "support/gff_tree.h"
#include "support/message_samples.h"
#include "support/temporary_directory.h"
#include "velta/rtcm_data_support.h"
#include "velta/rtcm_generator.h"

namespace velta_test {

using namespace orx::cs::velta;

constexpr double kPi = 3.141592653589793;
constexpr double kTwoSeconds = 9.69627362219072e-06;  // radians
constexpr double kHalfSecond = 2.42406840554768e-06;  // radians
constexpr auto kNoSuchFile = static_cast<ResultCode>(0x80070002);

/// Names of the files that the samples become.
constexpr const char* kDhdn = "AUTO_DHDN_BESEL";
constexpr const char* kBadekas = "Local_B_O_7";

/// What of a set is handed over beside the datum message.
enum Parts : unsigned { kDatum = 0, kGrid = 1, kPlaneGrid = 2, kProjection = 4, kAllParts = 7 };

/// An ingestion object with directories of its own, which do not exist yet.
class RtcmTest : public testing::Test {
 protected:
  TemporaryDirectory directory_;
  std::filesystem::path datums_ = directory_ / "new" / "datums";
  std::filesystem::path projections_ = directory_ / "new" / "projections";
  std::wstring datumPath_ = datums_.wstring() + L"/";
  std::wstring projectionPath_ = projections_.wstring() + L"/";
  RTCMDataSupport support_{datumPath_.c_str(), projectionPath_.c_str()};

  template <class Datum, class Projection>
  ResultCode Ingest(const MessageSet<Datum, Projection>& set, unsigned parts) {
    MsgUtilized messages;
    if constexpr (std::is_same_v<Datum, Rtcm1021>) {
      messages.msg1021 = &set.datum;
      messages.msg1025 = &set.projection;
      messages.info.use1025 = (parts & kProjection) != 0;
    } else {
      messages.msg1022 = &set.datum;
      messages.msg1027 = &set.projection;
      messages.info.use1027 = (parts & kProjection) != 0;
    }
    messages.msg1023 = &set.grid;
    messages.msg1024 = &set.planeGrid;
    messages.info.use1023 = (parts & kGrid) != 0;
    messages.info.use1024 = (parts & kPlaneGrid) != 0;
    return support_.ParseRTCMMEssages(messages);
  }

  std::filesystem::path DatumFile(const std::string& name = kDhdn) const {
    return datums_ / (name + ".dff");
  }
  std::filesystem::path ProjectionFile(const std::string& name = kDhdn) const {
    return projections_ / (name + ".prj");
  }
  RTCMGenerator Generator(const std::string& name = kDhdn) const {
    return {77, DatumFile(name).wstring(), ProjectionFile(name).wstring()};
  }
};

}  // namespace velta_test
