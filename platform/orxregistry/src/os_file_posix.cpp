#include <fcntl.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstddef>
#include <cstdio>
#include <cstdlib>
#include <new>

#include "lock_wait.h"
#include "orxutils/file_error.h"
#include "orxutils/file_funcs.h"
#include "os_file.h"

namespace orx::os {
namespace {

constexpr mode_t kNewFileMode = 0666;
constexpr mode_t kModeBits = 07777;
/// Does not wait where the name is that of a pipe and nobody writes into it.
constexpr int kToRead = O_RDONLY | O_CLOEXEC | O_NONBLOCK;

template <class Call>
auto Retry(Call call) {
  auto result = call();
  while (result < 0 && errno == EINTR) result = call();
  return result;
}

/// Keeps the system's error when a call has failed.
/// \param call its name, if it is one that some file systems do not support
bool Check(bool done, const char* call = nullptr) {
  if (!done) KeepFileError(call);
  return done;
}

FileStamp ToStamp(const struct stat& status) {
  constexpr std::int64_t kNanoseconds = 1'000'000'000;
  FileStamp stamp;
  stamp.device = status.st_dev;
  stamp.file = status.st_ino;
  stamp.size = static_cast<std::uint64_t>(status.st_size);
  stamp.modified = status.st_mtim.tv_sec * kNanoseconds + status.st_mtim.tv_nsec;
  return stamp;
}

bool RenameToNewName(const char* from, const char* to) {
  if (renameat2(AT_FDCWD, from, AT_FDCWD, to, RENAME_NOREPLACE) == 0) return true;
  if (errno != EINVAL && errno != ENOSYS) return false;
  // A file system that cannot rename so: a second link fails when the name is taken.
  if (!Check(link(from, to) == 0, "link")) return false;
  unlink(from);
  return true;
}

/// Holds an open file against every other that is locked so. It must be open to write: who may only
/// read a file cannot keep others from writing it.
bool Lock(int handle, const std::filesystem::path& path) {
  struct flock whole = {};
  whole.l_type = F_WRLCK;
  whole.l_whence = SEEK_SET;
  LockWait wait(path);
  while (Retry([&] { return fcntl(handle, F_OFD_SETLK, &whole); }) != 0) {
    const bool isHeld = errno == EAGAIN || errno == EACCES;
    if (isHeld && wait.GoOn()) continue;
    if (isHeld) errno = EBUSY;
    return Check(false, isHeld ? nullptr : "fcntl");
  }
  return true;
}

bool HasOtherName(int handle) {
  struct stat status;
  return fstat(handle, &status) == 0 && status.st_nlink > 1;
}

/// Removes a file that a process left when it was stopped before the file got its name. Waits for
/// one that is at work.
/// \return false when there is something else of that name, or it cannot be removed
bool RemoveLeftOver(const std::filesystem::path& path) {
  const int handle =
      Retry([&] { return open(path.c_str(), O_RDWR | O_CLOEXEC | O_NOFOLLOW | O_NONBLOCK); });
  if (handle < 0) return Check(errno == ENOENT);
  struct Closing {
    int handle;
    ~Closing() { close(handle); }
  } const closing{handle};
  // A process that was stopped in RenameToNewName leaves a finished file with two names. It is not
  // locked here: a caller that holds it by its right name would wait for itself.
  if (!HasOtherName(handle) && !Lock(handle, path)) return false;
  struct stat opened;
  struct stat named;
  if (!Check(fstat(handle, &opened) == 0)) return false;
  // While this waited, the file may have got its name.
  if (stat(path.c_str(), &named) != 0) return Check(errno == ENOENT);
  if (opened.st_ino != named.st_ino || opened.st_dev != named.st_dev) return true;
  return Check(unlink(path.c_str()) == 0 || errno == ENOENT);
}

}  // namespace

std::optional<File> File::OpenToRead(const std::filesystem::path& path) {
  const int handle = Retry([&] { return open(path.c_str(), kToRead); });
  if (!Check(handle >= 0)) return std::nullopt;
  return File(handle);
}

std::optional<File> File::OpenLocked(const std::filesystem::path& path) {
  for (;;) {
    const int handle = Retry([&] { return open(path.c_str(), O_RDWR | O_CLOEXEC); });
    if (!Check(handle >= 0)) return std::nullopt;
    File file(handle);
    if (!Lock(handle, path)) return std::nullopt;
    // While this waited, the file may have been replaced by another of this name.
    const std::optional<FileStamp> opened = file.Stamp();
    const std::optional<FileStamp> named = StampOf(path);
    if (!opened) return std::nullopt;
    if (named && opened->IsSameFile(*named)) return file;
  }
}

std::optional<File> File::CreateLocked(const std::filesystem::path& path) {
  constexpr int kNew = O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC;
  for (;;) {
    const int handle = Retry([&] { return open(path.c_str(), kNew, kNewFileMode); });
    if (handle < 0) {
      if (!Check(errno == EEXIST) || !RemoveLeftOver(path)) return std::nullopt;
      continue;
    }
    File file(handle);
    if (!Lock(handle, path)) {
      unlink(path.c_str());
      return std::nullopt;
    }
    // Somebody may have taken it for one that was left over.
    const std::optional<FileStamp> opened = file.Stamp();
    const std::optional<FileStamp> named = StampOf(path);
    if (!opened) {
      unlink(path.c_str());
      return std::nullopt;
    }
    if (named && opened->IsSameFile(*named)) return file;
  }
}

File::~File() {
  if (handle_ != kNone) close(handle_);
}

std::optional<FileStamp> File::Stamp() const {
  struct stat status;
  if (!Check(fstat(handle_, &status) == 0)) return std::nullopt;
  return ToStamp(status);
}

std::optional<std::size_t> File::Read(std::uint64_t offset, unsigned char* to,
                                      std::size_t size) const {
  std::size_t done = 0;
  while (done < size) {
    const ssize_t count = Retry(
        [&] { return pread(handle_, to + done, size - done, static_cast<off_t>(offset + done)); });
    if (!Check(count >= 0)) return std::nullopt;
    if (count == 0) break;
    done += static_cast<std::size_t>(count);
  }
  return done;
}

bool File::Write(std::uint64_t offset, const unsigned char* from, std::size_t size) {
  std::size_t done = 0;
  while (done < size) {
    const ssize_t count = Retry([&] {
      return pwrite(handle_, from + done, size - done, static_cast<off_t>(offset + done));
    });
    if (!Check(count > 0)) return false;
    done += static_cast<std::size_t>(count);
  }
  return true;
}

bool File::Truncate(std::uint64_t size) {
  return Check(Retry([&] { return ftruncate(handle_, static_cast<off_t>(size)); }) == 0);
}

bool File::TakeAccessOf(const File& other) {
  struct stat own;
  struct stat wanted;
  if (fstat(handle_, &own) != 0 || fstat(other.handle_, &wanted) != 0) return false;
  // An access control list says more than the mode.
  if (fgetxattr(other.handle_, "system.posix_acl_access", nullptr, 0) > 0) return false;
  const bool isSameOwner = own.st_uid == wanted.st_uid && own.st_gid == wanted.st_gid;
  if (!isSameOwner && fchown(handle_, wanted.st_uid, wanted.st_gid) != 0) return false;
  const mode_t mode = wanted.st_mode & kModeBits;
  return (own.st_mode & kModeBits) == mode || fchmod(handle_, mode) == 0;
}

bool File::Flush() {
  return Check(Retry([&] { return fdatasync(handle_); }) == 0);
}

Memory::Memory(std::size_t size) {
  // Large files are read into large pages where the system has them.
  constexpr std::size_t kLargePage = 2U << 20U;
  const std::size_t alignment = size < kLargePage ? alignof(std::max_align_t) : kLargePage;
  const std::size_t whole =
      (std::max(size, std::size_t{1}) + alignment - 1) / alignment * alignment;
  bytes_.reset(static_cast<unsigned char*>(std::aligned_alloc(alignment, whole)));
  if (!bytes_) throw std::bad_alloc();
#ifdef MADV_HUGEPAGE
  if (alignment == kLargePage) madvise(bytes_.get(), whole, MADV_HUGEPAGE);
#endif
}

void Memory::Free::operator()(unsigned char* bytes) const { std::free(bytes); }

std::optional<FileStamp> StampOf(const std::filesystem::path& path) {
  struct stat status;
  if (stat(path.c_str(), &status) != 0) return std::nullopt;
  return ToStamp(status);
}

bool Rename(const std::filesystem::path& from, const std::filesystem::path& to, bool replace) {
  const bool renamed = replace ? std::rename(from.c_str(), to.c_str()) == 0
                               : RenameToNewName(from.c_str(), to.c_str());
  return Check(renamed && FileFuncs::flushName(to));
}

std::filesystem::path WithoutLinks(const std::filesystem::path& path) {
  std::error_code error;
  std::filesystem::path real = std::filesystem::canonical(path, error);
  return error ? path : real;
}

void Remove(const std::filesystem::path& path) { unlink(path.c_str()); }

}  // namespace orx::os
