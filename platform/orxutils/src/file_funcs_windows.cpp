#define NOMINMAX
#include <fcntl.h>
#include <io.h>
#include <windows.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <memory>

#include "orxutils/file_error.h"
#include "orxutils/file_funcs.h"
#include "orxutils/path.h"

// The system's own calls, as those of the C library do not take long names.
namespace orx::FileFuncs {
namespace {

DWORD Attributes(const COrxStringT<wchar_t>& name) {
  return GetFileAttributesW(ToPath(name)->c_str());
}

/// A name as the program's arguments are.
std::string Utf8(const wchar_t* text) {
  const int size = WideCharToMultiByte(CP_UTF8, 0, text, -1, nullptr, 0, nullptr, nullptr);
  std::string utf8(static_cast<std::size_t>(size), '\0');
  WideCharToMultiByte(CP_UTF8, 0, text, -1, utf8.data(), size, nullptr, nullptr);
  utf8.pop_back();  // the terminator
  return utf8;
}

/// The console is the user's and gets its code page back.
bool UseUtf8Console() {
  static const UINT before = GetConsoleOutputCP();
  return SetConsoleOutputCP(CP_UTF8) && std::atexit([] { SetConsoleOutputCP(before); }) == 0;
}

}  // namespace

bool isFileExists(const COrxStringT<wchar_t>& name) {
  const DWORD attributes = Attributes(name);
  return attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_DIRECTORY) == 0;
}

bool isDirExists(const COrxStringT<wchar_t>& name) {
  const DWORD attributes = Attributes(name);
  return attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
}

bool createDirectoryTree(const COrxStringT<wchar_t>& name) {
  if (isDirExists(name)) return true;
  const std::filesystem::path path = name;
  const std::filesystem::path parent = path.parent_path();
  if (parent != path) createDirectoryTree(parent.wstring());
  if (CreateDirectoryW(ToPath(name)->c_str(), nullptr)) return true;
  const DWORD error = GetLastError();
  if (isDirExists(name)) return true;  // others have made it
  SetLastError(error);
  KeepFileError();
  return false;
}

bool flushName(const std::filesystem::path&) noexcept {
  return true;  // every move writes through
}

bool isTerminal(std::FILE* file) { return _isatty(_fileno(file)) != 0; }

bool isSameFile(std::FILE* file, const std::filesystem::path& path) {
  const HANDLE named = CreateFileW(ToSystemPath(path).c_str(), 0,
                                   FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
                                   OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr);
  if (named == INVALID_HANDLE_VALUE) return false;
  const auto open = reinterpret_cast<HANDLE>(_get_osfhandle(_fileno(file)));
  BY_HANDLE_FILE_INFORMATION a;
  BY_HANDLE_FILE_INFORMATION b;
  const bool areKnown =
      GetFileInformationByHandle(open, &a) && GetFileInformationByHandle(named, &b);
  CloseHandle(named);
  return areKnown && a.dwVolumeSerialNumber == b.dwVolumeSerialNumber &&
         a.nFileIndexHigh == b.nFileIndexHigh && a.nFileIndexLow == b.nFileIndexLow;
}

void openStandardStreams() {
  for (std::FILE* const stream : {stdin, stdout, stderr}) {
    if (_fileno(stream) < 0 && !std::freopen("NUL", stream == stdin ? "r" : "w", stream)) return;
  }
}

void setBinaryMode(std::FILE* file) {
  _setmode(_fileno(file), _O_BINARY);
  if (!isTerminal(file)) return;
  [[maybe_unused]] static const bool once = UseUtf8Console();
}

std::vector<std::string> programArguments(int, char**) {
  int count = 0;
  const std::unique_ptr<wchar_t*, decltype(&LocalFree)> wide(
      CommandLineToArgvW(GetCommandLineW(), &count), &LocalFree);
  std::vector<std::string> arguments;
  for (int i = 0; i < count; ++i) arguments.push_back(Utf8(wide.get()[i]));
  return arguments;
}

}  // namespace orx::FileFuncs
