#include "terminal.h"

#include <algorithm>
#include <cstdio>
#include <string_view>
#include <utility>

#include "orxutils/file_funcs.h"

namespace velta_tool {
namespace {

constexpr std::chrono::seconds kLongInput{1};
constexpr std::chrono::milliseconds kBetweenUpdates{200};
constexpr double kMegabyte = 1e6;

constexpr std::size_t kLine = 79;  // bytes that a terminal's line has at least

bool isQuiet = false;
std::size_t shownBytes = 0;  ///< of the text on the terminal's last line

/// A character that a terminal obeys instead of showing it.
struct Control {
  unsigned code = 0;
  std::size_t bytes = 0;  ///< in UTF-8; 0: there is none
};

/// The control character at a place of a UTF-8 text: one of ASCII, of U+0080 to U+009F, or one that
/// ends or reorders a line.
Control ControlAt(std::string_view text, std::size_t at) {
  constexpr unsigned kDelete = 0x7F;
  const auto byte = [&](std::size_t i) {
    return at + i < text.size() ? static_cast<unsigned char>(text[at + i]) : 0U;
  };
  if (byte(0) < ' ' || byte(0) == kDelete) return {byte(0), 1};
  if (byte(0) == 0xC2 && byte(1) >= 0x80 && byte(1) < 0xA0) return {byte(1), 2};
  const auto continues = [&](std::size_t i) { return byte(i) >= 0x80 && byte(i) < 0xC0; };
  if (byte(0) != 0xE2 || !continues(1) || !continues(2)) return {};
  const unsigned code = 0x2000 | (byte(1) & 0x3FU) << 6U | (byte(2) & 0x3FU);
  const auto isIn = [code](unsigned first, unsigned last) { return code >= first && code <= last; };
  const bool reorders = isIn(0x200E, 0x200F) || isIn(0x202A, 0x202E) || isIn(0x2066, 0x2069);
  const bool endsLine = isIn(0x2028, 0x2029);
  return reorders || endsLine ? Control{code, 3} : Control();
}

std::string Escaped(const std::string& text, bool keepsLines) {
  std::string escaped;
  for (std::size_t at = 0; at < text.size();) {
    const Control control = ControlAt(text, at);
    if (control.bytes == 0 || (keepsLines && control.code == '\n')) {
      escaped += text[at++];
      continue;
    }
    char code[sizeof "\\u0000"];
    std::snprintf(code, sizeof code, "\\u%04x", control.code & 0xFFFFU);
    escaped += code;
    at += control.bytes;
  }
  return escaped;
}

}  // namespace

std::string WithoutControls(std::string text) {
  const auto isSuspicious = [](char c) {
    const auto byte = static_cast<unsigned char>(c);
    return (byte < ' ' && byte != '\n') || byte == 0x7F || byte == 0xC2 || byte == 0xE2;
  };
  if (std::none_of(text.begin(), text.end(), isSuspicious)) return text;
  return Escaped(text, true);
}

std::string Printable(const std::string& name) { return Escaped(name, false); }

void BeQuiet() { isQuiet = true; }

bool IsQuiet() { return isQuiet; }

// The cursor goes back to the start of the line, where whatever is printed next begins.
void ShowOnLine(const std::string& text) {
  static const bool isTerminal = orx::FileFuncs::isTerminal(stderr);
  if (!isTerminal || isQuiet) return;
  ClearLine();
  std::size_t bytes = std::min(text.size(), kLine);
  const auto isInside = [&](std::size_t at) { return (text[at] & 0xC0) == 0x80; };
  while (bytes < text.size() && bytes > 0 && isInside(bytes)) --bytes;  // of a character
  std::fprintf(stderr, "%s\r", text.substr(0, bytes).c_str());
  shownBytes = bytes;
}

void ClearLine() {
  const int width = static_cast<int>(std::exchange(shownBytes, 0));
  if (width > 0) std::fprintf(stderr, "%*s\r", width, "");
}

Progress::Progress(std::uint64_t total) : total_(total), next_(Clock::now() + kLongInput) {}

void Progress::Show(std::uint64_t bytes) {
  if (Clock::now() < next_) return;
  next_ = Clock::now() + kBetweenUpdates;
  const auto megabytes = [](std::uint64_t number) {
    char text[32];
    std::snprintf(text, sizeof text, "%.1f", static_cast<double>(number) / kMegabyte);
    return std::string(text);
  };
  ShowOnLine(megabytes(bytes) + (total_ > 0 ? " of " + megabytes(total_) : "") + " MB read");
}

}  // namespace velta_tool
