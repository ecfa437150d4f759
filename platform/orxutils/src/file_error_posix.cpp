#include <cerrno>
#include <system_error>

#include "orxutils/file_error.h"

namespace orx {
namespace {

thread_local int keptError = 0;
thread_local const char* failedCall = nullptr;

}  // namespace

void KeepFileError(const char* call) noexcept {
  if (keptError != 0) return;
  keptError = errno;
  failedCall = call;
}

void ForgetFileError() noexcept { keptError = 0; }

std::string KeptFileError() {
  if (keptError == 0) return {};
  const std::string message = std::generic_category().message(keptError);
  return failedCall ? std::string(failedCall) + ": " + message : message;
}

}  // namespace orx
