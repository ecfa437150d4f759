#pragma once

#include <cstdint>
#include <string>

#include "orxutils/orx_string.h"

/// The names of entries: "S_" with the integers of a position, and "_T_" with those of the grid's
/// centre when there is a grid.
namespace orx::cs::velta {

inline COrxStringT<wchar_t> EntryName(std::int64_t north, std::int64_t east) {
  return L"S_" + std::to_wstring(north) + L"_" + std::to_wstring(east);
}

inline COrxStringT<wchar_t> WithGrid(const COrxStringT<wchar_t>& entryName, std::int64_t north,
                                     std::int64_t east) {
  return entryName + L"_T_" + std::to_wstring(north) + L"_" + std::to_wstring(east);
}

}  // namespace orx::cs::velta
