#include "orxutils/file_funcs.h"

#include <filesystem>
#include <system_error>

namespace orx::FileFuncs {
namespace fs = std::filesystem;
namespace {

/// Asks about a path; a name that is no path of this system is answered with false.
template <class Question>
bool Ask(const COrxStringT<wchar_t>& name, Question question) {
  try {
    std::error_code error;
    return question(fs::path(name), error) && !error;
  } catch (const std::system_error&) {
    return false;
  }
}

}  // namespace

bool isFileExists(const COrxStringT<wchar_t>& name) {
  return Ask(name, [](const fs::path& path, std::error_code& error) {
    const fs::file_status status = fs::status(path, error);
    return fs::exists(status) && !fs::is_directory(status);
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

}  // namespace orx::FileFuncs
