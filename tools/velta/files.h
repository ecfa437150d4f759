#pragma once

#include <CLI/App.hpp>
#include <cstdint>
#include <filesystem>
#include <fstream>
#include <memory>
#include <streambuf>
#include <string>
#include <vector>

namespace velta_tool {

/// A text of the command line, which is UTF-8, as the libraries take file names.
/// \throws std::runtime_error when it is not UTF-8
std::wstring ToWide(const std::string& argument);

/// A file name in UTF-8, as those of the command line are.
std::filesystem::path ToPath(const std::string& name);

/// A file name as UTF-8.
std::string ToName(const std::filesystem::path& path);

/// The two kinds of files that the library keeps, by their extensions.
enum class FileKind { kDatum, kProjection, kOther };
FileKind KindOf(const std::string& file);

/// \throws std::runtime_error when there is no such file
void RequireFile(const std::string& file);

/// Accepts names of datum files, or of datum and projection files.
extern const CLI::Validator kDatumFile;
extern const CLI::Validator kProjectionFile;
extern const CLI::Validator kDatumOrProjectionFile;

/// A file to read or, under the name "-", standard input.
class Input {
 public:
  /// \throws std::runtime_error when the file cannot be opened
  explicit Input(const std::string& name);

  /// Lives as long as the object; throws std::ios_base::failure when reading fails.
  std::streambuf& buffer() { return *buffer_; }

 private:
  std::vector<char> memory_;
  std::filebuf file_;
  std::unique_ptr<std::streambuf> buffer_;
};

/// A file to write or, under the name "-", standard output.
class Output {
 public:
  /// \throws std::runtime_error when the file cannot be made
  explicit Output(const std::string& name = "-");
  Output(const Output&) = delete;
  Output& operator=(const Output&) = delete;

  /// Text that goes out when there is much of it, or by Flush().
  std::string& pending() { return pending_; }
  /// Writes the pending text if there is much of it.
  /// \throws std::runtime_error when it cannot be written
  void FlushMuch();
  /// Writes the pending text.
  /// \throws std::runtime_error when it cannot be written
  void Flush();

 private:
  std::string name_;
  std::filebuf file_;
  std::streambuf* buffer_;
  std::string pending_;
};

/// Says on standard error what is wrong with a registry file.
/// \param error its error state
/// \return false when nothing is
bool ReportErrorState(const std::string& file, std::uint32_t error);

/// As above, for a file that the library reads without telling its state.
bool ReportErrorState(const std::string& file);

}  // namespace velta_tool
