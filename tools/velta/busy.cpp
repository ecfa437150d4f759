#include "busy.h"

#include <cstdint>
#include <filesystem>
#include <system_error>

#include "files.h"
#include "orxutils/path.h"
#include "terminal.h"

namespace velta_tool {

Busy::Busy(const std::string& what, const std::vector<std::string>& files) {
  constexpr std::uintmax_t kHalfASecond = 8'000'000;  // bytes of a file that are read in it
  std::uintmax_t bytes = 0;
  std::string names;
  for (const std::string& file : files) {
    std::error_code error;
    const std::uintmax_t size = std::filesystem::file_size(orx::ToSystemPath(PathOf(file)), error);
    if (error) continue;
    bytes += size;
    names += ' ' + NameOf(PathOf(file).filename());
  }
  if (bytes >= kHalfASecond) ShowOnLine(what + Printable(names) + " ...");
}

Busy::~Busy() { ClearLine(); }

}  // namespace velta_tool
