// Memory runs out at every allocation of an ingestion, of a merge and of the queries, in turn.

#include <gtest/gtest.h>

#include <cstdlib>
#include <functional>
#include <new>

#include "fleet_file.h"

namespace {

/// Allocations until one fails; negative: none does.
long allocationsLeft = -1;

void* Allocate(std::size_t size) {
  if (allocationsLeft >= 0 && allocationsLeft-- == 0) return nullptr;
  return std::malloc(size == 0 ? 1 : size);
}

void* AllocateOrThrow(std::size_t size) {
  void* const memory = Allocate(size);
  if (!memory) throw std::bad_alloc();
  return memory;
}

}  // namespace

#define EXPORTED __attribute__((visibility("default")))
EXPORTED void* operator new(std::size_t size) { return AllocateOrThrow(size); }
EXPORTED void* operator new[](std::size_t size) { return AllocateOrThrow(size); }
EXPORTED void* operator new(std::size_t size, const std::nothrow_t&) noexcept {
  return Allocate(size);
}
EXPORTED void* operator new[](std::size_t size, const std::nothrow_t&) noexcept {
  return Allocate(size);
}
EXPORTED void operator delete(void* memory) noexcept { std::free(memory); }
EXPORTED void operator delete[](void* memory) noexcept { std::free(memory); }
EXPORTED void operator delete(void* memory, std::size_t) noexcept { std::free(memory); }
EXPORTED void operator delete[](void* memory, std::size_t) noexcept { std::free(memory); }
EXPORTED void operator delete(void* memory, const std::nothrow_t&) noexcept { std::free(memory); }
EXPORTED void operator delete[](void* memory, const std::nothrow_t&) noexcept { std::free(memory); }

namespace velta_test {
namespace {

namespace velta = orx::cs::velta;

/// Runs `work` again and again, each time with one more allocation that succeeds, until all do.
/// \return how often memory ran out
int RunOut(const std::function<void()>& work, const std::function<void()>& check) {
  for (int failures = 0;; ++failures) {
    allocationsLeft = failures;
    bool ranOut = false;
    try {
      work();
      ranOut = allocationsLeft < 0;
    } catch (const std::bad_alloc&) {
      ranOut = true;
    }
    allocationsLeft = -1;
    check();
    if (!ranOut || ::testing::Test::HasFailure()) return failures;
  }
}

TEST(OutOfMemory, AnIngestionPassesTheExceptionAndLeavesNothingHalf) {
  const FleetFile file;
  velta::RTCMDataSupport support(file.directory().c_str(), nullptr);
  ASSERT_EQ(FleetFile::Ingest(support, 0), 0);
  std::uint32_t number = 1;
  velta::ResultCode result = 0;
  const int failures = RunOut([&] { result = FleetFile::Ingest(support, number); },
                              [&] {
                                const orx::TCSInFileKey tree = file.Load();
                                ASSERT_EQ(tree.GetErrorState(), orx::kRegistryOk);
                                ASSERT_TRUE(FleetFile::Holds(tree, 0));
                                // The set again: locks are free, and nothing half is in the way.
                                ASSERT_EQ(FleetFile::Ingest(support, number), 0);
                                ASSERT_TRUE(FleetFile::Holds(file.Load(), number)) << number;
                                ++number;
                              });
  EXPECT_GT(failures, 50);
  EXPECT_EQ(result, 0);
  EXPECT_EQ(velta::RTCMGenerator(1, file.path(), L"").getAllDatums().size(), number);
}

TEST(OutOfMemory, AFirstIngestionAndAMergeDoToo) {
  const FleetFile file;
  velta::RTCMDataSupport support(file.directory().c_str(), nullptr);
  ASSERT_EQ(FleetFile::Ingest(support, 7, "OTHER"), 0);
  std::uint32_t number = 0;
  // Without two equal digits side by side, which would become one in the file's name.
  const auto name = [&] {
    return "N" + std::to_string(number / 100) + "a" + std::to_string(number / 10 % 10) + "b" +
           std::to_string(number % 10);
  };
  const int failures = RunOut(
      [&] {
        FleetFile::Ingest(support, 3, name());
        velta::RTCMDataSupport::MergeRTCMDatumfiles(file.path(name()), file.path("OTHER"));
      },
      [&] {
        ASSERT_EQ(FleetFile::Ingest(support, 3, name()), 0);
        ASSERT_EQ(
            velta::RTCMDataSupport::MergeRTCMDatumfiles(file.path(name()), file.path("OTHER")), 0);
        ASSERT_EQ(velta::RTCMGenerator(1, file.path(name()), L"").getAllDatums().size(), 2U);
        ++number;
      });
  EXPECT_GT(failures, 100);
}

TEST(OutOfMemory, AQueryPassesTheExceptionAndAnswersTheNextTime) {
  const FleetFile file;
  velta::RTCMDataSupport support(file.directory().c_str(), nullptr);
  for (std::uint32_t i = 0; i < 3; ++i) ASSERT_EQ(FleetFile::Ingest(support, i), 0);
  const velta::RTCMGenerator generator(1, file.path(), L"");
  const double latitude = 300'000 * 2.42406840554768e-6;  // of set 0, radians
  const double longitude = 36'000 * 2.42406840554768e-6;
  const auto query = [&] {
    return generator.getAllDatums().size() == 3 && generator.get1023(latitude, longitude, 0) &&
           generator.getRtcmDatumMessage(latitude, longitude, 0);
  };
  bool answered = false;
  const int failures =
      RunOut([&] { answered = query(); }, [&] { ASSERT_TRUE(query()) << "the next call"; });
  EXPECT_GT(failures, 20);
  EXPECT_TRUE(answered);
}

}  // namespace
}  // namespace velta_test
