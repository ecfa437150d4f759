#pragma once

#include <cstdint>
#include <filesystem>
#include <optional>

#include "os_file.h"
#include "segment_writer.h"

/// Saving a tree to a registry file.
namespace orx {

class KeyTree;

/// What a tree knows of its file: where the next segment goes, and how.
struct FilePosition {
  os::FileStamp stamp;
  std::uint64_t end = 0;
  std::uint64_t superseded = 0;
  bool isNameDurable = false;  ///< false: who named the file may not have flushed its directory
  std::optional<FileGrowth> growth;  ///< nothing: to be had from the file
};

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
/// where that can be done, when more than half of it is superseded, when its index would end
/// because what is saved is more than new entries, and when it has none and this is the first save
/// since the tree was read.
AppendResult AppendUnsaved(const std::filesystem::path& name, KeyTree& tree);

}  // namespace orx
