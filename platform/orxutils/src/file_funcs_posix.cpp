#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <filesystem>
#include <optional>
#include <system_error>

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

bool MakeDirectory(const fs::path& path, std::error_code& error) {
  if (fs::is_directory(path, error)) return true;
  const fs::path parent = path.has_parent_path() ? path.parent_path() : ".";
  if (parent != path && !MakeDirectory(parent, error)) return false;
  if (!fs::create_directory(path, error)) return fs::is_directory(path, error);  // another's
  const std::error_code flush = flushDirectory(parent);
  if (!flush || flush == std::errc::permission_denied) return true;
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

std::error_code flushDirectory(const fs::path& directory) {
  const auto error = [] { return std::error_code(errno, std::generic_category()); };
  const int handle = open(directory.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
  if (handle < 0) return error();
  const bool isDone = fsync(handle) == 0 || errno == EINVAL;
  const std::error_code result = isDone ? std::error_code() : error();
  close(handle);
  return result;
}

bool isTerminal(std::FILE* file) { return isatty(fileno(file)) != 0; }

void setBinaryMode(std::FILE*) {}

std::vector<std::string> programArguments(int count, char** arguments) {
  return {arguments, arguments + count};
}

}  // namespace orx::FileFuncs
