#include "file_save.h"

#include <algorithm>
#include <unordered_set>
#include <utility>

#include "file_format.h"
#include "key_tree.h"
#include "orxutils/file_error.h"
#include "orxutils/file_funcs.h"
#include "segment_file.h"

namespace orx {
namespace {

using record::Buffer;

/// A whole file that holds all of a tree in one segment.
struct NewFile {
  Buffer bytes;
  FileGrowth growth;
};

/// \return nothing when the tree turns out to be damaged
std::optional<NewFile> MakeFile(KeyTree& tree) {
  Buffer bytes;
  format::AppendFileHeader(bytes, tree.header());
  const std::uint64_t start = bytes.size();
  NewFile file{std::move(bytes), FileGrowth(tree.header(), start)};
  SegmentWriter writer(file.growth, file.bytes, start);
  tree.WriteAll(writer);
  if (tree.error != kRegistryOk) return std::nullopt;
  writer.Finish(0, true);
  return file;
}

/// The content of a file and one more segment, written anew without what is superseded.
std::optional<NewFile> Compact(FileContent content, const Buffer& segment) {
  if (AddSegment({segment.data(), segment.size()}, content.end, content) == 0) {
    return std::nullopt;
  }
  KeyTree merged(std::move(content));
  return MakeFile(merged);
}

/// Brings the position of a tree up to what is in its locked file.
/// \param others receives what the file holds when it was read because it has changed
/// \return kFailed when the file is not one to append to
AppendResult CatchUp(const os::File& file, KeyTree& tree, FilePosition& position,
                     std::optional<FileContent>& others) {
  const std::optional<os::FileStamp> stamp = file.Stamp();
  if (!stamp) return AppendResult::kFailed;
  if (*stamp == position.stamp && position.growth) return AppendResult::kAppended;
  if (*stamp == tree.content().stamp) {
    position.growth.emplace(tree.content());
    return AppendResult::kAppended;
  }
  others = ReadRegistryFile(file);
  if (others->error != kRegistryOk) return AppendResult::kFailed;
  position = {others->stamp, others->end, others->superseded, false, FileGrowth(*others)};
  return AppendResult::kBehindOthers;
}

/// True when a file holds one of the entries that a tree is about to add.
bool HoldsAnyOf(const FileContent& content, const std::vector<const KeyTree::Key*>& added) {
  struct Hash {
    std::size_t operator()(const record::Name& name) const { return record::HashOf(name); }
  };
  std::unordered_set<record::Name, Hash> names;
  for (const KeyTree::Key* const entry : added) names.insert(entry->name());
  return std::any_of(content.entries.begin(), content.entries.end(), [&](const auto& entry) {
    return names.find(entry.key.name()) != names.end();
  });
}

/// The segment with what is not saved of a tree.
/// \param others what others have put into the file
/// \param at where it goes; it is told what that supersedes, and grows as by the segment
Buffer MakeSegment(KeyTree& tree, const std::optional<FileContent>& others, FilePosition& at) {
  // A file in the place of another may have its entries in another key, or in none.
  const KeyTree::Key* const container = others ? tree.FindContainer(*others) : tree.Container();
  bool addsOnly = container && tree.AddsEntriesOnly(*container);
  if (addsOnly && others) addsOnly = !HoldsAnyOf(*others, tree.UnsavedIn(*container));
  Buffer segment;
  SegmentWriter writer(*at.growth, segment, at.end);
  if (!addsOnly) tree.WriteUnsavedTree(writer, container);
  if (container) tree.WriteUnsavedEntries(writer, *container);
  at.superseded += tree.superseded();
  writer.Finish(at.superseded, addsOnly);
  return segment;
}

/// Writes a segment behind the end of a file and makes it durable.
bool WriteSegment(os::File& file, std::uint64_t end, const Buffer& segment) {
  std::size_t done = 0;
  if (segment.size() > format::kCheckedWithItsTrailer) {
    done = segment.size() - format::kTrailer;
    if (!file.Write(end, segment.data(), done) || !file.Flush()) return false;
  }
  return file.Write(end + done, segment.data() + done, segment.size() - done) && file.Flush();
}

/// Appends a segment.
/// \param at the file's end, and what it is then
/// \return false when that failed; the file is what it was if it could be cut back
bool Append(os::File& file, const std::filesystem::path& path, const Buffer& segment,
            FilePosition& at) {
  // A name that may not be durable yet would take with it what is promised below.
  at.isNameDurable = at.isNameDurable || FileFuncs::flushName(path);
  if (!at.isNameDurable) {
    KeepFileError();
    return false;
  }
  const bool cutOff = at.stamp.size == at.end || file.Truncate(at.end);
  if (!cutOff || !WriteSegment(file, at.end, segment)) {
    file.Truncate(at.end);
    return false;
  }
  at.end += segment.size();
  at.stamp = file.Stamp().value_or(os::FileStamp());
  return true;
}

/// Writes a file beside its place, makes it durable and gives it its name.
/// \param replaced the file whose place it takes and whose owner and mode it gets, locked; null:
///     fails when there is a file of that name
/// \return the stamp of the file; nothing when it did not come to be
std::optional<os::FileStamp> PublishFile(const std::filesystem::path& path, const Buffer& bytes,
                                         const os::File* replaced) {
  // Something that is no left-over may have the name; then the next is tried.
  std::filesystem::path beside;
  std::optional<os::File> file;
  for (const char* const ending : {".new", ".new1", ".new2", ".new3"}) {
    beside = path;
    beside += ending;
    if (std::optional<os::File> made = os::File::CreateLocked(beside)) {
      file.emplace(*std::move(made));
      break;
    }
  }
  if (!file) return std::nullopt;
  std::optional<os::FileStamp> stamp;
  if ((!replaced || file->TakeAccessOf(*replaced)) && file->Write(0, bytes.data(), bytes.size()) &&
      file->Flush()) {
    // Before it gets its name: from then on others may append to it.
    stamp = file->Stamp();
  }
  if (stamp && os::Rename(beside, path, replaced != nullptr)) return stamp;
  const auto isNamed = [own = file->Stamp()](const std::filesystem::path& name) {
    const std::optional<os::FileStamp> named = os::StampOf(name);
    return own && named && named->IsSameFile(*own);
  };
  // Once it has its name, the file beside it may be somebody else's.
  if (isNamed(beside)) os::Remove(beside);
  // A new file whose name did not become durable goes, as what it holds must not pass for saved.
  if (!replaced && isNamed(path)) os::Remove(path);
  return std::nullopt;
}

}  // namespace

std::optional<FilePosition> SaveNewFile(const std::filesystem::path& path, KeyTree& tree) {
  std::optional<NewFile> file = MakeFile(tree);
  const auto stamp = file ? PublishFile(path, file->bytes, nullptr) : std::nullopt;
  if (!stamp) return std::nullopt;
  return FilePosition{*stamp, file->bytes.size(), 0, true, std::move(file->growth)};
}

AppendResult AppendUnsaved(const std::filesystem::path& name, KeyTree& tree) {
  const std::filesystem::path path = os::WithoutLinks(name);
  std::optional<os::File> file = os::File::OpenLocked(path);
  if (!file) return AppendResult::kFailed;
  // Unless all goes well, what the file grows from is had from it again.
  FilePosition at = std::move(tree.position);
  tree.position.growth.reset();
  const bool isFirst = !at.growth;
  std::optional<FileContent> others;
  const AppendResult result = CatchUp(*file, tree, at, others);
  if (result == AppendResult::kFailed) return result;
  if (!tree.HasUnsaved()) {
    if (result == AppendResult::kAppended) tree.position = std::move(at);
    return result;
  }
  const bool hadIndex = at.growth->HasIndex();
  const Buffer segment = MakeSegment(tree, others, at);
  const bool lacksIndex = at.growth->HasAreas() && !at.growth->HasIndex();
  const bool isMostlySuperseded = at.superseded > (at.end + segment.size()) / 2;
  if (isMostlySuperseded || (lacksIndex && (hadIndex || isFirst))) {
    // What is damaged inside is not written anew.
    const std::optional<NewFile> whole =
        Compact(others ? *std::move(others) : ReadRegistryFile(*file), segment);
    if (!whole && isMostlySuperseded) return AppendResult::kFailed;
    const auto stamp = whole ? PublishFile(path, whole->bytes, &*file) : std::nullopt;
    if (stamp) {
      tree.position = {*stamp, whole->bytes.size(), 0, true, whole->growth};
      return result;
    }
    // An append needs less room, and fewer rights. But the new file may have the name already.
    const std::optional<os::FileStamp> named = os::StampOf(path);
    if (!named || !named->IsSameFile(at.stamp)) return AppendResult::kFailed;
    ForgetFileError();
  }
  if (!Append(*file, path, segment, at)) return AppendResult::kFailed;
  tree.position = std::move(at);
  return result;
}

}  // namespace orx
