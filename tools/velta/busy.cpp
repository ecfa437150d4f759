#include "busy.h"

#include <cstdint>

#include "files.h"
#include "terminal.h"

namespace velta_tool {

Busy::Busy(const std::string& what, std::vector<std::string> files) {
  std::erase(files, "");
  constexpr std::uint64_t kHalfASecond = 8'000'000;  // bytes of a file that are read in it
  if (SizeTogether(files) < kHalfASecond) return;
  const std::string more =
      files.size() > 1 ? " and " + std::to_string(files.size() - 1) + " more" : "";
  ShowOnLine(what + ' ' + Printable(NameOf(PathOf(files.front()).filename())) + more + " ...");
}

Busy::~Busy() { ClearLine(); }

}  // namespace velta_tool
