#pragma once

#include <filesystem>
#include <string>

namespace orx {

/// A directory and what named it.
struct Directory {
  std::string source;  ///< an environment variable, for texts
  std::filesystem::path path;
};

/// The value of an environment variable; empty when it is not set.
std::filesystem::path Variable(const char* name);

/// True when a path can be given as wide text.
bool IsText(const std::filesystem::path& path);

/// Where this system's programs keep the user's data; no absolute path when nothing names it.
Directory DataDirectory();

}  // namespace orx
