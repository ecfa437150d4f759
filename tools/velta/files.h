#pragma once

#include <CLI/App.hpp>
#include <cstdint>
#include <filesystem>
#include <fstream>
#include <memory>
#include <stdexcept>
#include <streambuf>
#include <string>
#include <vector>

namespace velta_tool {

/// A text of the command line, which is UTF-8, as the libraries take file names.
/// \throws std::runtime_error when it is not UTF-8
std::wstring ToWide(const std::string& argument);

/// A file name in UTF-8, as those of the command line are.
std::filesystem::path PathOf(const std::string& name);

/// A file name as UTF-8.
std::string NameOf(const std::filesystem::path& path);

/// The two kinds of files that the library keeps, by their extensions.
enum class FileKind { kDatum, kProjection, kOther };
FileKind KindOf(const std::string& file);
/// \param kind one of the two
std::string ExtensionOf(FileKind kind);

/// \throws std::runtime_error that says why the file is none that can be read
void RequireFile(const std::string& file);

/// A request that is refused before anything is done.
struct WrongCall : std::runtime_error {
  using std::runtime_error::runtime_error;
};

/// Accepts any name but an empty one, which is mostly a variable that is not set.
extern const CLI::Validator kFileName;

/// Accepts names of datum files, or of datum and projection files.
extern const CLI::Validator kDatumFile;
extern const CLI::Validator kProjectionFile;
extern const CLI::Validator kDatumOrProjectionFile;

/// A file to read or, under the name "-", standard input.
class Input {
 public:
  /// \throws std::runtime_error when the file cannot be opened
  explicit Input(const std::string& name);

  /// Lives as long as the object; throws std::runtime_error when reading fails.
  std::streambuf& buffer() { return *buffer_; }

 private:
  std::vector<char> memory_;
  std::filebuf file_;
  std::unique_ptr<std::streambuf> buffer_;
};

/// \return the bytes of files together; 0 when one of them has no size, as a pipe has none
std::uint64_t SizeTogether(const std::vector<std::string>& files);

/// What is written to an output.
enum class OutputKind { kText, kBinary };

/// A file to write or, under the name "-", standard output. A file is written beside its place and
/// gets its name when it is whole; until then what was there stays. Control characters, which may
/// come from a stream or a file, are written as "\u001b" is.
class Output {
 public:
  /// Standard output, for text.
  /// \param inputs the names of the files that are read meanwhile
  explicit Output(const std::vector<std::string>& inputs)
      : Output("-", OutputKind::kText, inputs) {}

  /// \param inputs as above
  /// \throws WrongCall for frames to a terminal, for an input, and for a registry file's name
  /// \throws std::runtime_error when the file cannot be made
  Output(const std::string& name, OutputKind kind, const std::vector<std::string>& inputs);
  Output(const Output&) = delete;
  Output& operator=(const Output&) = delete;
  ~Output() { Discard(); }

  /// What goes out by the next Flush().
  std::string& pending() { return pending_; }
  /// Writes what is pending once there is a good deal of it.
  /// \throws std::runtime_error when it cannot be written
  void FlushIfLarge();
  /// Writes what is pending.
  /// \throws std::runtime_error when it cannot be written
  void Flush();

  /// Writes what is pending, and gives the file its name.
  /// \throws std::runtime_error when that cannot be done
  void Finish();
  /// Leaves what is at the file's place as it is.
  void Discard();

 private:
  void RefuseInputs(const std::vector<std::string>& inputs, const std::filesystem::path& path);
  void Open(const std::filesystem::path& path);
  [[noreturn]] void Fail();

  std::string name_;
  OutputKind kind_;
  std::filesystem::path place_;
  std::filesystem::path beside_;  ///< empty when nothing is written beside its place
  std::filebuf file_;
  std::streambuf* buffer_;
  std::string pending_;
};

/// What is wrong with a registry file, for people.
/// \param error its error state
/// \param reason what the system said; may be empty
/// \return empty when nothing is
std::string ErrorStateText(std::uint32_t error, const std::string& reason);

/// The state of a registry file.
struct FileState {
  std::uint32_t error = 0;
  std::string text;  ///< empty when nothing is wrong
};

/// The state of a file, which the library does not tell. Reads the whole of it, also what the
/// library skips.
FileState StateOf(const std::string& file);

}  // namespace velta_tool
