#pragma once

#include <cstdio>

#include "orxutils/export.h"
#include "orxutils/orx_string.h"

/// Questions to the file system. Nothing here throws for a name that the system does not take.
namespace orx::FileFuncs {

/// True when a regular file of that name exists.
ORXUTILS_EXPORT bool isFileExists(const COrxStringT<wchar_t>& name);

/// True when a directory of that name exists.
ORXUTILS_EXPORT bool isDirExists(const COrxStringT<wchar_t>& name);

/// Makes a directory with all missing parents.
/// \return true when the directory exists afterwards
ORXUTILS_EXPORT bool createDirectoryTree(const COrxStringT<wchar_t>& name);

/// True when an open file is a terminal.
ORXUTILS_EXPORT bool isTerminal(std::FILE* file);

/// Has an open file's bytes pass as they are, line ends included.
ORXUTILS_EXPORT void setBinaryMode(std::FILE* file);

}  // namespace orx::FileFuncs
