#pragma once

#include <string>

#include "orxutils/export.h"

/// \file
/// Why a file could not be used. Operations on files answer only whether they worked; the first of
/// the system's calls that failed meanwhile is kept, in each thread its own.
namespace orx {

/// Keeps the system's last error, unless one is kept already. To be called right behind a call that
/// failed.
/// \param call the call's name, to be told with the error, or null; must live on
ORXUTILS_EXPORT void KeepFileError(const char* call = nullptr) noexcept;

/// Forgets the error that is kept. To be called before an operation of which one wants to know why
/// it failed.
ORXUTILS_EXPORT void ForgetFileError() noexcept;

/// What the system says of the error that is kept, in UTF-8: "No space left on device". Empty when
/// none is.
ORXUTILS_EXPORT std::string KeptFileError();

}  // namespace orx
