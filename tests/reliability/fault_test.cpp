// Every file operation of a save fails, or is the last thing the process does, in turn.

#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <functional>

#include "file_faults.h"
#include "platform/registry_fixture.h"

namespace velta_test {
namespace {

/// A kind of save and what it may leave.
struct Scenario {
  const char* what;
  std::function<void(const RegistryFile&)> prepare;
  std::function<bool(const RegistryFile&)> save;
  const char* saved;  ///< what the tree describes once the save is done, and before it does not
};

bool AddNewFile(const RegistryFile& file) {
  orx::TCSInFileKey tree = RegistryFile::New();
  RegistryFile::AddEntry(tree, L"S_0", "made");
  return tree.Save(file.path.wstring(), false, 512);
}

bool ReplaceMost(const RegistryFile& file) {
  orx::TCSInFileKey tree = file.Load();
  RegistryFile::AddEntry(tree, L"big", std::string(3000, 'n'));
  return tree.Save(false, 512);
}

const Scenario kScenarios[] = {
    {"a new file", [](const RegistryFile&) {}, AddNewFile, "made"},
    {"an entry appended",
     [](const RegistryFile& file) {
       file.Create();
       file.Append(L"S_1", "acknowledged");
     },
     [](const RegistryFile& file) { return file.Append(L"S_2", "second"); }, "second"},
    {"an entry in the place of a save that never finished",
     [](const RegistryFile& file) {
       file.Create();
       file.Append(L"S_1", "acknowledged");
       const std::size_t whole = file.Bytes().size();
       file.Append(L"S_2", "never finished");
       file.SetBytes(file.Bytes().substr(0, whole + 70));
     },
     [](const RegistryFile& file) { return file.Append(L"S_3", "third"); }, "third"},
    {"a file written afresh",
     [](const RegistryFile& file) {
       file.Create();
       file.Append(L"S_1", "acknowledged");
       file.Append(L"big", std::string(9000, 'o'));
     },
     ReplaceMost, "nnnn"},
};

class SaveUnderFaults : public ::testing::TestWithParam<Scenario> {
 protected:
  /// Number of file operations that the save takes when nothing fails.
  int Operations() {
    const RegistryFile file;
    GetParam().prepare(file);
    const FileFaults counting(-1);
    EXPECT_TRUE(GetParam().save(file));
    return counting.count();
  }

  /// Whatever happened, what was acknowledged is there, the new entry is there if that was
  /// promised, and the next save works.
  void Check(const RegistryFile& file, const std::string& before, bool promised,
             const std::string& when) {
    SCOPED_TRACE(std::string(GetParam().what) + ", " + when);
    const bool exists = std::filesystem::exists(file.path);
    if (before.empty() && !exists) {
      EXPECT_FALSE(promised);
    } else {
      const orx::TCSInFileKey tree = file.Load();
      ASSERT_EQ(tree.GetErrorState(), orx::kRegistryOk);
      const std::string seen = Describe(tree);
      const bool isNew = seen.find(GetParam().saved) != std::string::npos;
      EXPECT_TRUE(isNew || (seen == before && !promised)) << seen;
      const bool kept = seen.find("S_1(0 value=1:1:acknowledged)") != std::string::npos;
      EXPECT_TRUE(kept || before.empty());
    }
    EXPECT_TRUE(GetParam().save(file) || before.empty());
    EXPECT_NE(Describe(file.Load()).find(GetParam().saved), std::string::npos);
  }
};

TEST_P(SaveUnderFaults, LosesNothingAndReportsItsFailure) {
  const int operations = Operations();
  ASSERT_GT(operations, 4);
  int failures = 0;
  for (const Fault fault : {Fault::kFail, Fault::kFailOn, Fault::kShort}) {
    for (int place = 0; place < operations; ++place) {
      const RegistryFile file;
      GetParam().prepare(file);
      const std::string before = std::filesystem::exists(file.path) ? Describe(file.Load()) : "";
      bool saved = false;
      {
        const FileFaults armed(place, fault, ENOSPC);
        saved = GetParam().save(file);
      }
      failures += saved ? 0 : 1;
      Check(file, before, saved, "operation " + std::to_string(place));
    }
  }
  EXPECT_GT(failures, operations) << "the faults reach the save";
}

TEST_P(SaveUnderFaults, AProcessKilledAnywhereLosesNothing) {
  const int operations = Operations();
  for (int place = 0; place <= operations; ++place) {
    const RegistryFile file;
    GetParam().prepare(file);
    const std::string before = std::filesystem::exists(file.path) ? Describe(file.Load()) : "";
    const pid_t child = fork();
    if (child == 0) {
      const FileFaults armed(place, Fault::kKill);
      _exit(GetParam().save(file) ? 0 : 1);
    }
    int status = 0;
    waitpid(child, &status, 0);
    const bool finished = WIFEXITED(status) && WEXITSTATUS(status) == 0;
    EXPECT_EQ(finished, place == operations) << "killed at each operation, and only there";
    Check(file, before, finished, "killed at operation " + std::to_string(place));
  }
}

std::string NameOf(const ::testing::TestParamInfo<Scenario>& scenario) {
  std::string name = scenario.param.what;
  std::replace(name.begin(), name.end(), ' ', '_');
  return name;
}

INSTANTIATE_TEST_SUITE_P(Saves, SaveUnderFaults, ::testing::ValuesIn(kScenarios), NameOf);

}  // namespace
}  // namespace velta_test
