#include "orxutils/orx_string.h"

#include <algorithm>
#include <boost/locale/encoding_utf.hpp>
#include <cwctype>

namespace orx {
namespace conv = boost::locale::conv;
namespace {

constexpr char32_t kReplacement = 0xFFFD;
constexpr char32_t kLastCodePoint = 0x10FFFF;
constexpr char32_t kFirstSupplementary = 0x10000;

constexpr bool IsHighSurrogate(char32_t unit) { return unit >= 0xD800 && unit <= 0xDBFF; }
constexpr bool IsLowSurrogate(char32_t unit) { return unit >= 0xDC00 && unit <= 0xDFFF; }

constexpr bool IsIn(char32_t c, char32_t first, char32_t last) { return c >= first && c <= last; }

/// In a Turkish locale the C library's small letter of "I" is another than "i"; in others "i" is
/// that of U+0130, too. So letters of ASCII have none but each other.
wchar_t ToLower(wchar_t c) {
  constexpr char32_t kFirstBeyondAscii = 0x80;
  if (IsIn(static_cast<char32_t>(c), U'A', U'Z')) return static_cast<wchar_t>(c - L'A' + L'a');
  const auto lower = static_cast<char32_t>(std::towlower(static_cast<std::wint_t>(c)));
  const bool areBeyond = std::min(static_cast<char32_t>(c), lower) >= kFirstBeyondAscii;
  return areBeyond ? static_cast<wchar_t>(lower) : c;
}

}  // namespace

COrxStringT<wchar_t> Widen(std::string_view text) {
  COrxStringT<wchar_t> wide(text.size(), L'\0');
  std::transform(text.begin(), text.end(), wide.begin(),
                 [](char c) { return static_cast<wchar_t>(static_cast<unsigned char>(c)); });
  return wide;
}

COrxStringT<char> Narrow(std::wstring_view text) {
  COrxStringT<char> narrow(text.size(), '\0');
  std::transform(text.begin(), text.end(), narrow.begin(), [](wchar_t c) {
    return static_cast<char32_t>(c) > 0xFF ? '?' : static_cast<char>(c);
  });
  return narrow;
}

std::u16string ToUtf16(std::wstring_view text) {
  std::u16string utf16;
  utf16.reserve(text.size());
  for (const wchar_t c : text) {
    char32_t point = static_cast<char32_t>(c);
    if (point > kLastCodePoint) point = kReplacement;
    if (point < kFirstSupplementary) {
      utf16.push_back(static_cast<char16_t>(point));
    } else {
      point -= kFirstSupplementary;
      utf16.push_back(static_cast<char16_t>(0xD800 + (point >> 10)));
      utf16.push_back(static_cast<char16_t>(0xDC00 + (point & 0x3FF)));
    }
  }
  return utf16;
}

COrxStringT<wchar_t> FromUtf16(std::u16string_view text) {
  COrxStringT<wchar_t> wide;
  wide.reserve(text.size());
  for (std::size_t i = 0; i < text.size(); ++i) {
    char32_t point = text[i];
    const bool pair = sizeof(wchar_t) > sizeof(char16_t) && IsHighSurrogate(point) &&
                      i + 1 < text.size() && IsLowSurrogate(text[i + 1]);
    if (pair) {
      point = kFirstSupplementary + ((point - 0xD800) << 10) + (text[++i] - char32_t{0xDC00});
    }
    wide.push_back(static_cast<wchar_t>(point));
  }
  return wide;
}

std::string ToUtf8(std::wstring_view text) {
  return conv::utf_to_utf<char>(text.data(), text.data() + text.size(), conv::skip);
}

std::optional<COrxStringT<wchar_t>> FromUtf8(std::string_view text) {
  try {
    return conv::utf_to_utf<wchar_t>(text.data(), text.data() + text.size(), conv::stop);
  } catch (const conv::conversion_error&) {
    return std::nullopt;
  }
}

bool IsLetterOrDigit(wchar_t c) {
  const auto point = static_cast<char32_t>(c);
  if (IsIn(point, U'0', U'9') || IsIn(point, U'A', U'Z') || IsIn(point, U'a', U'z')) return true;
  if (point == 0xB2 || point == 0xB3 || point == 0xB9) return true;
  return IsIn(point, 0xC0, 0xFF) && point != 0xD7 && point != 0xF7;
}

bool EqualsIgnoringCase(std::wstring_view a, std::wstring_view b) {
  return std::equal(a.begin(), a.end(), b.begin(), b.end(),
                    [](wchar_t x, wchar_t y) { return ToLower(x) == ToLower(y); });
}

}  // namespace orx
