#pragma once

#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

namespace velta_test {

inline std::string ReadBytes(const std::filesystem::path& path) {
  std::ifstream file(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
}

inline void WriteBytes(const std::filesystem::path& path, const std::string& bytes) {
  std::ofstream(path, std::ios::binary | std::ios::trunc) << bytes;
}

/// Changes one byte of a file.
/// \param place 0: in its middle
inline void Damage(const std::filesystem::path& path, std::size_t place = 0) {
  std::string bytes = ReadBytes(path);
  bytes.at(place == 0 ? bytes.size() / 2 : place) ^= 1;
  WriteBytes(path, bytes);
}

}  // namespace velta_test
