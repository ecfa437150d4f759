#pragma once

#include <filesystem>
#include <optional>

#include "orxutils/export.h"
#include "orxutils/orx_string.h"

namespace orx {

/// A wide file name as a path of this system, which has names in UTF-16 or in UTF-8.
/// \return nothing when the name is no text, and so no path
ORXUTILS_EXPORT std::optional<std::filesystem::path> ToPath(const COrxStringT<wchar_t>& name);

/// A path as a wide file name. Bytes that are no UTF-8 are left out.
ORXUTILS_EXPORT COrxStringT<wchar_t> ToName(const std::filesystem::path& path);

}  // namespace orx
