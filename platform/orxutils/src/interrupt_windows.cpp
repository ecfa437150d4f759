#define NOMINMAX
#include <windows.h>

#include <utility>

#include "orxutils/interrupt.h"

namespace orx {
namespace {

std::function<void()> workOnce;

/// Called in a thread of its own.
BOOL WINAPI Handle(DWORD /*event*/) {
  static long calls = 0;
  if (InterlockedIncrement(&calls) > 1) return FALSE;
  workOnce();
  return TRUE;
}

}  // namespace

void OnInterrupt(std::function<void()> work) {
  workOnce = std::move(work);
  SetConsoleCtrlHandler(&Handle, TRUE);
}

}  // namespace orx
