#include <cerrno>
#include <system_error>

#include "orxutils/file_error.h"

namespace orx {
namespace {

thread_local int keptError = 0;

}  // namespace

void KeepFileError() noexcept {
  if (keptError == 0) keptError = errno;
}

void ForgetFileError() noexcept { keptError = 0; }

std::string KeptFileError() {
  return keptError == 0 ? std::string() : std::generic_category().message(keptError);
}

}  // namespace orx
