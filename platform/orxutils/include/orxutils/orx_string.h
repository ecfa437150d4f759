#pragma once

#include <string>
#include <string_view>

#include "orxutils/export.h"

namespace orx {

/// The wide and the 8-bit string of every interface.
template <class Char>
using COrxStringT = std::basic_string<Char>;

/// ISO 8859-1 text as wide text: one byte, one character.
ORXUTILS_EXPORT COrxStringT<wchar_t> Widen(std::string_view text);

/// Wide text as ISO 8859-1; a character above 0xFF becomes '?'.
ORXUTILS_EXPORT COrxStringT<char> Narrow(std::wstring_view text);

/// Wide text as UTF-16. A lone surrogate stays as it is, a value that is no code point becomes
/// U+FFFD.
ORXUTILS_EXPORT std::u16string ToUtf16(std::wstring_view text);

/// UTF-16 as wide text. A lone surrogate stays as it is.
ORXUTILS_EXPORT COrxStringT<wchar_t> FromUtf16(std::u16string_view text);

/// Compares without regard to the case of letters, as the C library's `towlower` sees it.
ORXUTILS_EXPORT bool EqualsIgnoringCase(std::wstring_view a, std::wstring_view b);

}  // namespace orx
