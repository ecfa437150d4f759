// Processes that write and read the same files, killed at random: what one of them was told is safe
// stays, and no reader sees a broken tree.
//
// A round takes three seconds; kill_tests --gtest_repeat=N runs N, each with the next seed, and
// --gtest_random_seed=N begins with that one.

#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <csignal>
#include <iostream>
#include <random>
#include <vector>

#include "fleet.h"
#include "platform/registry_fixture.h"

namespace velta_test {
namespace {

using Clock = std::chrono::steady_clock;

constexpr std::chrono::seconds kRound{3};
constexpr std::uint32_t kNumbersOfAProcess = 10'000;

/// What a process does over and over, with another number each time.
struct Role {
  const char* name;
  /// \return true when it was told that the number is safe, or saw whole trees
  bool (*work)(const std::wstring& directory, std::uint32_t number);
  bool (*isSafe)(const orx::TInFileKey& datums, const orx::TInFileKey& projections,
                 std::uint32_t number);
};

const Role kRoles[] = {
    {"ingest",
     [](const std::wstring& directory, std::uint32_t number) {
       static Fleet fleet(directory);
       return fleet.IngestBoth(number);
     },
     [](const auto& datums, const auto& projections, std::uint32_t number) {
       return HoldsDatum(datums, number) && HoldsProjection(projections, number);
     }},
    {"merge",
     [](const std::wstring& directory, std::uint32_t number) {
       static Fleet own(directory + std::to_wstring(getpid()) + L"/");
       std::filesystem::remove(own.datums);
       return own.Ingest(number) &&
              RTCMDataSupport::MergeRTCMDatumfiles(directory + L"ROVERS.dff", own.datums) == 0;
     },
     [](const auto& datums, const auto&, auto number) { return HoldsDatum(datums, number); }},
    {"replace",  // a large value, so that the file is written afresh again and again
     [](const std::wstring& directory, std::uint32_t number) {
       orx::TCSInFileKey tree = LoadTree(directory + L"ROVERS.dff");
       const std::string text = std::to_string(number) + std::string(10'000, ' ');
       ContainerOf(tree).AddValue(L"replaced", RawValue::Block(text), 1, true);
       return tree.Save(false, orx::kRegistryVersion);
     },
     [](const auto& datums, const auto&, std::uint32_t number) {
       RawValue value;
       ContainerOf(datums).GetValue(L"replaced", value, 0, true);
       return std::atol(value.bytes().c_str()) >= number;
     }},
    {"read",
     [](const std::wstring& directory, std::uint32_t) {
       static const Fleet fleet(directory);
       for (const std::wstring& path : {fleet.datums, fleet.projections}) {
         const orx::TCSInFileKey tree = LoadTree(path);
         if (Describe(tree).empty() || tree.GetErrorState() != orx::kRegistryOk) return false;
       }
       return fleet.Unanswered().empty();
     },
     [](const auto&, const auto&, auto) { return true; }},
};

class KillMachine {
 public:
  explicit KillMachine(unsigned seed) : random_(seed) {
    Fleet fleet(path_);
    EXPECT_TRUE(fleet.IngestBoth(0));
    fleet.UseSmallNodes();
    for (const Role& role : kRoles) Start(role);
    Start(kRoles[0]);
  }
  ~KillMachine() {
    for (const Process& process : processes_) Kill(process);
  }

  /// Lets the processes work a little while, then kills one of them and starts another.
  void KillOne() {
    usleep(std::uniform_int_distribution<useconds_t>(500, 30'000)(random_));
    const auto victim = processes_.begin() + static_cast<int>(random_() % processes_.size());
    const Process killed = *victim;
    processes_.erase(victim);
    Kill(killed);
    Start(*killed.role);
  }

  /// Everything that was reported is in the files.
  std::size_t Check() const {
    const orx::TCSInFileKey datums = LoadTree(path_ + L"ROVERS.dff");
    const orx::TCSInFileKey projections = LoadTree(path_ + L"ROVERS.prj");
    for (const auto& [role, number] : reported_) {
      EXPECT_TRUE(role->isSafe(datums, projections, number)) << role->name << " lost " << number;
    }
    return reported_.size();
  }

 private:
  struct Process {
    const Role* role;
    pid_t id;
    int reports;
  };

  void Start(const Role& role) {
    std::uint32_t number = nextNumber_ += kNumbersOfAProcess;
    int ends[2];
    ASSERT_EQ(pipe(ends), 0);
    const pid_t id = fork();
    if (id == 0) {
      for (; role.work(path_, number); ++number) {
        if (write(ends[1], &number, sizeof number) < 0) break;
      }
      _exit(1);
    }
    close(ends[1]);
    processes_.push_back({&role, id, ends[0]});
  }

  void Kill(const Process& process) {
    kill(process.id, SIGKILL);
    int status = 0;
    waitpid(process.id, &status, 0);
    EXPECT_TRUE(WIFSIGNALED(status)) << process.role->name << " was refused or saw a broken tree";
    std::uint32_t number = 0;
    while (read(process.reports, &number, sizeof number) == sizeof number) {
      reported_.emplace_back(process.role, number);
    }
    close(process.reports);
  }

  const TemporaryDirectory directory_;
  const std::wstring path_ = (directory_ / "").wstring();
  std::mt19937 random_;
  std::uint32_t nextNumber_ = 0;
  std::vector<Process> processes_;
  std::vector<std::pair<const Role*, std::uint32_t>> reported_;
};

TEST(Killed, NothingReportedIsLostAndNoReaderSeesABrokenTree) {
  static int round = 0;
  const int seed = testing::UnitTest::GetInstance()->random_seed() + round++;
  KillMachine machine(static_cast<unsigned>(seed));
  std::size_t kills = 0;
  for (const auto end = Clock::now() + kRound; Clock::now() < end && !HasFailure(); ++kills) {
    machine.KillOne();
    machine.Check();
  }
  std::cout << kills << " processes killed, " << machine.Check() << " reports, seed " << seed
            << "\n";
  EXPECT_GT(machine.Check(), kills) << "the machine did some work";
}

}  // namespace
}  // namespace velta_test
