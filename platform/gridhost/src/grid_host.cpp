// The sibling library: keeps the shared RTCM files of a process, one tree a file, and hands out the
// same tree for the same file as long as it stays loaded.

#include <boost/thread/lock_types.hpp>
#include <cstdint>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <string_view>

#include "export.h"
#include "orxregistry/in_file_key.h"
#include "orxutils/path.h"

namespace {

constexpr std::int32_t kSuccess = 0;
/// The file does not exist or cannot be read.
constexpr std::int32_t kNoFile = static_cast<std::int32_t>(0x80070002);

/// A shared file. It stays at its place in memory, whatever is read anew, as callers hold its lock.
class SharedFile : public orx::TCSInFileKey {
 public:
  explicit SharedFile(const std::wstring& name)
      : TCSInFileKey(name, nullptr, nullptr, true, orx::kRegistryFlags) {}

  int users = 0;  ///< who obtained the file and have not given it back; guarded by the table's lock

  /// Reads the file again when the tree is not what the file holds.
  /// \param inUse somebody works on the tree, whose unsaved changes stay
  void Refresh(bool inUse) {
    const bool unsaved = HasUnsavedChanges();
    if (unsaved ? !inUse : HasFileChanged()) Reload();
  }
};

/// The table of shared files. A name without a file is not entered.
class FileTable {
 public:
  /// Counts a user even when the file has gone or cannot be read any more, because it is given back
  /// all the same; not when there never was a file or an exception passes.
  std::int32_t Get(const wchar_t* name, orx::TCSInFileKey** file) {
    *file = nullptr;
    SharedFile* const shared = Find(name);
    if (!shared) return kNoFile;
    const boost::unique_lock<boost::recursive_mutex> lock(shared->GetMutex());
    shared->Refresh(IsInUse(*shared));
    AddUser(name, *shared);
    if (shared->GetErrorState() == orx::kCannotBeOpened) return kNoFile;
    *file = shared;
    return kSuccess;
  }

  /// Counts a user less. The tree stays as it is, as the caller may still hold its lock. Allocates
  /// nothing, so that a file can be given back when memory is out.
  void Reset(const wchar_t* name) {
    const std::lock_guard<std::mutex> lock(mutex_);
    const auto found = names_.find(std::wstring_view(name));
    if (found == names_.end()) return;
    SharedFile* const file = found->second;
    if (--file->users > 0) return;
    std::erase_if(names_, [file](const auto& named) { return named.second == file; });
  }

 private:
  /// \return null when there is no such file
  SharedFile* Find(const wchar_t* name) {
    const std::wstring whole = orx::AbsoluteName(name);
    const std::lock_guard<std::mutex> lock(mutex_);
    const auto found = files_.find(whole);
    if (found != files_.end()) return found->second.get();
    auto file = std::make_unique<SharedFile>(whole);
    if (file->GetErrorState() == orx::kCannotBeOpened) return nullptr;
    return files_.emplace(whole, std::move(file)).first->second.get();
  }
  bool IsInUse(const SharedFile& shared) {
    const std::lock_guard<std::mutex> lock(mutex_);
    return shared.users > 0;
  }
  void AddUser(const wchar_t* name, SharedFile& shared) {
    const std::lock_guard<std::mutex> lock(mutex_);
    names_.try_emplace(name, &shared);
    ++shared.users;
  }

  std::mutex mutex_;
  std::map<std::wstring, std::unique_ptr<SharedFile>, orx::NameOrder> files_;  ///< by whole names
  /// The files in use by the names that they were asked for.
  std::map<std::wstring, SharedFile*, orx::NameOrder> names_;
};

FileTable& Files() {
  static FileTable files;
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
