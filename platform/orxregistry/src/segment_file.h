#pragma once

#include <cstdint>
#include <filesystem>
#include <functional>
#include <list>
#include <map>
#include <optional>
#include <vector>

#include "file_format.h"
#include "orxregistry/in_file_key.h"
#include "os_file.h"
#include "record_format.h"
#include "segment_writer.h"

/// A registry file as a whole: read, written anew, appended to.
namespace orx {

class KeyTree;

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
/// \param findShape called for a shape that the content does not have
/// \return its size; 0 when it is not whole, and the content is as it was
std::size_t AddSegment(record::Bytes bytes, std::uint64_t at, FileContent& content,
                       const FindShape& findShape);

/// What a tree knows of its file: where the next segment goes, and how.
struct FilePosition {
  os::FileStamp stamp;
  std::uint64_t end = 0;
  std::uint64_t superseded = 0;
  bool isNameDurable = false;  ///< false: who named the file may not have flushed its directory
  std::optional<FileGrowth> growth;  ///< nothing: to be had from the file
};

/// Writes a file beside its place, makes it durable and gives it its name.
/// \param replaced the file whose place it takes and whose owner and mode it gets, locked; null:
///     fails when there is a file of that name
/// \return the stamp of the file; nothing when it did not come to be
std::optional<os::FileStamp> PublishFile(const std::filesystem::path& path,
                                         const record::Buffer& bytes, const os::File* replaced);

/// Writes all of a tree to a new file.
/// \return where its next segment goes; nothing when it did not come to be
std::optional<FilePosition> SaveNewFile(const std::filesystem::path& path, KeyTree& tree);

/// How an append ended.
enum class AppendResult {
  kFailed,       ///< nothing durable was lost; whether the new part is in the file is open
  kAppended,     ///< durable; the tree's position is that of the new end
  kBehindOthers  ///< durable, behind segments that somebody else appended since that position
};

/// Appends what is not saved of a tree to its file durably. The file is written afresh instead,
/// where that can be done, when more than half of it is superseded, when it would lose its index
/// because what is saved is more than new entries, and when it has lost it and is saved to for the
/// first time.
AppendResult AppendUnsaved(const std::filesystem::path& name, KeyTree& tree);

}  // namespace orx
