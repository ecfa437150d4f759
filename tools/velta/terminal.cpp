#include "terminal.h"

#include <algorithm>
#include <cstdio>
#include <utility>

#include "orxutils/file_funcs.h"

namespace velta_tool {
namespace {

constexpr std::chrono::seconds kLongInput{1};
constexpr std::chrono::milliseconds kBetweenUpdates{200};
constexpr double kMegabyte = 1e6;

/// The control character at a place of a UTF-8 text, one of ASCII or of U+0080 to U+009F.
/// \return its code, -1 when there is none
int ControlAt(const std::string& text, std::size_t at) {
  constexpr unsigned char kDelete = 0x7F;
  constexpr unsigned char kLead = 0xC2;
  const auto first = static_cast<unsigned char>(text[at]);
  if (first < ' ' || first == kDelete) return first;
  if (first != kLead || at + 1 == text.size()) return -1;
  const auto second = static_cast<unsigned char>(text[at + 1]);
  return second >= 0x80 && second < 0xA0 ? second : -1;
}

std::string Escaped(const std::string& text, bool keepsLines) {
  constexpr int kFirstOfTwoBytes = 0x80;
  std::string escaped;
  for (std::size_t at = 0; at < text.size(); ++at) {
    const int control = ControlAt(text, at);
    if (control < 0 || (keepsLines && control == '\n')) {
      escaped += text[at];
      continue;
    }
    char code[sizeof "\\u0000"];
    std::snprintf(code, sizeof code, "\\u%04x", static_cast<unsigned>(control) & 0xFFU);
    escaped += code;
    if (control >= kFirstOfTwoBytes) ++at;
  }
  return escaped;
}

}  // namespace

std::string WithoutControls(std::string text) {
  const auto isSuspicious = [](char c) {
    const auto byte = static_cast<unsigned char>(c);
    return (byte < ' ' && byte != '\n') || byte == 0x7F || byte == 0xC2;
  };
  if (std::none_of(text.begin(), text.end(), isSuspicious)) return text;
  return Escaped(text, true);
}

std::string Printable(const std::string& name) { return Escaped(name, false); }

Progress::Progress()
    : next_(Clock::now() + kLongInput), terminal_(orx::FileFuncs::isTerminal(stderr)) {}

void Progress::Clear() {
  if (std::exchange(shown_, false)) std::fprintf(stderr, "%24s\r", "");
}

// The cursor goes back to the start of the line, so that any other output covers the text.
void Progress::Show(std::uint64_t bytes) {
  if (!terminal_ || Clock::now() < next_) return;
  std::fprintf(stderr, "%10.1f MB read\r", static_cast<double>(bytes) / kMegabyte);
  next_ = Clock::now() + kBetweenUpdates;
  shown_ = true;
}

}  // namespace velta_tool
