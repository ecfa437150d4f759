// Every file operation of a save fails, or is the last thing the process does, in turn.

#include <dlfcn.h>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <pthread.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <climits>
#include <functional>
#include <optional>
#include <utility>

#include "file_faults.h"
#include "fleet.h"
#include "platform/registry_fixture.h"

namespace {

/// Work to be done in front of one of the times that a lock is taken.
struct WatchedLock {
  pthread_mutex_t* lock = nullptr;
  int times = 0;
  std::function<void()> work;
};
WatchedLock watched;

}  // namespace

/// In the place of the C library's, for the libraries too.
extern "C" __attribute__((visibility("default"))) int pthread_mutex_lock(
    pthread_mutex_t* lock) noexcept {
  static auto* const real =
      reinterpret_cast<decltype(&pthread_mutex_lock)>(dlsym(RTLD_NEXT, "pthread_mutex_lock"));
  if (lock == watched.lock && --watched.times == 0) std::exchange(watched, {}).work();
  return real(lock);
}

namespace velta_test {
namespace {

using namespace orx::cs::velta;

/// A file, and what a process keeps in memory from one save to the next.
struct Stage : RegistryFile {
  explicit Stage(const char* name) : fleet(((directory / name).parent_path() / "").wstring()) {
    path = directory / name;
    FileFaults::NewDisk();
  }

  bool Add(const std::wstring& entry, const std::string& value) {
    AddEntry(*tree, entry, value);
    return tree->Save(false, orx::kRegistryVersion);
  }
  ino_t FileNumber() const {
    struct stat status = {};
    stat(path.c_str(), &status);
    return status.st_ino;
  }

