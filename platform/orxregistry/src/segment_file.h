#pragma once

#include <cstdint>
#include <filesystem>
#include <optional>
#include <string>
#include <vector>

#include "orxregistry/in_file_key.h"
#include "os_file.h"
#include "record_format.h"

/// A registry file as bytes: a header and a sequence of checked segments, each holding the record
/// of one key tree's root. See docs/gff-format.md.
namespace orx {

class KeyTree;

/// A file read into memory and what was found in it.
struct FileContent {
  RegistryError error = kRegistryOk;
  os::Memory memory;
  std::u16string description;
  std::vector<record::Bytes> segments;  ///< the key trees in order, in `memory`
  std::uint64_t end = 0;                ///< where the last whole segment ends
  std::uint64_t superseded = 0;         ///< bytes of values that later segments replace
  os::FileStamp stamp;                  ///< of the file when it was read
};

/// Reads and checks a file. A last segment that is not whole is a save that never finished and is
/// left out; anything else that is wrong is damage, and the segments in front of it are given.
FileContent ReadRegistryFile(const std::filesystem::path& path);

/// The bytes of a whole file that holds all of a tree in one segment.
/// \return nothing when the tree turns out to be damaged
std::optional<record::Buffer> MakeRegistryFile(KeyTree& tree);

/// Writes a file beside its place, makes it durable and gives it its name.
/// \param replaced the file whose place it takes and whose owner and mode it gets, locked; null:
///     fails when there is a file of that name
/// \return the stamp of the file; nothing when it did not come to be
std::optional<os::FileStamp> PublishFile(const std::filesystem::path& path,
                                         const record::Buffer& bytes, const os::File* replaced);

/// What a tree knows of its file: where the next segment goes.
struct FilePosition {
  os::FileStamp stamp;
  std::uint64_t end = 0;
  std::uint64_t superseded = 0;
  bool isNameDurable = false;  ///< false: who named the file may not have flushed its directory
};

/// How an append ended.
enum class AppendResult {
  kFailed,       ///< nothing durable was lost; whether the new part is in the file is open
  kAppended,     ///< durable; the tree's position is that of the new end
  kBehindOthers  ///< durable, behind segments that somebody else appended since that position
};

/// Appends what is not saved of a tree to its file durably, or writes the file afresh when more
/// than half of it is superseded and that can be done.
AppendResult AppendUnsaved(const std::filesystem::path& name, KeyTree& tree);

}  // namespace orx
