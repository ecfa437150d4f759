#pragma once

#include <filesystem>
#include <optional>
#include <string_view>

#include "orxutils/export.h"
#include "orxutils/orx_string.h"

namespace orx {

/// A wide file name as a path of this system, which has names in UTF-16 or in UTF-8, in
/// the form that its calls take.
/// \return nothing when the name is no text, and so no path
ORXUTILS_EXPORT std::optional<std::filesystem::path> ToPath(const COrxStringT<wchar_t>& name);

/// A path in the form in which this system's calls take it: on Windows one too long for that
/// gets the absolute form that may be so long, every other stays as it is.
ORXUTILS_EXPORT std::filesystem::path ToSystemPath(const std::filesystem::path& path);

/// The name of a file from its drive or root on, without "." and "..". What is no path of this
/// system is left as it is.
ORXUTILS_EXPORT COrxStringT<wchar_t> AbsoluteName(const COrxStringT<wchar_t>& name);

/// A path as a wide file name. Bytes that are no UTF-8 are left out.
ORXUTILS_EXPORT COrxStringT<wchar_t> ToName(const std::filesystem::path& path);

/// The order of file names: by their characters, and on Windows ignoring case, as names that differ
/// in case are one file there.
struct ORXUTILS_EXPORT NameOrder {
  using is_transparent = void;  ///< views are looked up, too
  /// True when `a` comes first.
  bool operator()(std::wstring_view a, std::wstring_view b) const;
};

}  // namespace orx
