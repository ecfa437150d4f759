#pragma once

#include <functional>

namespace velta_tool {

/// Lets the user end a command that reads a stream: when the program is asked to end, it does so as
/// soon as it waits for input.
/// \param finish does what is done at the end of the input, and answers with the exit status
void FinishWhenInterrupted(std::function<int()> finish);

/// True once the program has been asked to end: no more input is to be awaited. What has been read
/// is still to be taken, by `finish`.
bool IsInterrupted();

/// While one is there the program waits for input, and may be ended.
class WaitingForInput {
 public:
  WaitingForInput();
  ~WaitingForInput();
  WaitingForInput(const WaitingForInput&) = delete;
  WaitingForInput& operator=(const WaitingForInput&) = delete;
};

}  // namespace velta_tool
