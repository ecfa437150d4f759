#include "fresh_process.h"

#include <sys/wait.h>
#include <unistd.h>

#include <fstream>
#include <functional>
#include <memory>

#include "limits.h"
#include "workload.h"

namespace velta_bench {
namespace fs = std::filesystem;
namespace velta = orx::cs::velta;
namespace {

/// The call, and in front of it all that it needs.
std::function<bool()> Prepare(const std::string& work, const fs::path& file, std::uint32_t number) {
  if (work == kDoNothing) return [] { return true; };
  const MessageSet set(number);
  if (work == kIngest) {
    const fs::path directory = file.parent_path() / "";
    const auto support =
        std::make_shared<velta::RTCMDataSupport>(directory.wstring().c_str(), nullptr);
    return [=] { return support->ParseDatumMessages(set.datum, &set.grid) == 0; };
  }
  const velta::RTCMGenerator generator(1, file.wstring(), L"");
  if (work == kAskForAll) return [=] { return !generator.getAllDatums().empty(); };
  const Position at = MiddleOf(set);
  for (const Query& query : kQueries) {
    if (work == query.name) return [=] { return query.ask(generator, at); };
  }
  return [] { return false; };
}

/// The system's own account of it, as getrusage() counts what a process was before it became
/// another program.
double PeakMemory() {
  constexpr double kKibibyte = 1024.0;
  const std::string label = "VmHWM:";
  std::ifstream status("/proc/self/status");
  std::string word;
  while (status >> word && word != label) continue;
  double kibibytes = 0.0;
  Require(static_cast<bool>(status >> kibibytes), "asking for the peak memory");
  return kibibytes * kKibibyte;
}

}  // namespace

FreshRun RunInFreshProcess(const std::string& work, const fs::path& file, std::uint32_t number) {
  const char* const program = "/proc/self/exe";
  const std::string numberText = std::to_string(number);
  int ends[2];
  Require(pipe(ends) == 0, "making a pipe");
  const pid_t child = fork();
  if (child == 0) {
    dup2(ends[1], STDOUT_FILENO);
    execl(program, program, kFreshOption, work.c_str(), file.c_str(), numberText.c_str(),
          static_cast<char*>(nullptr));
    _exit(EXIT_FAILURE);
  }
  close(ends[1]);
  FreshRun run = {};
  Require(read(ends[0], &run, sizeof run) == sizeof run, work + " in a fresh process");
  close(ends[0]);
  waitpid(child, nullptr, 0);
  return run;
}

void WorkAsFreshProcess(const std::string& work, const fs::path& file, std::uint32_t number) {
  const std::function<bool()> call = Prepare(work, file, number);
  bool done = false;
  const double seconds = SecondsOf([&] { done = call(); });
  Require(done, work);
  const FreshRun run{seconds, PeakMemory()};
  Require(write(STDOUT_FILENO, &run, sizeof run) == sizeof run, "telling the figures");
}

}  // namespace velta_bench
