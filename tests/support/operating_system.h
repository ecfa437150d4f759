#pragma once

#ifdef _WIN32
#include <windows.h>
#else
#include <dlfcn.h>
#include <link.h>
#include <sys/resource.h>

#include <csignal>
#endif

#include <cstddef>
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

/// While it lives, no file of this process grows beyond so many bytes.
class FileSizeLimit {
 public:
  explicit FileSizeLimit(std::size_t bytes) : handler_(std::signal(SIGXFSZ, SIG_IGN)) {
    getrlimit(RLIMIT_FSIZE, &before_);
    const rlimit limit{bytes, before_.rlim_max};
    setrlimit(RLIMIT_FSIZE, &limit);
  }
  FileSizeLimit(const FileSizeLimit&) = delete;
  FileSizeLimit& operator=(const FileSizeLimit&) = delete;
  ~FileSizeLimit() {
    setrlimit(RLIMIT_FSIZE, &before_);
    std::signal(SIGXFSZ, handler_);
  }

 private:
  void (*handler_)(int);
  rlimit before_ = {};
};
#endif

}  // namespace velta_test
