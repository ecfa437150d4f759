#include "limits.h"

#include <fcntl.h>
#include <sys/resource.h>
#include <unistd.h>

#include "workload.h"

namespace velta_bench {
namespace fs = std::filesystem;
namespace {

std::unique_ptr<char[]> ReadAll(const fs::path& path, std::size_t& size) {
  const int file = open(path.c_str(), O_RDONLY | O_CLOEXEC);
  Require(file >= 0, "opening " + path.string());
  size = fs::file_size(path);
  auto bytes = std::make_unique_for_overwrite<char[]>(size);
  std::size_t done = 0;
  while (done < size) {
    const ssize_t count = read(file, bytes.get() + done, size - done);
    Require(count > 0, "reading " + path.string());
    done += static_cast<std::size_t>(count);
  }
  close(file);
  return bytes;
}

void WriteAll(int file, const char* bytes, std::size_t size) {
  std::size_t done = 0;
  while (done < size) {
    const ssize_t count = write(file, bytes + done, size - done);
    Require(count > 0, "writing");
    done += static_cast<std::size_t>(count);
  }
}

}  // namespace

std::size_t ReadFile(const fs::path& path) {
  std::size_t size = 0;
  ReadAll(path, size);
  return size;
}

DurableAppender::DurableAppender(const fs::path& path)
    : file_(open(path.c_str(), O_WRONLY | O_CREAT | O_APPEND | O_CLOEXEC, 0666)) {
  Require(file_ >= 0, "opening " + path.string());
}

DurableAppender::~DurableAppender() { close(file_); }

void DurableAppender::Append(const std::string& bytes) {
  WriteAll(file_, bytes.data(), bytes.size());
  Require(fdatasync(file_) == 0, "flushing");
}

void JoinDurably(const std::vector<fs::path>& parts, const fs::path& to) {
  const int file = open(to.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0666);
  Require(file >= 0, "opening " + to.string());
  for (const fs::path& part : parts) {
    std::size_t size = 0;
    const std::unique_ptr<char[]> bytes = ReadAll(part, size);
    WriteAll(file, bytes.get(), size);
  }
  Require(fdatasync(file) == 0, "flushing");
  close(file);
}

std::size_t PeakMemory() {
  constexpr std::size_t kKibibyte = 1024;
  rusage usage = {};
  getrusage(RUSAGE_SELF, &usage);
  return static_cast<std::size_t>(usage.ru_maxrss) * kKibibyte;
}

}  // namespace velta_bench
