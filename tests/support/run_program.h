#pragma once

#include <filesystem>
#include <string>
#include <vector>

#ifdef _WIN32
#include <windows.h>
#else
#include <fcntl.h>
#include <spawn.h>
#include <sys/wait.h>
#endif

namespace velta_test {

/// Runs a program without a command interpreter, with its standard streams on files, and waits.
/// \param arguments the program's path first; none has a backslash before a quotation mark, nor, if
///     there is a blank in it, at its end
/// \return its exit status, negative when it did not start or did not end by itself
#ifdef _WIN32

inline int RunProgram(const std::vector<std::string>& arguments, const std::filesystem::path& in,
                      const std::filesystem::path& out, const std::filesystem::path& err) {
  std::wstring call;
  for (const std::string& argument : arguments) {
    const std::wstring wide = std::filesystem::u8path(argument).wstring();
    const bool isQuoted = wide.empty() || wide.find(L' ') != wide.npos;
    call += isQuoted ? L"\"" : L"";
    for (const wchar_t c : wide) {
      if (c == L'"') call += L'\\';
      call += c;
    }
    call += isQuoted ? L"\" " : L" ";
  }
  SECURITY_ATTRIBUTES inherited = {sizeof inherited, nullptr, TRUE};
  const auto open = [&inherited](const std::filesystem::path& path, DWORD access, DWORD how) {
    return CreateFileW(path.c_str(), access, FILE_SHARE_READ, &inherited, how, 0, nullptr);
  };
  STARTUPINFOW start = {};
  start.cb = sizeof start;
  start.dwFlags = STARTF_USESTDHANDLES;
  start.hStdInput = open(in, GENERIC_READ, OPEN_EXISTING);
  start.hStdOutput = open(out, GENERIC_WRITE, CREATE_ALWAYS);
  start.hStdError = open(err, GENERIC_WRITE, CREATE_ALWAYS);
  PROCESS_INFORMATION process = {};
  const BOOL isStarted = CreateProcessW(nullptr, call.data(), nullptr, nullptr, TRUE, 0, nullptr,
                                        nullptr, &start, &process);
  DWORD status = static_cast<DWORD>(-1);
  if (isStarted) {
    WaitForSingleObject(process.hProcess, INFINITE);
    GetExitCodeProcess(process.hProcess, &status);
    CloseHandle(process.hProcess);
    CloseHandle(process.hThread);
  }
  for (const HANDLE stream : {start.hStdInput, start.hStdOutput, start.hStdError}) {
    CloseHandle(stream);
  }
  return static_cast<int>(status);
}

#else

inline int RunProgram(const std::vector<std::string>& arguments, const std::filesystem::path& in,
                      const std::filesystem::path& out, const std::filesystem::path& err) {
  std::vector<char*> pointers;
  for (const std::string& argument : arguments) {
    pointers.push_back(const_cast<char*>(argument.c_str()));
  }
  pointers.push_back(nullptr);
  constexpr int kWrite = O_WRONLY | O_CREAT | O_TRUNC;
  posix_spawn_file_actions_t streams;
  posix_spawn_file_actions_init(&streams);
  posix_spawn_file_actions_addopen(&streams, 0, in.c_str(), O_RDONLY, 0);
  posix_spawn_file_actions_addopen(&streams, 1, out.c_str(), kWrite, 0666);
  posix_spawn_file_actions_addopen(&streams, 2, err.c_str(), kWrite, 0666);
  pid_t process = -1;
  const int error =
      posix_spawnp(&process, pointers[0], &streams, nullptr, pointers.data(), environ);
  posix_spawn_file_actions_destroy(&streams);
  int status = -1;
  if (error != 0 || waitpid(process, &status, 0) != process) return -1;
  return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

#endif

}  // namespace velta_test