  Fleet fleet;
  std::optional<orx::TCSInFileKey> tree;
};

/// A kind of save.
struct Scenario {
  const char* what;
  const char* file;
  void (*prepare)(Stage&);
  bool (*save)(Stage&);
  std::string kept;                ///< what the tree describes before the save and after it
  std::string saved;               ///< what it describes only after it
  ResultCode fullDisk = kSuccess;  ///< the answer of what the library does when the disk is full
};

const std::string kKept = "S_1(0 value=1:1:acknowledged)";
const std::string kEntry0 = orx::Narrow(NumberedSet(0).EntryName());
const std::string kEntry1 = orx::Narrow(NumberedSet(1).EntryName());

void CreateWithTwo(Stage& stage) {
  stage.Create();
  stage.Append(L"S_1", "acknowledged");
}

const Scenario kScenarios[] = {
    {"NewFile", "tree.dff",
     [](Stage& stage) {
       stage.tree.emplace(stage.Name(), L"", nullptr, false, orx::kRegistryFlags);
     },
     [](Stage& stage) { return stage.Add(L"S_0", "made"); }, "", "made"},
    {"NewFileOfAnOldFileSystem", "tree.dff",
     [](Stage& stage) {
       FileFaults::isOldFileSystem = true;
       stage.tree.emplace(stage.Name(), L"", nullptr, false, orx::kRegistryFlags);
     },
     [](Stage& stage) { return stage.Add(L"S_0", "made"); }, "", "made"},
    {"Append", "tree.dff", CreateWithTwo, [](Stage& stage) { return stage.Add(L"S_2", "second"); },
     kKept, "second"},
    {"AppendBehindAnUnfinishedSave", "tree.dff",
     [](Stage& stage) {
       CreateWithTwo(stage);
       const std::size_t whole = stage.Bytes().size();
       stage.Append(L"S_2", "never finished");
       stage.SetBytes(stage.Bytes().substr(0, whole + 70));
     },
     [](Stage& stage) { return stage.Add(L"S_3", "third"); }, kKept, "third"},
    {"WriteAfresh", "tree.dff",
     [](Stage& stage) {
       CreateWithTwo(stage);
       stage.Append(L"big", std::string(9000, 'o'));
     },
     [](Stage& stage) { return stage.Add(L"big", std::string(3000, 'n')); }, kKept, "nnnn"},
    {"FirstDatum", "new/directory/ROVERS.dff", [](Stage&) {},
     [](Stage& stage) { return stage.fleet.Ingest(1); }, "", kEntry1, kNoSharedFile},
    {"Datum", "ROVERS.dff",
     [](Stage& stage) {
       stage.fleet.Ingest(0);
       stage.SetBytes(velta_fuzz::WithFanOut(2, stage.Bytes()));
     },
     [](Stage& stage) { return stage.fleet.Ingest(1); }, kEntry0, kEntry1, kEntryNotWritten},
    {"Projection", "ROVERS.prj", [](Stage& stage) { stage.fleet.IngestBoth(10); },
     [](Stage& stage) { return stage.fleet.IngestBoth(11); }, "S_10_0", "S_11_0", kEntryNotWritten},
    {"Merge", "ROVERS.dff",
     [](Stage& stage) {
       stage.fleet.Ingest(0);
       stage.SetBytes(velta_fuzz::WithFanOut(2, stage.Bytes()));
       stage.fleet.Ingest(1, "OTHER");
     },
     [](Stage& stage) {
       Fleet& fleet = stage.fleet;
       const std::wstring other = fleet.directory + L"OTHER.dff";
       return (fleet.result = RTCMDataSupport::MergeRTCMDatumfiles(fleet.datums, other)) == 0;
     },
     kEntry0, kEntry1, kDatumFileTrouble},
};

bool SaveInAChild(Stage& stage, const Scenario& scenario, int place) {
  const pid_t child = fork();
  if (child == 0) {
    const FileFaults armed(Fault::kKill, place);
    _exit(scenario.save(stage) ? 0 : 1);
  }
  int status = 0;
  waitpid(child, &status, 0);
  return WIFEXITED(status) && WEXITSTATUS(status) == 0;
}

class Save : public testing::TestWithParam<Scenario> {};

/// Whatever happens, what was acknowledged is there, what is new is there if that was promised, and
/// the next save works.
/// \return number of file operations
int Try(const Scenario& scenario, Fault fault, int place) {
  SCOPED_TRACE("fault " + std::to_string(static_cast<int>(fault)) + " at " + std::to_string(place));
  Stage stage(scenario.file);
  scenario.prepare(stage);
  if (!stage.tree) stage.tree.emplace(stage.Name(), nullptr, nullptr, true, orx::kRegistryFlags);
  const std::string before = Describe(stage.Load());
  const ino_t fileBefore = stage.FileNumber();
  bool promised = false;
  if (fault == Fault::kKill) {
    promised = SaveInAChild(stage, scenario, place);
  } else {
    const FileFaults armed(fault, place);
    promised = scenario.save(stage);
    if (promised) {
      EXPECT_TRUE(FileFaults::IsDurable());
    }
    const bool isFull = fault == Fault::kFull && place == 0;
    if (isFull) {
      EXPECT_EQ(stage.fleet.result, scenario.fullDisk);
    }
  }
  const int operations = FileFaults::Count();
  const bool nothingIsLost = fault == Fault::kShort || place == INT_MAX;
  const bool nothingIsDone = fault == Fault::kKill || (fault == Fault::kBroken && place == 0);
  if (nothingIsDone) {
    EXPECT_FALSE(promised);
  } else if (nothingIsLost) {
    EXPECT_TRUE(promised);
  }

  const bool exists = std::filesystem::exists(stage.path);
  const bool mustExist = promised || !scenario.kept.empty();
  if (mustExist) {
    EXPECT_TRUE(exists);
  }
  if (exists) {
    const orx::TCSInFileKey tree = stage.Load();
    const std::string seen = Describe(tree);
    EXPECT_EQ(tree.GetErrorState(), orx::kRegistryOk);
    EXPECT_NE(seen.find(scenario.kept), seen.npos) << seen;
    const bool isSaved = seen.find(scenario.saved) != seen.npos;
    if (promised) {
      EXPECT_TRUE(isSaved) << seen;
    }
    if (!isSaved) {
      EXPECT_EQ(seen, before);
    }
    // A save that could clear up behind itself did.
    const bool couldClearUp = fault == Fault::kFail || fault == Fault::kFull;
    const bool isSameFile = stage.FileNumber() == fileBefore;
    if (!promised && couldClearUp && isSameFile) {
      EXPECT_EQ(seen, before);
    }
  }
  // A new file never takes the place of one that came to be after all.
  const std::string bytes = stage.Bytes();
  const bool isSavedNow = scenario.save(stage);
  const bool mayBeRefused = scenario.kept.empty() && exists;
  if (!mayBeRefused) {
    EXPECT_TRUE(isSavedNow);
  }
  if (!FileFaults::IsDurable()) {
    EXPECT_EQ(stage.Bytes(), bytes) << "the next save";
  }
  EXPECT_NE(Describe(stage.Load()).find(scenario.saved), std::string::npos);
  return operations;
}

TEST_P(Save, LosesNothingAndReportsItsFailure) {
  const int operations = Try(GetParam(), Fault::kFail, INT_MAX);
  EXPECT_GT(operations, 4);
  for (const Fault fault : kFaults) {
    for (int place = 0; place < operations; ++place) Try(GetParam(), fault, place);
  }
}

/// A caller tries again with the tree that it holds when the full disk has room again.
class Retry : public testing::Test {
 protected:
  Retry() { EXPECT_TRUE(fleet.IngestBoth(0)); }

