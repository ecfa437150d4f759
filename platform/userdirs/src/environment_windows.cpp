#include <cstdlib>

#include "environment.h"

namespace orx {

std::filesystem::path Variable(const char* name) {
  const wchar_t* const value = _wgetenv(std::filesystem::path(name).c_str());
  return value ? value : L"";
}

bool IsText(const std::filesystem::path&) { return true; }

Directory DataDirectory() { return {"LOCALAPPDATA", Variable("LOCALAPPDATA")}; }

}  // namespace orx
