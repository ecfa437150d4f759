#pragma once

#include <chrono>
#include <cstdint>
#include <string>

namespace velta_tool {

/// Text as a terminal may get it: control characters, but for the ends of lines, as "\\u001b", as
/// they are in JSON.
std::string WithoutControls(std::string text);

/// A name from a stream or a file as a terminal may get it: on one line, too.
std::string Printable(const std::string& name);

/// From now on the user is told of failures only: no notes, no progress, nothing of what was done.
/// What he asks for, such as a list, he gets.
void BeQuiet();
bool IsQuiet();

/// Shows a text on standard error, when that is a terminal, in place of the one shown before. The
/// next line that is printed takes its place. What is longer than a line is cut.
void ShowOnLine(const std::string& text);

/// Takes away what ShowOnLine shows.
void ClearLine();

/// Shows on standard error, when that is a terminal, how much of a long input has been read.
class Progress {
 public:
  /// \param total bytes that there are; 0 when that is not known
  explicit Progress(std::uint64_t total);
  ~Progress() { ClearLine(); }
  Progress(const Progress&) = delete;
  Progress& operator=(const Progress&) = delete;

  /// \param bytes read so far
  void Show(std::uint64_t bytes);

 private:
  using Clock = std::chrono::steady_clock;

  std::uint64_t total_;
  Clock::time_point next_;
};

}  // namespace velta_tool
