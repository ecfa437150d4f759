#pragma once

#include <cstdint>
#include <filesystem>
#include <functional>
#include <list>
#include <map>
#include <vector>

#include "file_format.h"
#include "orxregistry/in_file_key.h"
#include "os_file.h"
#include "record_format.h"

/// Reading a registry file as a whole.
namespace orx {

/// A file read into memory and what was found in it.
struct FileContent {
  /// An entry and its place in the file.
  struct Entry {
    record::KeyRecord key;
    std::uint64_t at;
  };

  /// \return the shape at a place; null when there is none
  const record::Bytes* ShapeAt(std::uint64_t at) const;

  RegistryError error = kRegistryOk;
  os::Memory memory;
  std::list<record::Buffer> moreMemory;  ///< what does not lie in `memory`
  format::FileHeader header;
  std::vector<record::Content> trees;  ///< what the root holds, but for the entries, in order
  std::vector<Entry> entries;          ///< sub-keys of the first key below the root, in order
  std::map<std::uint64_t, record::Bytes> shapes;  ///< by their places
  record::KeyRecord container;                    ///< the first key below the root, if there is one
  std::uint64_t start = 0;                        ///< where the first segment is
  format::Trailer trailer;                        ///< of the last whole segment
  std::uint64_t end = 0;                          ///< where the last whole segment ends
  std::uint64_t superseded = 0;                   ///< bytes of values that later segments replace
  os::FileStamp stamp;                            ///< of the file when it was read
};

/// Reads and checks a file. A last segment that is not whole is a save that never finished and is
/// left out; anything else that is wrong is damage, and the segments in front of it are given.
FileContent ReadRegistryFile(const std::filesystem::path& path);
/// The same of an open file.
FileContent ReadRegistryFile(const os::File& file);

/// Adds a shape that lies at a place in front of what is being read to the content.
/// \return false when there is none
using FindShape = std::function<bool(std::uint64_t at)>;

/// Takes a segment apart that lies in the content's memory.
/// \param at its place in the file
/// \param findShape called for a shape that the content does not have; empty: none is to be had
/// \return its size; 0 when it is not whole, and the content is as it was
std::size_t AddSegment(record::Bytes bytes, std::uint64_t at, FileContent& content,
                       const FindShape& findShape = {});

}  // namespace orx
