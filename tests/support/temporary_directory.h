#pragma once

#include <atomic>
#include <chrono>
#include <filesystem>
#include <string>

namespace velta_test {

/// A new, empty directory that goes with the object.
class TemporaryDirectory {
 public:
  TemporaryDirectory() {
    static std::atomic<unsigned> count{0};
    const auto now = std::chrono::steady_clock::now().time_since_epoch().count();
    const std::string name = "velta-" + std::to_string(now) + "-" + std::to_string(count++);
    path_ = std::filesystem::temp_directory_path() / name;
    std::filesystem::create_directories(path_);
  }
  TemporaryDirectory(const TemporaryDirectory&) = delete;
  TemporaryDirectory& operator=(const TemporaryDirectory&) = delete;
  ~TemporaryDirectory() {
    std::error_code ignored;
    std::filesystem::remove_all(path_, ignored);
  }

  const std::filesystem::path& path() const { return path_; }
  std::filesystem::path operator/(const std::string& name) const { return path_ / name; }

 private:
  std::filesystem::path path_;
};

}  // namespace velta_test
