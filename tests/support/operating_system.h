#pragma once

#ifdef _WIN32
#include <windows.h>
#else
#include <link.h>
#include <sys/resource.h>

#include <csignal>
#endif

#include <string>

namespace velta_test {

#ifdef _WIN32
inline bool IsSiblingLoaded() { return GetModuleHandleA("RTCMGridHost.dll") != nullptr; }
#else
/// Asks the system's loader.
inline bool IsSiblingLoaded() {
  const auto isIt = [](dl_phdr_info* library, std::size_t, void*) {
    return std::string(library->dlpi_name).ends_with("RTCMGridHost.so") ? 1 : 0;
  };
  return dl_iterate_phdr(isIt, nullptr) != 0;
}

/// Calls a function while no file of this process grows beyond so many bytes.
template <class Function>
auto WithFilesUpTo(std::size_t bytes, const Function& function) {
  rlimit before = {};
  getrlimit(RLIMIT_FSIZE, &before);
  const rlimit limit = {bytes, before.rlim_max};
  auto* const handler = std::signal(SIGXFSZ, SIG_IGN);
  setrlimit(RLIMIT_FSIZE, &limit);
  const auto result = function();
  setrlimit(RLIMIT_FSIZE, &before);
  std::signal(SIGXFSZ, handler);
  return result;
}
#endif

}  // namespace velta_test
