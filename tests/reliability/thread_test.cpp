// Threads that follow the rules: construction and ingestion one at a time, the shared files through
// their locks, queries whenever they like.

#include <gtest/gtest.h>

#include <atomic>
#include <boost/thread/lock_types.hpp>
#include <mutex>
#include <thread>
#include <vector>

#include "fleet.h"
#include "support/temporary_directory.h"

namespace velta_test {
namespace {

TEST(Threads, IngestMergeLookAndQueryWithoutLoss) {
  constexpr std::uint32_t kSets = 25;
  const TemporaryDirectory directory;
  Fleet fleet((directory / "").wstring());
  ASSERT_TRUE(fleet.IngestBoth(0));
  for (std::uint32_t i = 1; i <= kSets; ++i) ASSERT_TRUE(fleet.Ingest(1000 + i, "SOURCE"));

  std::atomic<bool> done{false};
  std::mutex ingestion;
  const auto ingest = [&](std::uint32_t first) {
    for (std::uint32_t i = 1; i <= kSets; ++i) {
      const std::lock_guard<std::mutex> oneAtATime(ingestion);
      EXPECT_TRUE(fleet.IngestBoth(first + i));
    }
  };
  const auto merge = [&] {
    for (int i = 0; i < 3; ++i) EXPECT_TRUE(fleet.Merge(fleet.directory + L"SOURCE.dff"));
  };
  const auto look = [&] {
    while (!done) {
      orx::TCSInFileKey* shared = nullptr;
      ASSERT_EQ(RTCMDataSupport::GetUnlockedPtrDatumGFF(fleet.datums, &shared), 0);
      {
        const boost::unique_lock<boost::recursive_mutex> lock(shared->GetMutex());
        EXPECT_TRUE(HoldsDatum(*shared, 0));
      }
      RTCMDataSupport::ReleasePtrDatumGFF(fleet.datums);
    }
  };
  const auto query = [&] {
    while (!done) EXPECT_EQ(fleet.Unanswered(), "");
  };

  std::vector<std::thread> readers;
  std::vector<std::thread> writers;
  for (const std::uint32_t first : {2000U, 3000U}) {
    readers.emplace_back(query);
    readers.emplace_back(look);
    writers.emplace_back(ingest, first);
    writers.emplace_back(merge);
  }
  for (std::thread& thread : writers) thread.join();
  done = true;
  for (std::thread& thread : readers) thread.join();

  const orx::TCSInFileKey datums = LoadTree(fleet.datums);
  const orx::TCSInFileKey projections = LoadTree(fleet.projections);
  for (std::uint32_t i = 1; i <= kSets; ++i) {
    EXPECT_TRUE(HoldsDatum(datums, 1000 + i)) << i;
    for (const std::uint32_t number : {2000 + i, 3000 + i}) {
      EXPECT_TRUE(HoldsDatum(datums, number)) << number;
      EXPECT_TRUE(HoldsProjection(projections, number)) << number;
    }
  }
}

}  // namespace
}  // namespace velta_test
