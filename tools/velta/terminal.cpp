#include "terminal.h"

#include <cstdio>
#include <utility>

#include "orxutils/file_funcs.h"

namespace velta_tool {
namespace {

constexpr std::chrono::seconds kLongInput{1};
constexpr std::chrono::milliseconds kBetweenUpdates{200};
constexpr double kMegabyte = 1e6;

}  // namespace

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
