#include "userdirs/user_dirs.h"

#include <filesystem>
#include <stdexcept>

#include "environment.h"
#include "orxutils/path.h"

namespace orx {
namespace {

constexpr const char* kReplacement = "ORX_USER_GEO_DIR";

/// \throws std::runtime_error when the directory has no name in wide text
COrxStringT<wchar_t> NameOf(const Directory& directory) {
  if (!IsText(directory.path)) {
    throw std::runtime_error(directory.source + " is not UTF-8; set " + kReplacement);
  }
  COrxStringT<wchar_t> name = ToName(directory.path);
  while (name.size() > 1 && (name.back() == L'/' || name.back() == L'\\')) name.pop_back();
  return name;
}

}  // namespace

COrxStringT<wchar_t> GetUserGeoDir() {
  const std::filesystem::path replacement = Variable(kReplacement);
  if (!replacement.empty()) return NameOf({kReplacement, replacement});
  Directory data = DataDirectory();
  // A relative directory would depend on the working directory.
  if (!data.path.is_absolute()) {
    throw std::runtime_error(data.source + " names no directory; set it or " + kReplacement);
  }
  data.path /= "orx/geodata";
  return NameOf(data);
}

}  // namespace orx
