// Processes that ingest and read the same file, killed at random: what one of them was told is safe
// stays, and no reader sees a broken tree. `--seconds=N` makes it run for N seconds, `--seed=N`
// repeats a run.

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <csignal>
#include <functional>
#include <iostream>
#include <random>
#include <set>
#include <vector>

#include "fleet_file.h"

namespace velta_test {
namespace {

using Clock = std::chrono::steady_clock;

double seconds = 3.0;
unsigned seed = 1;

/// Numbers are unique over all writers of a run.
constexpr std::uint32_t kNumbersOfAWriter = 10'000;

constexpr int kBrokenTree = 3;
constexpr int kRefused = 4;

class KillMachine {
 public:
  explicit KillMachine(unsigned seedOfRun) : random_(seedOfRun) {}
  ~KillMachine() {
    for (const Process& process : processes_) kill(process.id, SIGKILL);
    while (!processes_.empty()) Reap(processes_.size() - 1);
  }

  /// Starts a process that ingests new sets and reports each that it was told is safe.
  void StartWriter() {
    const std::uint32_t first = nextWriter_++ * kNumbersOfAWriter;
    Start(true, [this, first](int report) {
      const std::wstring directory = file_.directory();
      orx::cs::velta::RTCMDataSupport support(directory.c_str(), directory.c_str());
      orx::cs::velta::Rtcm1025 projection;
      projection.projectionType = 1;
      for (std::uint32_t number = first;; ++number) {
        projection.laNO = number;
        if (FleetFile::Ingest(support, number) != 0) _exit(kRefused);
        if (support.ParseProjectionMessages(projection, nullptr) != 0) _exit(kRefused);
        if (write(report, &number, sizeof number) != sizeof number) _exit(0);
      }
    });
  }

  /// Starts a process that reads the file over and over; it ends by itself only when it sees a
  /// broken tree, or fewer entries than before.
  void StartReader() {
    Start(false, [this](int) {
      std::size_t seen = 0;
      for (;;) {
        if (!std::filesystem::exists(file_.path())) continue;
        if (file_.Load().GetErrorState() != orx::kRegistryOk) _exit(kBrokenTree);
        const std::size_t now =
            orx::cs::velta::RTCMGenerator(1, file_.path(), L"").getAllDatums().size();
        if (now < seen) _exit(kBrokenTree);
        seen = now;
      }
    });
  }

  /// Lets the processes work a little while, then kills one of them.
  void KillOne() {
    usleep(std::uniform_int_distribution<useconds_t>(500, 30'000)(random_));
    const std::size_t victim = random_() % processes_.size();
    const bool wasWriter = processes_[victim].isWriter;
    kill(processes_[victim].id, SIGKILL);
    Reap(victim);
    if (wasWriter) {
      StartWriter();
    } else {
      StartReader();
    }
  }

  /// Everything that a process reported, up to now or up to its end, is in the file.
  void CheckAcknowledged() {
    for (const Process& process : processes_) Collect(process);
    if (acknowledged_.empty()) return;
    const orx::TCSInFileKey datums = file_.Load();
    const orx::TCSInFileKey projections(file_.directory() + L"ROVERS.prj", nullptr, nullptr, true,
                                        97);
    ASSERT_EQ(datums.GetErrorState(), orx::kRegistryOk);
    ASSERT_EQ(projections.GetErrorState(), orx::kRegistryOk);
    for (const std::uint32_t number : acknowledged_) {
      ASSERT_TRUE(FleetFile::Holds(datums, number)) << "lost: " << number;
      const std::wstring entry = L"S_" + std::to_wstring(number) + L"_0";
      ASSERT_TRUE(FleetFile::Holds(projections, entry)) << "lost projection: " << number;
    }
  }

  std::size_t acknowledged() const { return acknowledged_.size(); }

 private:
  struct Process {
    pid_t id;
    int reports;
    bool isWriter;
  };

  void Start(bool isWriter, const std::function<void(int report)>& work) {
    int ends[2];
    ASSERT_EQ(pipe2(ends, O_NONBLOCK), 0);
    const pid_t id = fork();
    if (id == 0) {
      close(ends[0]);
      work(ends[1]);
    }
    close(ends[1]);
    processes_.push_back({id, ends[0], isWriter});
  }

  void Collect(const Process& process) {
    std::uint32_t number = 0;
    while (read(process.reports, &number, sizeof number) == sizeof number) {
      acknowledged_.insert(number);
    }
  }

  void Reap(std::size_t place) {
    const Process process = processes_[place];
    processes_.erase(processes_.begin() + static_cast<std::ptrdiff_t>(place));
    int status = 0;
    waitpid(process.id, &status, 0);
    Collect(process);
    close(process.reports);
    const int answer = WIFEXITED(status) ? WEXITSTATUS(status) : 0;
    EXPECT_NE(answer, kBrokenTree) << "a reader saw a broken tree";
    EXPECT_NE(answer, kRefused) << "a writer was refused";
  }

  FleetFile file_;
  std::mt19937 random_;
  std::uint32_t nextWriter_ = 0;
  std::vector<Process> processes_;
  std::set<std::uint32_t> acknowledged_;
};

TEST(Killed, NothingAcknowledgedIsLostAndNoReaderSeesABrokenTree) {
  KillMachine machine(seed);
  machine.StartWriter();
  machine.StartWriter();
  machine.StartReader();
  const auto end = Clock::now() + std::chrono::duration<double>(seconds);
  int kills = 0;
  while (Clock::now() < end && !HasFailure()) {
    machine.KillOne();
    machine.CheckAcknowledged();
    ++kills;
  }
  std::cout << kills << " processes killed, " << machine.acknowledged() << " entries safe\n";
  EXPECT_GT(machine.acknowledged(), 10U) << "the machine did some work";
}

}  // namespace
}  // namespace velta_test

int main(int argc, char** argv) {
  ::testing::InitGoogleTest(&argc, argv);
  for (int i = 1; i < argc; ++i) {
    const std::string option = argv[i];
    if (option.rfind("--seconds=", 0) == 0) velta_test::seconds = std::stod(option.substr(10));
    if (option.rfind("--seed=", 0) == 0) {
      velta_test::seed = static_cast<unsigned>(std::stoul(option.substr(7)));
    }
  }
  return RUN_ALL_TESTS();
}
