#include "interrupt.h"

#include <cstdlib>
#include <exception>
#include <mutex>
#include <utility>

#include "command.h"
#include "orxutils/interrupt.h"

namespace velta_tool {
namespace {

/// Held by whoever works: the main thread but while it waits for input, then the thread that
/// finishes, which ends the program and so never gives it back.
std::mutex& Work() {
  static auto* const work = new std::mutex;  // never ends, as a thread may wait for it at the end
  [[maybe_unused]] static const bool isMainThreads = (work->lock(), true);
  return *work;
}

bool isInterrupted = false;  ///< belongs to whoever holds the work

}  // namespace

void FinishWhenInterrupted(std::function<int()> finish) {
  Work();
  orx::OnInterrupt([finish = std::move(finish)] {
    const std::lock_guard<std::mutex> working(Work());
    isInterrupted = true;
    int status = kFailed;
    try {
      status = finish();
    } catch (const std::exception& error) {
      ReportFailure(error.what());
    }
    std::_Exit(status);
  });
}

bool IsInterrupted() { return isInterrupted; }

WaitingForInput::WaitingForInput() { Work().unlock(); }

WaitingForInput::~WaitingForInput() { Work().lock(); }

}  // namespace velta_tool
