#pragma once

#include <cerrno>

namespace velta_test {

/// What happens at a file operation of the registry.
enum class Fault {
  kFail,    ///< this operation fails, the others work
  kFailOn,  ///< this one and all that follow fail
  kShort,   ///< a write stops half-way, and the next one fails; other operations fail
  kKill     ///< the process is killed in front of it
};

/// The fault machine: stands between the libraries and the system's file operations. It counts
/// them while it is armed, and spoils one.
class FileFaults {
 public:
  /// Arms the machine until the object goes.
  /// \param place number of the operation to spoil; negative: only count
  explicit FileFaults(int place, Fault fault = Fault::kFail, int error = EIO);
  FileFaults(const FileFaults&) = delete;
  FileFaults& operator=(const FileFaults&) = delete;
  ~FileFaults();

  /// Operations seen so far.
  int count() const;
};

}  // namespace velta_test
