#include "file_faults.h"

#include <dlfcn.h>
#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include <csignal>
#include <cstdarg>
#include <cstdio>

namespace velta_test {
namespace {

struct Machine {
  bool armed = false;
  int place = -1;
  Fault fault = Fault::kFail;
  int error = EIO;
  int seen = 0;
  bool shortened = false;
};
Machine machine;

enum class Verdict { kWork, kFail, kShorten };

/// Counts an operation and says what becomes of it.
Verdict Judge(bool isWrite) {
  if (!machine.armed) return Verdict::kWork;
  const int now = machine.seen++;
  if (machine.shortened && isWrite) {
    machine.shortened = false;
    errno = machine.error;
    return Verdict::kFail;
  }
  const bool hit = now == machine.place ||
                   (machine.fault == Fault::kFailOn && machine.place >= 0 && now > machine.place);
  if (!hit) return Verdict::kWork;
  if (machine.fault == Fault::kKill) raise(SIGKILL);
  if (machine.fault == Fault::kShort && isWrite) {
    machine.shortened = true;
    return Verdict::kShorten;
  }
  errno = machine.error;
  return Verdict::kFail;
}

template <class Function>
Function* Real(const char* name) {
  return reinterpret_cast<Function*>(dlsym(RTLD_NEXT, name));
}

}  // namespace

FileFaults::FileFaults(int place, Fault fault, int error) {
  machine = Machine{true, place, fault, error, 0, false};
}
FileFaults::~FileFaults() { machine.armed = false; }
int FileFaults::count() const { return machine.seen; }

}  // namespace velta_test

// The operations that the registry calls, in front of the C library's own.

using velta_test::Judge;
using velta_test::Real;
using velta_test::Verdict;

extern "C" {

__attribute__((visibility("default"))) int open(const char* path, int flags, ...) {
  mode_t mode = 0;
  if ((flags & O_CREAT) != 0) {
    va_list arguments;
    va_start(arguments, flags);
    mode = va_arg(arguments, mode_t);
    va_end(arguments);
  }
  if (Judge(false) != Verdict::kWork) return -1;
  return Real<int(const char*, int, ...)>("open")(path, flags, mode);
}

__attribute__((visibility("default"))) int flock(int file, int operation) noexcept {
  return Judge(false) == Verdict::kWork ? Real<int(int, int)>("flock")(file, operation) : -1;
}

__attribute__((visibility("default"))) int fstat(int file, struct stat* status) noexcept {
  return Judge(false) == Verdict::kWork ? Real<int(int, struct stat*)>("fstat")(file, status) : -1;
}

__attribute__((visibility("default"))) ssize_t pread(int file, void* to, size_t size,
                                                     off_t offset) {
  if (Judge(false) != Verdict::kWork) return -1;
  return Real<ssize_t(int, void*, size_t, off_t)>("pread")(file, to, size, offset);
}

__attribute__((visibility("default"))) ssize_t pwrite(int file, const void* from, size_t size,
                                                      off_t offset) {
  const Verdict verdict = Judge(true);
  if (verdict == Verdict::kFail) return -1;
  if (verdict == Verdict::kShorten) size /= 2;
  return Real<ssize_t(int, const void*, size_t, off_t)>("pwrite")(file, from, size, offset);
}

__attribute__((visibility("default"))) int ftruncate(int file, off_t size) noexcept {
  return Judge(false) == Verdict::kWork ? Real<int(int, off_t)>("ftruncate")(file, size) : -1;
}

__attribute__((visibility("default"))) int fdatasync(int file) {
  return Judge(false) == Verdict::kWork ? Real<int(int)>("fdatasync")(file) : -1;
}

__attribute__((visibility("default"))) int fsync(int file) {
  return Judge(false) == Verdict::kWork ? Real<int(int)>("fsync")(file) : -1;
}

__attribute__((visibility("default"))) int rename(const char* from, const char* to) noexcept {
  if (Judge(false) != Verdict::kWork) return -1;
  return Real<int(const char*, const char*)>("rename")(from, to);
}

__attribute__((visibility("default"))) int renameat2(int fromAt, const char* from, int toAt,
                                                     const char* to, unsigned flags) noexcept {
  if (Judge(false) != Verdict::kWork) return -1;
  return Real<int(int, const char*, int, const char*, unsigned)>("renameat2")(fromAt, from, toAt,
                                                                              to, flags);
}

}  // extern "C"
