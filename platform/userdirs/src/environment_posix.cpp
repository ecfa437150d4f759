#include <pwd.h>
#include <unistd.h>

#include <cstdlib>
#include <vector>

#include "environment.h"
#include "orxutils/orx_string.h"

namespace orx {
namespace {

/// The home directory that the password database knows; empty when it knows none.
std::filesystem::path KnownHome() {
  constexpr std::size_t kLongestEntry = std::size_t{64} * 1024;
  std::vector<char> memory(kLongestEntry);
  passwd entry = {};
  passwd* found = nullptr;
  getpwuid_r(getuid(), &entry, memory.data(), memory.size(), &found);
  return found ? found->pw_dir : "";
}

}  // namespace

std::filesystem::path Variable(const char* name) {
  const char* const value = std::getenv(name);
  return value ? value : "";
}

bool IsText(const std::filesystem::path& path) { return FromUtf8(path.native()).has_value(); }

Directory DataDirectory() {
  // One that is not absolute does not count, as the XDG Base Directory conventions have it.
  const std::filesystem::path data = Variable("XDG_DATA_HOME");
  if (data.is_absolute()) return {"XDG_DATA_HOME", data};
  std::filesystem::path home = Variable("HOME");
  if (!home.is_absolute()) home = KnownHome();
  return {"HOME", home.is_absolute() ? home / ".local/share" : home};
}

}  // namespace orx
