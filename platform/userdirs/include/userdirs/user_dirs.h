#pragma once

#include "orxutils/orx_string.h"
#include "userdirs/export.h"

namespace orx {

/// The user's geodetic data directory, without a trailing separator: the environment variable
/// ORX_USER_GEO_DIR if it is set, else "orx/geodata" below %LOCALAPPDATA% (Windows) or below
/// $XDG_DATA_HOME or ~/.local/share (elsewhere; without HOME the home directory is that of the
/// password database).
/// \throws std::runtime_error that names the variable, when there is no such directory to be had or
///     its name is not UTF-8
USERDIRS_EXPORT COrxStringT<wchar_t> GetUserGeoDir();

}  // namespace orx
