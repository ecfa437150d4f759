#define WIN32_LEAN_AND_MEAN
#define NOMINMAX
#include <windows.h>

#include "orxutils/file_error.h"
#include "orxutils/orx_string.h"

namespace orx {
namespace {

thread_local DWORD keptError = ERROR_SUCCESS;

}  // namespace

// Windows' messages tell enough without the name.
void KeepFileError(const char* /*call*/) noexcept {
  if (keptError == ERROR_SUCCESS) keptError = GetLastError();
}

void ForgetFileError() noexcept { keptError = ERROR_SUCCESS; }

std::string KeptFileError() {
  if (keptError == ERROR_SUCCESS) return {};
  wchar_t text[512];
  constexpr DWORD kEnglish = MAKELANGID(LANG_ENGLISH, SUBLANG_ENGLISH_US);
  const auto ask = [&](DWORD language) {
    return FormatMessageW(FORMAT_MESSAGE_FROM_SYSTEM | FORMAT_MESSAGE_IGNORE_INSERTS, nullptr,
                          keptError, language, text, DWORD{sizeof text / sizeof *text}, nullptr);
  };
  DWORD length = ask(kEnglish);
  if (length == 0) length = ask(0);
  if (length == 0) return "system error " + std::to_string(keptError);
  std::wstring_view message(text, length);
  // It ends with a full stop and the end of a line.
  message = message.substr(0, message.find_last_not_of(L".\r\n ") + 1);
  return ToUtf8(message);
}

}  // namespace orx
