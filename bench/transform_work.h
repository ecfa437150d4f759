#pragma once

#include <filesystem>

/// Positions through the companion program, and through PROJ's cct by what the program exports.
namespace velta_bench {

inline constexpr int kPositions = 100'000;
/// Windows of the residual grid that the positions lie in.
inline constexpr int kWindows = 1000;

class TransformWork {
 public:
  /// Makes the files in a directory, and sees to it that both ways give the same.
  explicit TransformWork(const std::filesystem::path& directory);

  void ByVelta() const;
  void ByCct() const;

 private:
  void MakeFiles() const;
  void MakePositions() const;
  void Compare() const;
  std::filesystem::path In(const char* name) const { return directory_ / name; }

  std::filesystem::path directory_;
};

}  // namespace velta_bench
