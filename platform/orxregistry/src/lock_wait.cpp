#include "lock_wait.h"

#include <algorithm>
#include <thread>
#include <utility>

#include "orxregistry/in_file_key.h"
#include "orxutils/path.h"

namespace orx {
namespace {

using std::chrono::microseconds;

constexpr microseconds kFirstPause{100};
constexpr microseconds kLongestPause{10'000};
constexpr std::chrono::seconds kLongWait{1};

AwaitedLock& Teller() {
  static AwaitedLock tell;
  return tell;
}

}  // namespace

void OnAwaitedLock(AwaitedLock tell) { Teller() = std::move(tell); }

namespace os {

LockWait::LockWait(const std::filesystem::path& file)
    : file_(file), begin_(Clock::now()), pause_(kFirstPause) {}

bool LockWait::GoOn() {
  const Clock::duration waited = Clock::now() - begin_;
  if (waited > kLongestLockWait) return false;
  if (!isTold_ && waited > kLongWait && Teller()) {
    Teller()(ToName(file_));
    isTold_ = true;
  }
  std::this_thread::sleep_for(pause_);
  pause_ = std::min(pause_ * 3 / 2, kLongestPause);
  return true;
}

}  // namespace os
}  // namespace orx
