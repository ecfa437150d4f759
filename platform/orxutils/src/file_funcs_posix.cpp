#include <unistd.h>

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

bool createDirectoryTree(const COrxStringT<wchar_t>& name) {
  return Ask(name, [](const fs::path& path, std::error_code& error) {
    fs::create_directories(path, error);
    return fs::is_directory(path, error);
  });
}

bool isTerminal(std::FILE* file) { return isatty(fileno(file)) != 0; }

void setBinaryMode(std::FILE*) {}

std::vector<std::string> programArguments(int count, char** arguments) {
  return {arguments, arguments + count};
}

}  // namespace orx::FileFuncs
