#include "userdirs/user_dirs.h"

#include <cstdlib>
#include <filesystem>

#include "orxutils/path.h"

namespace orx {
namespace {

#ifdef _WIN32
using NativeString = COrxStringT<wchar_t>;
NativeString Variable(const wchar_t* name) {
  const wchar_t* const value = _wgetenv(name);
  return value ? value : NativeString();
}
NativeString BaseDirectory() { return Variable(L"LOCALAPPDATA"); }
#define NATIVE(text) L##text
#else
using NativeString = COrxStringT<char>;
NativeString Variable(const char* name) {
  const char* const value = std::getenv(name);
  return value ? value : NativeString();
}
NativeString BaseDirectory() {
  const NativeString data = Variable("XDG_DATA_HOME");
  return data.empty() ? Variable("HOME") + "/.local/share" : data;
}
#define NATIVE(text) text
#endif

}  // namespace

COrxStringT<wchar_t> GetUserGeoDir() {
  const NativeString replacement = Variable(NATIVE("ORX_USER_GEO_DIR"));
  const std::filesystem::path directory =
      replacement.empty() ? std::filesystem::path(BaseDirectory()) / "orx/geodata"
                          : std::filesystem::path(replacement);
  COrxStringT<wchar_t> name = ToName(directory);
  while (name.size() > 1 && (name.back() == L'/' || name.back() == L'\\')) name.pop_back();
  return name;
}

}  // namespace orx
