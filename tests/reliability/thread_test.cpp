// Threads that follow the rules: construction and ingestion one at a time, the shared files through
// their locks, queries whenever they like.

#include <gtest/gtest.h>

#include <atomic>
#include <functional>
#include <mutex>
#include <thread>
#include <vector>

#include "fleet_file.h"

namespace velta_test {
namespace {

namespace velta = orx::cs::velta;

constexpr std::uint32_t kSets = 25;

TEST(Threads, IngestMergeAndQueryOneFileWithoutLoss) {
  const FleetFile file;
  velta::RTCMDataSupport support(file.directory().c_str(), nullptr);
  ASSERT_EQ(FleetFile::Ingest(support, 0), 0);
  std::mutex ingestion;
  // Merged in by the merging threads; made beforehand, as other programs' files are.
  for (const std::uint32_t source : {0U, 1U}) {
    for (std::uint32_t i = 0; i < kSets; ++i) {
      ASSERT_EQ(
          FleetFile::Ingest(support, 2000 + source * kSets + i, "SOURCE" + std::to_string(source)),
          0);
    }
  }

  const auto ingest = [&](std::uint32_t thread) {
    for (std::uint32_t i = 0; i < kSets; ++i) {
      const std::lock_guard<std::mutex> oneAtATime(ingestion);
      ASSERT_EQ(FleetFile::Ingest(support, 1000 + thread * kSets + i), 0);
    }
  };
  const auto merge = [&](std::uint32_t source) {
    const std::wstring path = file.path("SOURCE" + std::to_string(source));
    for (int i = 0; i < 3; ++i) {
      ASSERT_EQ(velta::RTCMDataSupport::MergeRTCMDatumfiles(file.path(), path), 0);
    }
  };
  std::atomic<bool> done{false};
  const velta::RTCMGenerator generator(1, file.path(), L"");
  const auto query = [&](std::uint32_t) {
    const double latitude = 300'000 * 2.42406840554768e-6;  // of set 0, radians
    const double longitude = 36'000 * 2.42406840554768e-6;
    while (!done) {
      EXPECT_FALSE(generator.getAllDatums().empty());
      EXPECT_NE(generator.get1023(latitude, longitude, 0), nullptr);
      EXPECT_NE(generator.getRtcmDatumMessage(latitude, longitude, 0), nullptr);
    }
  };

  std::vector<std::thread> writers;
  std::vector<std::thread> readers;
  for (const std::uint32_t i : {0U, 1U}) {
    readers.emplace_back(query, i);
    writers.emplace_back(ingest, i);
    writers.emplace_back(merge, i);
  }
  for (std::thread& thread : writers) thread.join();
  done = true;
  for (std::thread& thread : readers) thread.join();

  const orx::TCSInFileKey tree = file.Load();
  for (std::uint32_t i = 0; i < 2 * kSets; ++i) {
    EXPECT_TRUE(FleetFile::Holds(tree, 1000 + i)) << i;
    EXPECT_TRUE(FleetFile::Holds(tree, 2000 + i)) << i;
  }
  EXPECT_EQ(generator.getAllDatums().size(), 1 + 4 * kSets);
}

}  // namespace
}  // namespace velta_test
