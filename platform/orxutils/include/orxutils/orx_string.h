#pragma once

#include <optional>
#include <string>
#include <string_view>

#include "orxutils/export.h"

/// What the libraries stand on: text and file names in any language, trees of keys and values in
/// files, libraries loaded at run time.
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

/// Wide text as UTF-8. What is no code point is left out.
ORXUTILS_EXPORT std::string ToUtf8(std::wstring_view text);

/// UTF-8 as wide text; nothing when it is not valid UTF-8.
ORXUTILS_EXPORT std::optional<COrxStringT<wchar_t>> FromUtf8(std::string_view text);

/// True for the letters and digits of ASCII and for B2, B3, B9, C0 to D6, D8 to F6 and F8 to FF of
/// ISO 8859-1: what 64-bit Windows takes for one, here on every system and in every locale.
ORXUTILS_EXPORT bool IsLetterOrDigit(wchar_t c);

/// Compares without regard to the case of letters: those of ASCII in every locale, others as the C
/// library's `towlower` sees them.
ORXUTILS_EXPORT bool EqualsIgnoringCase(std::wstring_view a, std::wstring_view b);

}  // namespace orx
