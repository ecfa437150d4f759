#include "limits.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <memory>
#include <random>

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

double SecondsOf(const std::function<void()>& call) {
  const auto start = std::chrono::steady_clock::now();
  call();
  const std::chrono::duration<double> took = std::chrono::steady_clock::now() - start;
  return took.count();
}

std::size_t ReadFile(const fs::path& path) {
  std::size_t size = 0;
  ReadAll(path, size);
  return size;
}

void ReadPieces(const fs::path& path) {
  static std::mt19937 random;
  constexpr std::size_t kPieces = 6;
  constexpr std::size_t kPieceSize = 4096;
  const int file = open(path.c_str(), O_RDONLY | O_CLOEXEC);
  struct stat status = {};
  Require(file >= 0 && fstat(file, &status) == 0, "opening " + path.string());
  char piece[kPieceSize];
  const std::size_t size = std::min(static_cast<std::size_t>(status.st_size), kPieceSize);
  const std::size_t places = static_cast<std::size_t>(status.st_size) - size + 1;
  for (std::size_t i = 0; i < kPieces; ++i) {
    const auto place = static_cast<off_t>(random() % places);
    Require(pread(file, piece, size, place) == static_cast<ssize_t>(size), "reading a piece");
  }
  close(file);
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

}  // namespace velta_bench
