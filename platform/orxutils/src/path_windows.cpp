#include <windows.h>

#include "orxutils/path.h"

namespace orx {
namespace {

/// The longest name that Windows takes for a directory without the `\\?\` form.
constexpr std::size_t kMaxPlainName = 247;

}  // namespace

std::optional<std::filesystem::path> ToPath(const COrxStringT<wchar_t>& name) {
  return ToSystemPath(name);
}

std::filesystem::path ToSystemPath(const std::filesystem::path& path) {
  const COrxStringT<wchar_t> name = AbsoluteName(path.wstring());
  if (name.size() <= kMaxPlainName || name.starts_with(L"\\\\?\\")) return path;
  return name.starts_with(L"\\\\") ? L"\\\\?\\UNC" + name.substr(1) : L"\\\\?\\" + name;
}

COrxStringT<wchar_t> AbsoluteName(const COrxStringT<wchar_t>& name) {
  // The standard library's own does not know the names of network shares.
  const DWORD size = GetFullPathNameW(name.c_str(), 0, nullptr, nullptr);
  COrxStringT<wchar_t> whole(size, L'\0');
  const DWORD length = GetFullPathNameW(name.c_str(), size, whole.data(), nullptr);
  if (length == 0 || length >= size) return name;
  whole.resize(length);
  return whole;
}

COrxStringT<wchar_t> ToName(const std::filesystem::path& path) { return path.wstring(); }

bool NameOrder::operator()(std::wstring_view a, std::wstring_view b) const {
  return CompareStringOrdinal(a.data(), static_cast<int>(a.size()), b.data(),
                              static_cast<int>(b.size()), TRUE) == CSTR_LESS_THAN;
}

}  // namespace orx
