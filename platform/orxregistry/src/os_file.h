#pragma once

#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <memory>
#include <optional>

/// The few operations on files that the registry is built on, one implementation for each
/// operating system. Every failure is reported by the result; nothing throws.
namespace orx::os {

/// Identifies a file and its state.
struct FileStamp {
  std::uint64_t device = 0;
  std::uint64_t file = 0;
  std::uint64_t size = 0;      ///< bytes
  std::int64_t modified = -1;  ///< time of the last change, in units of the system's own

  bool operator==(const FileStamp&) const = default;
  bool IsSameFile(const FileStamp& other) const {
    return device == other.device && file == other.file;
  }
};

/// An open file, closed (and unlocked) by its destructor.
class File {
 public:
  /// \return nothing when the file cannot be opened
  static std::optional<File> OpenToRead(const std::filesystem::path& path);

  /// Opens a file to change it, and holds it against everybody who does the same, in this process
  /// or in others, until it is closed. Waits for its turn, but not for ever.
  /// \return nothing when the file cannot be opened or locked
  static std::optional<File> OpenLocked(const std::filesystem::path& path);

  /// Makes a file, locked as above. One of that name that a process left when it was stopped is
  /// removed.
  /// \return nothing when it cannot be made, or the name is taken by something else
  static std::optional<File> CreateLocked(const std::filesystem::path& path);

  File(File&& other) noexcept : handle_(other.handle_) { other.handle_ = kNone; }
  File(const File&) = delete;
  File& operator=(const File&) = delete;
  ~File();

  std::optional<FileStamp> Stamp() const;

  /// Reads from the file's place `offset`, all that is asked for or up to the end of the file.
  /// \return number of bytes read, or nothing on an error
  std::optional<std::size_t> Read(std::uint64_t offset, unsigned char* to, std::size_t size) const;

  bool Write(std::uint64_t offset, const unsigned char* from, std::size_t size);
  bool Truncate(std::uint64_t size);

  /// Gives the file the owner, the group and the mode of another, where the system has them.
  /// \return false when that fails, or when an access control list says more
  bool TakeAccessOf(const File& other);

  /// Makes what was written durable, the file's size included.
  bool Flush();

 private:
#ifdef _WIN32
  using Handle = void*;
  static constexpr Handle kNone = nullptr;
#else
  using Handle = int;
  static constexpr Handle kNone = -1;
#endif

  explicit File(Handle handle) : handle_(handle) {}

  Handle handle_;
};

/// Memory for a whole file, not initialised.
class Memory {
 public:
  Memory() = default;
  /// \throws std::bad_alloc
  explicit Memory(std::size_t size);

  unsigned char* get() const { return bytes_.get(); }

 private:
  struct Free {
    void operator()(unsigned char* bytes) const;
  };
  std::unique_ptr<unsigned char[], Free> bytes_;
};

/// \return nothing when there is no such file
std::optional<FileStamp> StampOf(const std::filesystem::path& path);

/// The path of a file itself where a name in it is a symbolic link.
std::filesystem::path WithoutLinks(const std::filesystem::path& path);

/// Gives a file another name in the same directory and makes the change of the directory durable.
/// \param replace false: fails when there is a file of that name
bool Rename(const std::filesystem::path& from, const std::filesystem::path& to, bool replace);

void Remove(const std::filesystem::path& path);

}  // namespace orx::os
