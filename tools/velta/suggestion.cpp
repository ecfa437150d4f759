#include "suggestion.h"

#include <algorithm>
#include <cstddef>
#include <numeric>

namespace velta_tool {
namespace {

char Lower(char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c; }

/// Characters to put in, take out or replace to make one word the other.
std::size_t Distance(std::string_view a, std::string_view b) {
  std::vector<std::size_t> row(b.size() + 1);
  std::iota(row.begin(), row.end(), std::size_t{0});
  for (std::size_t i = 0; i < a.size(); ++i) {
    std::size_t diagonal = row[0];
    row[0] = i + 1;
    for (std::size_t j = 0; j < b.size(); ++j) {
      const std::size_t replaced = diagonal + (Lower(a[i]) == b[j] ? 0 : 1);
      diagonal = row[j + 1];
      row[j + 1] = std::min({replaced, diagonal + 1, row[j] + 1});
    }
  }
  return row.back();
}

}  // namespace

std::string NearestWord(std::string_view typed, const std::vector<std::string>& words) {
  constexpr std::size_t kFar = 3;
  std::string nearest;
  std::size_t least = kFar;
  for (const std::string& word : words) {
    const std::size_t distance = Distance(typed, word);
    if (distance < least) {
      least = distance;
      nearest = word;
    }
  }
  return nearest;
}

}  // namespace velta_tool
