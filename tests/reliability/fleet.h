#pragma once

#include <string>

#include "fuzz/record_tree.h"
#include "orxregistry/in_file_key.h"
#include "support/file_bytes.h"
#include "support/numbered_set.h"
#include "velta/rtcm_data_support.h"
#include "velta/rtcm_generator.h"

namespace velta_test {

using orx::cs::velta::RTCMDataSupport;
using orx::cs::velta::RTCMGenerator;

inline orx::TCSInFileKey LoadTree(const std::wstring& path) {
  return {path, nullptr, nullptr, true, orx::kRegistryFlags};
}

inline orx::TGenericRegistryKey ContainerOf(const orx::TInFileKey& tree) {
  const orx::TGenericRegistryKey root{orx::TGenericRegistryKeyPtr(tree)};
  return orx::TGenericRegistryKey(orx::TGenRegKeyIterator(root)++);
}

inline bool HoldsDatum(const orx::TInFileKey& tree, std::uint32_t number) {
  return ContainerOf(tree).HasKey(NumberedSet(number).EntryName());
}
inline bool HoldsProjection(const orx::TInFileKey& tree, std::uint32_t number) {
  return ContainerOf(tree).HasKey(L"S_" + std::to_wstring(number) + L"_0");
}

/// The files that numbered sets go into, and an object that puts them there.
struct Fleet {
  /// \param path of the directory, ending in a separator
  explicit Fleet(const std::wstring& path) : directory(path) {}

  bool Ingest(std::uint32_t number, const std::string& datumName = "ROVERS") {
    const NumberedSet set(number, datumName);
    return (result = support.ParseDatumMessages(set.datum, &set.grid)) == 0;
  }
  /// A datum and a projection.
  bool IngestBoth(std::uint32_t number) {
    orx::cs::velta::Rtcm1025 projection;
    projection.projectionType = 1;
    projection.laNO = number;
    return Ingest(number) && (result = support.ParseProjectionMessages(projection, nullptr)) == 0;
  }
  bool Merge(const std::wstring& source) const {
    return RTCMDataSupport::MergeRTCMDatumfiles(datums, source) == 0;
  }

  /// Has the files, of a set each, get an index of small nodes, so that a few sets fill some.
  void UseSmallNodes() const {
    for (const std::wstring& path : {datums, projections}) {
      WriteBytes(path, velta_fuzz::WithFanOut(3, ReadBytes(path)));
    }
  }

  /// The queries that do not find set 0, the first: none.
  std::string Unanswered() const {
    const double latitude = 300'000 * 2.42406840554768e-6;
    const double longitude = 36'000 * 2.42406840554768e-6;
    const RTCMGenerator generator(1, datums, projections);
    std::string unanswered;
    if (generator.getAllDatums().empty()) unanswered += "list ";
    if (!generator.getRtcmProjMessage()) unanswered += "projection ";
    if (!generator.getRtcmDatumMessage(latitude, longitude, 0)) unanswered += "datum ";
    if (!generator.get1023(latitude, longitude, 0)) unanswered += "1023 ";
    return unanswered;
  }

  const std::wstring directory;
  const std::wstring datums = directory + L"ROVERS.dff";
  const std::wstring projections = directory + L"ROVERS.prj";
  RTCMDataSupport support{directory.c_str(), directory.c_str()};
  orx::cs::velta::ResultCode result = 0;  ///< of the last ingestion
};

}  // namespace velta_test
