#pragma once

#include <functional>

#include "orxutils/export.h"

namespace orx {

/// Has `work` done, in a thread of its own, when the user or the system asks the program to end:
/// SIGINT, SIGTERM or SIGHUP, on Windows Ctrl-C, Ctrl-Break or the closing of the console. Only the
/// first time; the second ends the program at once. A signal that the program was started to ignore
/// stays ignored. To be called once, before there are other threads.
ORXUTILS_EXPORT void OnInterrupt(std::function<void()> work);

}  // namespace orx
