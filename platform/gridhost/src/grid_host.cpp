// The sibling library: keeps the shared RTCM files of a process, one tree a file, and hands out the
// same tree for the same file as long as it stays loaded.

#include <boost/thread/lock_types.hpp>
#include <cstdint>
#include <filesystem>
#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <string_view>
#include <system_error>

#include "orxregistry/in_file_key.h"
#include "orxutils/path.h"

#ifdef _WIN32
#define GRIDHOST_EXPORT extern "C" __declspec(dllexport)
#else
#define GRIDHOST_EXPORT extern "C" __attribute__((visibility("default")))
#endif

namespace {

constexpr std::int32_t kSuccess = 0;
/// The file does not exist or cannot be read.
constexpr std::int32_t kNoFile = static_cast<std::int32_t>(0x80070002);

/// A shared file. It stays at its place in memory, whatever is read anew, as callers hold its lock.
class SharedFile : public orx::TCSInFileKey {
 public:
  explicit SharedFile(const std::wstring& name) : TCSInFileKey(name, nullptr, nullptr, true, 0) {}

  int users = 0;  ///< who obtained the file and have not given it back; guarded by the table's lock

  /// Reads the file again when the tree is not what the file holds.
  /// \param inUse somebody else works on the tree: unsaved changes are theirs
  void Refresh(bool inUse) {
    const bool unsaved = HasUnsavedChanges();
    if (unsaved ? !inUse : HasFileChanged()) Reload();
  }
};

/// The table of shared files, by normalised name.
class SharedFiles {
 public:
  std::int32_t Get(const wchar_t* name, orx::TCSInFileKey** file) {
    *file = nullptr;
    SharedFile* shared = nullptr;
    bool inUse = false;
    {
      const std::lock_guard<std::mutex> lock(mutex_);
      std::unique_ptr<SharedFile>& entry = files_[Normalise(name)];
      if (!entry) entry = std::make_unique<SharedFile>(Normalise(name));
      shared = entry.get();
      inUse = shared->users > 0;
    }
    const boost::unique_lock<boost::recursive_mutex> lock(shared->GetMutex());
    shared->Refresh(inUse);
    {
      const std::lock_guard<std::mutex> tableLock(mutex_);
      ++shared->users;
    }
    if (shared->GetErrorState() == orx::kCannotBeOpened) return kNoFile;
    *file = shared;
    return kSuccess;
  }

  /// The caller may still hold the file's lock, so the tree stays as it is. Needs no memory for a
  /// name that is normalised, as it must work when memory is out.
  void Reset(const wchar_t* name) {
    const std::lock_guard<std::mutex> lock(mutex_);
    auto entry = files_.find(std::wstring_view(name));
    if (entry == files_.end()) entry = files_.find(Normalise(name));
    if (entry != files_.end() && entry->second->users > 0) --entry->second->users;
  }

 private:
  static std::wstring Normalise(const wchar_t* name) {
    const std::optional<std::filesystem::path> path = orx::ToPath(name);
    std::error_code error;
    const std::filesystem::path whole =
        path ? std::filesystem::absolute(*path, error) : std::filesystem::path();
    // Opening what is no path of this system will fail.
    return path && !error ? orx::ToName(whole.lexically_normal()) : name;
  }

  std::mutex mutex_;
  std::map<std::wstring, std::unique_ptr<SharedFile>, std::less<>> files_;
};

SharedFiles& Files() {
  static SharedFiles files;
  return files;
}

}  // namespace

GRIDHOST_EXPORT std::int32_t GetPtrDatumGFF(const wchar_t* name, orx::TCSInFileKey** file) {
  return Files().Get(name, file);
}
GRIDHOST_EXPORT void ResetRTCMDatumFile(const wchar_t* name) { Files().Reset(name); }

GRIDHOST_EXPORT std::int32_t GetPtrProjectionGFF(const wchar_t* name, orx::TCSInFileKey** file) {
  return Files().Get(name, file);
}
GRIDHOST_EXPORT void ResetRTCMGridFile(const wchar_t* name) { Files().Reset(name); }
