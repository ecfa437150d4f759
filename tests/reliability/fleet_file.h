#pragma once

#include <gtest/gtest.h>

#include <filesystem>
#include <string>

#include "orxregistry/in_file_key.h"
#include "support/numbered_set.h"
#include "support/temporary_directory.h"
#include "velta/rtcm_data_support.h"
#include "velta/rtcm_generator.h"

namespace velta_test {

/// A directory with the datum file that numbered sets go into.
class FleetFile {
 public:
  std::wstring directory() const { return (directory_ / "").wstring(); }
  std::wstring path() const { return (directory_ / "ROVERS.dff").wstring(); }
  std::wstring path(const std::string& datumName) const {
    return (directory_ / (datumName + ".dff")).wstring();
  }

  static orx::cs::velta::ResultCode Ingest(orx::cs::velta::RTCMDataSupport& support,
                                           std::uint32_t number,
                                           const std::string& datumName = "ROVERS") {
    const NumberedSet set(number, datumName);
    return support.ParseDatumMessages(set.datum, &set.grid);
  }

  /// The file as it is now.
  orx::TCSInFileKey Load() const { return {path(), nullptr, nullptr, true, 97}; }

  static bool Holds(const orx::TCSInFileKey& tree, std::uint32_t number) {
    return Holds(tree, NumberedSet(number).EntryName());
  }
  static bool Holds(const orx::TCSInFileKey& tree, const std::wstring& entry) {
    const orx::TGenericRegistryKey root{orx::TGenericRegistryKeyPtr(tree)};
    const orx::TGenericRegistryKey container(orx::TGenRegKeyIterator(root)++);
    return container.HasKey(entry);
  }

 private:
  TemporaryDirectory directory_;
};

}  // namespace velta_test
