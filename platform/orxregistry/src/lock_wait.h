#pragma once

#include <chrono>
#include <filesystem>

namespace orx::os {

/// Waiting for a file's lock, between one attempt and the next.
class LockWait {
 public:
  /// \param file must outlive the object
  explicit LockWait(const std::filesystem::path& file);

  /// Waits a little, each time somewhat longer. After a second it tells whoever asked for it
  /// (OnAwaitedLock).
  /// \return false when it has been long enough
  bool GoOn();

 private:
  using Clock = std::chrono::steady_clock;

  const std::filesystem::path& file_;
  const Clock::time_point begin_;
  std::chrono::microseconds pause_;
  bool isTold_ = false;
};

}  // namespace orx::os
