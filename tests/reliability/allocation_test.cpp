// Memory runs out at every allocation of an ingestion, of a merge and of the queries, in turn.

#include <dlfcn.h>
#include <gtest/gtest.h>

#include <boost/thread/lock_types.hpp>
#include <cstdlib>
#include <future>
#include <new>

#include "fleet.h"
#include "support/temporary_directory.h"

namespace {

/// Allocations until one fails; negative: none does.
long allocationsLeft = -1;
/// Allocations that have not been given back.
long allocated = 0;

bool RunsOut() { return allocationsLeft >= 0 && allocationsLeft-- == 0; }

void* Allocate(std::size_t size) {
  if (RunsOut()) return nullptr;
  ++allocated;
  return std::malloc(size == 0 ? 1 : size);
}

void GiveBack(void* memory) {
  if (memory) --allocated;
  std::free(memory);
}

void* AllocateOrThrow(std::size_t size) {
  void* const memory = Allocate(size);
  if (!memory) throw std::bad_alloc();
  return memory;
}

}  // namespace

#define EXPORTED __attribute__((visibility("default")))
// The forms that are not here end up in these.
EXPORTED void* operator new(std::size_t size) { return AllocateOrThrow(size); }
EXPORTED void* operator new(std::size_t size, const std::nothrow_t&) noexcept {
  return Allocate(size);
}
EXPORTED void operator delete(void* memory) noexcept { GiveBack(memory); }
EXPORTED void operator delete(void* memory, std::size_t) noexcept { GiveBack(memory); }
/// Files are read into such memory.
extern "C" EXPORTED void* aligned_alloc(std::size_t alignment, std::size_t size) noexcept {
  static auto* const real =
      reinterpret_cast<decltype(&aligned_alloc)>(dlsym(RTLD_NEXT, "aligned_alloc"));
  return RunsOut() ? nullptr : real(alignment, size);
}

namespace velta_test {
namespace {

/// Something that takes memory, another set each time.
struct Case {
  const char* what;
  bool (*work)(Fleet& fleet, std::uint32_t number);
  int exceptions;  ///< at least
  bool addsEntry;
};

const Case kCases[] = {
    {"Ingestion", [](Fleet& fleet, std::uint32_t number) { return fleet.IngestBoth(number); }, 100,
     true},
    {"FirstIngestion",
     [](Fleet& fleet, std::uint32_t number) {
       return Fleet(fleet.directory + std::to_wstring(number) + L"/").IngestBoth(number);
     },
     200, false},
    {"Merge",
     [](Fleet& fleet, std::uint32_t number) {
       return fleet.Ingest(number, "OTHER") && fleet.Merge(fleet.directory + L"OTHER.dff");
     },
     100, true},
    {"Queries", [](Fleet& fleet, std::uint32_t) { return fleet.Unanswered().empty(); }, 50, false},
};

/// No lock of the shared files is held; a thread that holds one could always take it again.
bool LocksAreFree(Fleet& fleet) {
  const auto isFree = [](orx::TCSInFileKey* file) {
    return boost::unique_lock<boost::recursive_mutex>(file->GetMutex(), boost::try_to_lock)
        .owns_lock();
  };
  return fleet.IngestBoth(0) &&
         std::async(std::launch::async, isFree, RTCMDataSupport::GFFDatumFile).get() &&
         std::async(std::launch::async, isFree, RTCMDataSupport::GFFProjectionFile).get();
}

/// Every entry in the file is one that the list of datums has.
bool HasOnlyWholeEntries(const Fleet& fleet) {
  const orx::TCSInFileKey tree = LoadTree(fleet.datums);
  std::size_t entries = 0;
  for (orx::TGenRegKeyIterator walk(ContainerOf(tree)); walk; walk++) ++entries;
  return RTCMGenerator(1, fleet.datums, L"").getAllDatums().size() == entries;
}

/// Also while somebody else has the shared file.
class OutOfMemory : public testing::TestWithParam<std::tuple<Case, bool>> {};

TEST_P(OutOfMemory, IsReportedAndLeavesNothingHalf) {
  const auto& [what, work, minimum, addsEntry] = std::get<Case>(GetParam());
  const TemporaryDirectory directory;
  Fleet fleet((directory / "./").wstring());  // a name to be made whole
  ASSERT_TRUE(fleet.IngestBoth(0));
  fleet.UseSmallNodes();
  int exceptions = 0;
  bool ranOut = true;
  for (std::uint32_t number = 1; ranOut && !HasFailure(); ++number) {
    SCOPED_TRACE(number);
    std::filesystem::remove(directory / "OTHER.dff");
    bool answered = false;
    orx::TCSInFileKey* shared = nullptr;
    if (std::get<bool>(GetParam())) fleet.support.GetUnlockedPtrDatumGFF(fleet.datums, &shared);
    allocationsLeft = number - 1;
    try {
      answered = work(fleet, number);
    } catch (const std::bad_alloc&) {
      ++exceptions;
    }
    ranOut = allocationsLeft < 0;
    allocationsLeft = -1;
    if (!ranOut) {
      EXPECT_TRUE(answered);
    }
    EXPECT_EQ(fleet.Unanswered(), "");
    EXPECT_TRUE(LocksAreFree(fleet));
    if (answered) {
      EXPECT_EQ(HoldsDatum(LoadTree(fleet.datums), number), addsEntry);
    }
    EXPECT_TRUE(work(fleet, number)) << "the next call";
    EXPECT_EQ(HoldsDatum(LoadTree(fleet.datums), number), addsEntry);
    EXPECT_TRUE(HasOnlyWholeEntries(fleet));
    if (shared) fleet.support.ReleasePtrDatumGFF(fleet.datums);
  }
  EXPECT_GT(exceptions, minimum);
}

TEST(Sibling, KeepsNothingOfANameThatNoFileHas) {
  const TemporaryDirectory directory;
  Fleet fleet((directory / "").wstring());
  ASSERT_TRUE(fleet.Ingest(0));
  orx::TCSInFileKey* file = nullptr;
  const long before = allocated;
  EXPECT_NE(RTCMDataSupport::GetUnlockedPtrDatumGFF(fleet.directory + L"none.dff", &file), 0);
  EXPECT_EQ(allocated, before);
}

INSTANTIATE_TEST_SUITE_P(In, OutOfMemory,
                         testing::Combine(testing::ValuesIn(kCases), testing::Bool()),
                         [](const auto& test) {
                           const bool isShared = std::get<bool>(test.param);
                           return std::get<Case>(test.param).what +
                                  std::string(isShared ? "OfASharedFile" : "");
                         });

}  // namespace
}  // namespace velta_test
