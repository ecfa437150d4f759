#pragma once

#include <cstddef>
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

/// What no file layer can go below: the same bytes, read or made durable, and nothing else.
namespace velta_bench {

/// Reads a file into new memory.
/// \return number of bytes
std::size_t ReadFile(const std::filesystem::path& path);

/// Appends to a file and makes it durable, again and again.
class DurableAppender {
 public:
  explicit DurableAppender(const std::filesystem::path& path);
  DurableAppender(const DurableAppender&) = delete;
  DurableAppender& operator=(const DurableAppender&) = delete;
  ~DurableAppender();

  void Append(const std::string& bytes);

 private:
  int file_;
};

/// Reads files and writes the bytes of all into a new one, durably.
void JoinDurably(const std::vector<std::filesystem::path>& parts, const std::filesystem::path& to);

/// The most memory that this process has had in use, in bytes.
std::size_t PeakMemory();

}  // namespace velta_bench