  DatumData CurrentDatum() const {
    return RTCMGenerator(1, fleet.datums, L"").getAllDatums().at(0);
  }

  Stage stage{"ROVERS.dff"};
  Fleet& fleet = stage.fleet;
};

TEST_F(Retry, SavesTheDatumThatTheDiskDidNotTake) {
  {
    const FileFaults full(Fault::kFull, 0);
    EXPECT_FALSE(fleet.Ingest(1));
  }
  DatumData datum = CurrentDatum();
  EXPECT_EQ(fleet.support.AddDatumToGFF(datum), kSuccess);
  EXPECT_TRUE(HoldsDatum(LoadTree(fleet.datums), 1));
}

TEST_F(Retry, SavesTheDatumBesideWhatACallerHasNotSaved) {
  orx::TCSInFileKey* shared = nullptr;
  ASSERT_EQ(fleet.support.GetUnlockedPtrDatumGFF(fleet.datums, &shared), kSuccess);
  const orx::TGenericRegistryKey root{orx::TGenericRegistryKeyPtr(*shared)};
  const orx::TGenericRegistryKey unsaved(root, L"somebody's", 0, true);
  {
    const FileFaults full(Fault::kFull, 0);
    EXPECT_FALSE(fleet.Ingest(1));
    DatumData datum = CurrentDatum();
    EXPECT_EQ(fleet.support.AddDatumToGFF(datum), kEntryNotWritten);
  }
  EXPECT_TRUE(fleet.Ingest(1));
  EXPECT_TRUE(HoldsDatum(LoadTree(fleet.datums), 1));
  EXPECT_NE(Describe(LoadTree(fleet.datums)).find("somebody's"), std::string::npos);
  fleet.support.ReleasePtrDatumGFF(fleet.datums);
}

TEST_F(Retry, SavesTheDatumThatADiskGoneForAWhileDidNotTake) {
  {
    const FileFaults gone(Fault::kBroken, 4);
    EXPECT_FALSE(fleet.Ingest(1));
    EXPECT_EQ(fleet.result, kEntryNotWritten);
  }
  DatumData datum = CurrentDatum();
  EXPECT_EQ(fleet.support.AddDatumToGFF(datum), kSuccess);
  EXPECT_TRUE(HoldsDatum(LoadTree(fleet.datums), 1));
}

TEST_F(Retry, SavesTheProjectionThatTheDiskDidNotTake) {
  Rtcm1025 message;
  message.projectionType = ProjectionData::TM;
  message.laNO = 1;
  {
    const FileFaults full(Fault::kFull, 0);
    EXPECT_EQ(fleet.support.ParseProjectionMessages(message, nullptr), kEntryNotWritten);
  }
  const orx::cs::projmath::Ellipsoid ellipsoid = fleet.support.GetDatumTargetEllipsoid();
  ProjectionData projection;
  projection.rtcmProjName = L"ROVERS";
  projection.prjType = L"TMERC";
  projection.geoProj = std::make_unique<orx::cs::projmath::TUTMProj>(ellipsoid.a, ellipsoid.second,
                                                                     0.0, 0.993, 1.1e-8, 0.0, 0.0);
  EXPECT_EQ(fleet.support.AddProjectionToGFF(projection), kSuccess);
  EXPECT_TRUE(HoldsProjection(LoadTree(fleet.projections), 1));
}

TEST_F(Retry, MergesTheEntryThatTheDiskDidNotTakeMeanwhile) {
  ASSERT_TRUE(fleet.Ingest(1, "OTHER"));
  ASSERT_TRUE(fleet.Ingest(0));
  // Between obtaining the tree, for which its lock is taken once, and merging into it.
  watched = {RTCMDataSupport::GFFDatumFile->GetMutex().native_handle(), 2, [&] {
               const FileFaults full(Fault::kFull, 0);
               EXPECT_FALSE(fleet.Ingest(1));
             }};
  EXPECT_TRUE(fleet.Merge(fleet.directory + L"OTHER.dff"));
  EXPECT_FALSE(watched.work) << "it was done";
  EXPECT_TRUE(HoldsDatum(LoadTree(fleet.datums), 1));
}

TEST(Lock, IsAwaitedAndTold) {
  Stage stage("tree.dff");
  stage.Create();
  int held = open(stage.path.c_str(), O_RDWR | O_CLOEXEC);
  struct flock whole = {};
  whole.l_type = F_WRLCK;
  ASSERT_EQ(fcntl(held, F_OFD_SETLK, &whole), 0);
  std::wstring told;
  orx::OnAwaitedLock([&](const std::wstring& file) {
    told = file;
    close(std::exchange(held, -1));
  });
  EXPECT_TRUE(stage.Append(L"S_1", "later"));
  orx::OnAwaitedLock({});
  EXPECT_EQ(told, stage.path.wstring());
}

TEST(Lock, CannotBeHeldByWhoMayOnlyRead) {
  Stage stage("tree.dff");
  stage.Create();
  const int reader = open(stage.path.c_str(), O_RDONLY | O_CLOEXEC);
  ASSERT_EQ(flock(reader, LOCK_EX), 0);
  EXPECT_TRUE(stage.Append(L"S_1", "at once"));
  close(reader);
}

TEST(NextSave, MakesTheNameDurableThatSomebodyElseGave) {
  Stage stage("tree.dff");
  stage.Create();
  stage.tree.emplace(stage.Name(), nullptr, nullptr, true, orx::kRegistryFlags);
  FileFaults::ForgetFlush(stage.path);
  EXPECT_TRUE(stage.Add(L"S_1", "to a file as it was found"));
  EXPECT_TRUE(FileFaults::IsDurable());
  stage.Append(L"S_2", "somebody else's");
  FileFaults::ForgetFlush(stage.path);
  EXPECT_TRUE(stage.Add(L"S_3", "to a file that changed"));
  EXPECT_TRUE(FileFaults::IsDurable());
}

TEST(SaveAfresh, KeepsModeAndLinksAndIsNotNeeded) {
  namespace fs = std::filesystem;
  Stage stage("tree.dff");
  CreateWithTwo(stage);
  fs::permissions(stage.path, fs::perms::owner_all);
  const ino_t before = stage.FileNumber();
  const fs::path link = stage.directory / "link.dff";
  fs::create_symlink(stage.path, link);
  stage.tree.emplace(link.wstring(), nullptr, nullptr, true, orx::kRegistryFlags);
  for (const char letter : {'a', 'b'}) EXPECT_TRUE(stage.Add(L"big", std::string(5000, letter)));
  EXPECT_NE(stage.FileNumber(), before);
  EXPECT_EQ(fs::status(stage.path).permissions(), fs::perms::owner_all);
  EXPECT_TRUE(fs::is_symlink(link));
  EXPECT_NE(Describe(stage.Load()).find("bbb"), std::string::npos);

  fs::create_symlink(stage.directory / "somebody's", stage.directory / "tree.dff.new");
  for (const char letter : {'d', 'e'}) EXPECT_TRUE(stage.Add(L"big", std::string(5000, letter)));
  EXPECT_FALSE(fs::exists(stage.directory / "somebody's")) << "a link is not followed";
}

TEST(Load, SeesAWholeTreeWhileAnUnfinishedSaveIsWrittenOver) {
  Stage stage("tree.dff");
  CreateWithTwo(stage);
  const std::size_t whole = stage.Bytes().size();
  stage.Append(L"S_2", std::string(whole + 1500, 'u'));
  stage.SetBytes(stage.Bytes().substr(0, 2 * whole + 1000));
  FileFaults::meanwhile = [&] {
    EXPECT_TRUE(stage.Append(L"S_3", std::string(whole, 'x')));
    EXPECT_TRUE(stage.Append(L"S_4", "y"));
  };
  const orx::TCSInFileKey tree = stage.Load();
  EXPECT_EQ(tree.GetErrorState(), orx::kRegistryOk);
  EXPECT_NE(Describe(tree).find("S_4"), std::string::npos);
}

INSTANTIATE_TEST_SUITE_P(Of, Save, testing::ValuesIn(kScenarios),
                         [](const auto& scenario) { return scenario.param.what; });

}  // namespace
}  // namespace velta_test
