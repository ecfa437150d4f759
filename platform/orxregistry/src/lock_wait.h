#pragma once

#include <condition_variable>
#include <filesystem>
#include <mutex>
#include <thread>

namespace orx::os {

/// While one is there a file's lock is awaited, which is told to whoever asked for it
/// (OnAwaitedLock) when it takes long.
class LockWait {
 public:
  explicit LockWait(const std::filesystem::path& file);
  LockWait(const LockWait&) = delete;
  LockWait& operator=(const LockWait&) = delete;
  ~LockWait();

 private:
  std::mutex mutex_;
  std::condition_variable ended_;
  bool hasEnded_ = false;
  std::thread clock_;
};

}  // namespace orx::os
