#pragma once

#include <filesystem>
#include <functional>

namespace velta_test {

/// What happens at a file operation of the libraries.
enum class Fault {
  kFail,    ///< it fails, the others work
  kShort,   ///< it stops half-way when it is a write; nothing fails
  kFull,    ///< from here on the disk has room for half a write
  kBroken,  ///< it and all that follow fail
  kKill     ///< the process is killed in front of it
};
constexpr Fault kFaults[] = {Fault::kFail, Fault::kShort, Fault::kFull, Fault::kBroken,
                             Fault::kKill};

/// The fault machine: stands between the libraries and the system's file operations. It counts
/// them until it goes, and spoils one.
struct FileFaults {
  /// \param place number of the operation to spoil
  FileFaults(Fault fault, int place);
  FileFaults(const FileFaults&) = delete;
  FileFaults& operator=(const FileFaults&) = delete;
  ~FileFaults();

  /// From here on it is noted what is durable; everything is.
  static void NewDisk();

  static int Count();
  /// A power cut now would lose nothing: what was written was flushed, before its file got its
  /// name; and so was the directory after that.
  static bool IsDurable();
  /// From here on a file's directory counts as not flushed: who named the file may have been
  /// stopped.
  static void ForgetFlush(const std::filesystem::path& path);

  /// The file system cannot rename without replacing.
  static inline bool isOldFileSystem = false;
  /// Done once, in the middle of the next read.
  static inline std::function<void()> meanwhile;
};

}  // namespace velta_test
