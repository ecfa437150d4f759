#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <filesystem>
#include <new>
#include <optional>
#include <system_error>

#include "orxutils/file_error.h"
#include "orxutils/file_funcs.h"
#include "orxutils/path.h"

namespace orx::FileFuncs {
namespace fs = std::filesystem;
namespace {

/// Asks about a path; a name that is no path of this system is answered with false.
template <class Question>
bool Ask(const COrxStringT<wchar_t>& name, Question question) {
  const std::optional<fs::path> path = ToPath(name);
  std::error_code error;
  return path && question(*path, error) && !error;
}

template <class Call>
int Retry(Call call) {
  int result = call();
  while (result < 0 && errno == EINTR) result = call();
  return result;
}

class Handle {
 public:
  Handle(const char* name, int flags) : handle_(Retry([&] { return open(name, flags); })) {}
  Handle(const Handle&) = delete;
  Handle& operator=(const Handle&) = delete;
  ~Handle() {
    if (handle_ >= 0) close(handle_);
  }
  int get() const { return handle_; }

 private:
  int handle_;
};

bool MakeDirectory(const fs::path& path, std::error_code& error) {
  if (fs::is_directory(path, error)) return true;
  const fs::path parent = path.has_parent_path() ? path.parent_path() : ".";
  if (parent != path && !MakeDirectory(parent, error)) return false;
  if (!fs::create_directory(path, error)) {
    std::error_code ignored;
    if (fs::is_directory(path, ignored)) {  // another process made it
      error.clear();
      return true;
    }
    errno = error.value();
    KeepFileError();
    return false;
  }
  if (flushName(path)) return true;
  KeepFileError();
  fs::remove(path, error);
  return false;
}

}  // namespace

bool isFileExists(const COrxStringT<wchar_t>& name) {
  return Ask(name, [](const fs::path& path, std::error_code& error) {
    return fs::is_regular_file(path, error);
  });
}

bool isDirExists(const COrxStringT<wchar_t>& name) {
  return Ask(name, [](const fs::path& path, std::error_code& error) {
    return fs::is_directory(path, error);
  });
}

bool createDirectoryTree(const COrxStringT<wchar_t>& name) { return Ask(name, MakeDirectory); }

bool flushName(const fs::path& path) noexcept try {
  const fs::path directory = path.has_parent_path() ? path.parent_path() : ".";
  const Handle names(directory.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
  if (names.get() >= 0) {
    return Retry([&] { return fsync(names.get()); }) == 0 || errno == EINVAL;
  }
  if (errno != EACCES) return false;
  // Without the right to read the directory, the whole file system is flushed.
  const Handle named(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK);
  return named.get() >= 0 && syncfs(named.get()) == 0;
} catch (const std::bad_alloc&) {
  return false;
}

bool isTerminal(std::FILE* file) { return isatty(fileno(file)) != 0; }

bool isSameFile(std::FILE* file, const fs::path& path) {
  struct stat own;
  struct stat named;
  return fstat(fileno(file), &own) == 0 && stat(path.c_str(), &named) == 0 &&
         own.st_dev == named.st_dev && own.st_ino == named.st_ino;
}

void openStandardStreams() {
  // The lowest that is free is given out: the missing ones, one after another.
  int handle = open("/dev/null", O_RDWR);
  while (handle >= 0 && handle <= STDERR_FILENO) handle = open("/dev/null", O_RDWR);
  if (handle >= 0) close(handle);
}

void setBinaryMode(std::FILE*) {}

std::vector<std::string> programArguments(int count, char** arguments) {
  return {arguments, arguments + count};
}

}  // namespace orx::FileFuncs
