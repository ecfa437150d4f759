#pragma once

#include <gtest/gtest.h>

#include "support/file_bytes.h"
#include "support/gff_tree.h"
#include "support/temporary_directory.h"
#include "support/worked_messages.h"
#include "velta/rtcm_data_support.h"
#include "velta/rtcm_generator.h"

namespace velta_test {

using namespace orx::cs::velta;

constexpr double kPi = 3.141592653589793;
constexpr double kHalfSecond = 2.42406840554768e-06;  // radians

/// Names of the files that the worked messages become.
constexpr auto *kDhdn = "AUTO_DHDN_BESEL", *kLocal = "Local_B_O_7";

/// What of the messages is handed over.
enum Parts { k1021 = 1, k1022 = 2, k1023 = 4, k1024 = 8, k1025 = 16, k1027 = 32 };
constexpr int kDhdnSet = k1021 | k1023 | k1024 | k1025;
constexpr int kLocalSet = k1022 | k1023 | k1024 | k1027;

/// A message's fields by their names; null when there is no message.
inline Json ToJson(const RtcmMessage* message) {
  return message ? Json::parse(JsonOf(orx::cs::velta::rtcm3::FromRecord(*message))) : Json();
}

/// The worked messages, and an ingestion object with directories of its own, which do not exist
/// yet. The 1021 and the 1025 are of one system, the 1022 and the 1027 of another.
class RtcmTest : public testing::Test {
 protected:
  MsgUtilized Set(int parts) const {
    MsgUtilized set;
    if (parts & k1021) set.msg1021 = &m1021_;
    if (parts & k1022) set.msg1022 = &m1022_;
    set.msg1023 = &m1023_;
    set.msg1024 = &m1024_;
    set.msg1025 = &m1025_;
    set.msg1027 = &m1027_;
    set.info = {!!(parts & k1023), !!(parts & k1024), !!(parts & k1025), false, !!(parts & k1027)};
    return set;
  }
  ResultCode Ingest(int parts) {
    MsgUtilized set = Set(parts);
    return support_.ParseRTCMMEssages(set);
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

  TemporaryDirectory directory_;
  const std::filesystem::path datums_ = directory_ / "new/datums";
  const std::filesystem::path projections_ = directory_ / "new/projections";
  const std::wstring datumPath_ = datums_.wstring() + L"/";
  const std::wstring projectionPath_ = projections_.wstring() + L"/";
  RTCMDataSupport support_{datumPath_.c_str(), projectionPath_.c_str()};

  Rtcm1021 m1021_ = WorkedRecord<Rtcm1021>(1021);
  Rtcm1022 m1022_ = WorkedRecord<Rtcm1022>(1022);
  Rtcm1023 m1023_ = WorkedRecord<Rtcm1023>(1023);
  Rtcm1024 m1024_ = WorkedRecord<Rtcm1024>(1024);
  Rtcm1025 m1025_ = WorkedRecord<Rtcm1025>(1025);
  Rtcm1027 m1027_ = WorkedRecord<Rtcm1027>(1027);
};

}  // namespace velta_test
