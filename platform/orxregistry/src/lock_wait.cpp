#include "lock_wait.h"

#include <chrono>
#include <system_error>
#include <utility>

#include "orxregistry/in_file_key.h"
#include "orxutils/path.h"

namespace orx {
namespace {

constexpr std::chrono::seconds kLongWait{1};

AwaitedLock& Teller() {
  static AwaitedLock tell;
  return tell;
}

}  // namespace

void OnAwaitedLock(AwaitedLock tell) { Teller() = std::move(tell); }

namespace os {

LockWait::LockWait(const std::filesystem::path& file) {
  if (!Teller()) return;
  const auto watch = [this, name = ToName(file)] {
    std::unique_lock<std::mutex> lock(mutex_);
    if (!ended_.wait_for(lock, kLongWait, [this] { return hasEnded_; })) Teller()(name);
  };
  try {
    clock_ = std::thread(watch);
  } catch (const std::system_error&) {
    // Waits without a word.
  }
}

LockWait::~LockWait() {
  if (!clock_.joinable()) return;
  {
    const std::lock_guard<std::mutex> lock(mutex_);
    hasEnded_ = true;
  }
  ended_.notify_all();
  clock_.join();
}

}  // namespace os
}  // namespace orx
