#pragma once

#include <cstddef>
#include <filesystem>
#include <functional>
#include <string>
#include <vector>

/// What no file layer can go below: the same bytes, read or made durable, and nothing else.
namespace velta_bench {

/// What a call takes, in seconds.
double SecondsOf(const std::function<void()>& call);

/// Reads a file into new memory.
/// \return number of bytes
std::size_t ReadFile(const std::filesystem::path& path);

/// Opens a file, asks for its size, reads six pieces of 4 KiB at other places each time, and closes
/// it.
void ReadPieces(const std::filesystem::path& path);

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
}  // namespace velta_bench
