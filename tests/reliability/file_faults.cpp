#include "file_faults.h"

#include <dlfcn.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstdarg>
#include <cstdio>
#include <optional>
#include <set>
#include <string>
#include <utility>

namespace velta_test {
namespace {

struct Machine {
  bool isArmed = false;
  Fault fault = Fault::kFail;
  int place = 0;
  int seen = 0;
  bool isFull = false;
  bool isFileFlushed = true;
  bool wasFlushedInTime = true;
};
Machine machine;
/// The directories with names that may not be durable; nobody counts in processes without faults.
std::optional<std::set<std::filesystem::path>> unflushed;

enum class Verdict { kWork, kFail, kHalf };

/// Counts an operation and says what becomes of it.
Verdict Judge(bool isWrite = false) {
  const int place = machine.isArmed ? machine.seen++ - machine.place : -1;
  if (place < 0) return Verdict::kWork;
  errno = machine.fault == Fault::kFull ? ENOSPC : EIO;
  if (machine.fault == Fault::kBroken) return Verdict::kFail;
  if (machine.fault == Fault::kFull && isWrite) {
    return std::exchange(machine.isFull, true) ? Verdict::kFail : Verdict::kHalf;
  }
  if (place > 0) return Verdict::kWork;
  if (machine.fault == Fault::kKill) raise(SIGKILL);
  if (machine.fault == Fault::kFail) return Verdict::kFail;
  return isWrite ? Verdict::kHalf : Verdict::kWork;
}

int NoteName(int result, const char* path) {
  if (result == 0 && unflushed) unflushed->insert(std::filesystem::path(path).parent_path());
  return result;
}

int NoteRename(int result, const char* to) {
  if (result == 0) machine.wasFlushedInTime &= machine.isFileFlushed;
  return NoteName(result, to);
}

}  // namespace

FileFaults::FileFaults(Fault fault, int place) { machine = {true, fault, place}; }
FileFaults::~FileFaults() { machine.isArmed = false; }
int FileFaults::Count() { return machine.seen; }
bool FileFaults::IsDurable() {
  return machine.isFileFlushed && unflushed->empty() && machine.wasFlushedInTime;
}
void FileFaults::NewDisk() {
  unflushed.emplace();
  isOldFileSystem = false;
}
void FileFaults::ForgetFlush(const std::filesystem::path& path) {
  unflushed = {path.parent_path()};
}

}  // namespace velta_test

// The operations that the libraries call, in front of the C library's own.

using namespace velta_test;

#define EXPORTED extern "C" __attribute__((visibility("default")))
#define FAILS (Judge() != Verdict::kWork)
#define REAL(name) reinterpret_cast<decltype(&(name))>(dlsym(RTLD_NEXT, #name))
#define PASS(name, ...) (FAILS ? -1 : REAL(name)(__VA_ARGS__))

EXPORTED int open(const char* path, int flags, ...) {
  mode_t mode = 0;
  if ((flags & O_CREAT) != 0) {
    va_list arguments;
    va_start(arguments, flags);
    mode = va_arg(arguments, mode_t);  // NOLINT(*-valist.Uninitialized): the line above does it
    va_end(arguments);
  }
  return PASS(open, path, flags, mode);
}
EXPORTED int stat(const char* path, struct stat* to) noexcept { return PASS(stat, path, to); }
EXPORTED int fstat(int file, struct stat* to) noexcept { return PASS(fstat, file, to); }
EXPORTED int fcntl(int file, int command, ...) {
  va_list arguments;
  va_start(arguments, command);
  void* const more = va_arg(arguments, void*);  // NOLINT(*-valist.Uninitialized): as above
  va_end(arguments);
  const auto real = REAL(fcntl);
  return command == F_OFD_SETLK && FAILS ? -1 : real(file, command, more);
}
EXPORTED ssize_t pread(int file, void* to, size_t size, off_t offset) {
  if (const auto work = std::exchange(FileFaults::meanwhile, nullptr)) {
    const ssize_t half = REAL(pread)(file, to, size / 2, offset);
    work();
    return half;
  }
  return PASS(pread, file, to, size, offset);
}
EXPORTED ssize_t pwrite(int file, const void* from, size_t size, off_t offset) {
  const Verdict verdict = Judge(true);
  machine.isFileFlushed = false;
  if (verdict == Verdict::kFail) return -1;
  return REAL(pwrite)(file, from, verdict == Verdict::kHalf ? size / 2 : size, offset);
}
EXPORTED int ftruncate(int file, off_t size) noexcept {
  machine.isFileFlushed = false;
  return FAILS ? -1 : REAL(ftruncate)(file, size);
}
// Nobody waits for the disk.
EXPORTED int fdatasync(int) { return FAILS ? -1 : (machine.isFileFlushed = true, 0); }
EXPORTED int fsync(int directory) {
  if (FAILS) return -1;
  if (!unflushed) return 0;
  const auto link = "/proc/self/fd/" + std::to_string(directory);
  unflushed->erase(std::filesystem::read_symlink(link));
  return 0;
}
EXPORTED int mkdir(const char* path, mode_t mode) noexcept {
  return FAILS ? -1 : NoteName(REAL(mkdir)(path, mode), path);
}
EXPORTED int link(const char* from, const char* to) noexcept {
  return FAILS ? -1 : NoteRename(REAL(link)(from, to), to);
}
EXPORTED int fchmod(int file, mode_t mode) noexcept { return PASS(fchmod, file, mode); }
EXPORTED int unlink(const char* path) noexcept { return PASS(unlink, path); }
EXPORTED int rename(const char* from, const char* to) noexcept {
  return FAILS ? -1 : NoteRename(REAL(rename)(from, to), to);
}
EXPORTED int renameat2(int from, const char* old, int to, const char* name,
                       unsigned flags) noexcept {
  if (FileFaults::isOldFileSystem) {
    errno = EINVAL;
    return -1;
  }
  return FAILS ? -1 : NoteRename(REAL(renameat2)(from, old, to, name, flags), name);
}
