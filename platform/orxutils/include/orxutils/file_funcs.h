#pragma once

#include <cstdio>
#include <filesystem>
#include <string>
#include <vector>

#include "orxutils/export.h"
#include "orxutils/orx_string.h"

/// Questions to the file system and about what a program is started with. Nothing here throws for a
/// name that the system does not take.
namespace orx::FileFuncs {

/// True when a regular file of that name exists.
ORXUTILS_EXPORT bool isFileExists(const COrxStringT<wchar_t>& name);

/// True when a directory of that name exists.
ORXUTILS_EXPORT bool isDirExists(const COrxStringT<wchar_t>& name);

/// Makes a directory with all missing parents, durably.
/// \return true when the directory exists afterwards
ORXUTILS_EXPORT bool createDirectoryTree(const COrxStringT<wchar_t>& name);

/// Makes the name of a file or a directory durable; on Windows and on file systems that have no
/// such operation does nothing.
ORXUTILS_EXPORT bool flushName(const std::filesystem::path& path) noexcept;

/// True when an open file is a terminal.
ORXUTILS_EXPORT bool isTerminal(std::FILE* file);

/// True when an open file is the one of that path, by whatever name.
ORXUTILS_EXPORT bool isSameFile(std::FILE* file, const std::filesystem::path& path);

/// Opens those of the program's three standard streams that it was started without on the null
/// device, so that no file of its own gets their place.
ORXUTILS_EXPORT void openStandardStreams();

/// Has an open file's bytes pass as they are, line ends included; a console takes them for UTF-8
/// until the program ends.
ORXUTILS_EXPORT void setBinaryMode(std::FILE* file);

/// The arguments of the program, its own name first, as main() gets them; on Windows in UTF-8,
/// whatever the system's code page.
ORXUTILS_EXPORT std::vector<std::string> programArguments(int count, char** arguments);

}  // namespace orx::FileFuncs
