#include "segment_file.h"

#include <algorithm>
#include <unordered_set>
#include <utility>

#include "key_tree.h"
#include "orxutils/file_error.h"
#include "orxutils/file_funcs.h"

namespace orx {
namespace {

using format::PieceKind;
using record::Buffer;
using record::Bytes;

/// A file of at most so many bytes is read in one piece, before it is known what it is.
constexpr std::uint64_t kReadUnasked = 1U << 16U;

/// Takes a piece of a segment over.
/// \return false when the piece is not right
bool TakePiece(const format::Piece& piece, FileContent& content, const FindShape& findShape) {
  switch (piece.kind) {
    case PieceKind::kTree: {
      const std::optional<record::Content> tree = record::SplitContent(piece.content);
      if (!tree) return false;
      record::Part keys = tree->keys();
      if (!content.container) content.container = record::TakeKey(keys);
      content.trees.push_back(*tree);
      return true;
    }
    case PieceKind::kShape:
      content.shapes.emplace_hint(content.shapes.end(), piece.at, piece.content);
      return true;
    case PieceKind::kEntry: {
      const std::optional<format::Entry> entry = format::ReadEntry(piece.content);
      if (!entry || entry->shapeAt >= piece.at || !content.container) return false;
      const Bytes* shape = content.ShapeAt(entry->shapeAt);
      if (!shape && findShape(entry->shapeAt)) shape = content.ShapeAt(entry->shapeAt);
      const auto key = shape ? format::MakeEntry(*entry, piece.at, *shape) : record::KeyRecord();
      if (!key) return false;
      content.entries.push_back({key, piece.at});
      return true;
    }
    case PieceKind::kNode:
      return true;
    case PieceKind::kTrailer:
      content.trailer = format::ReadTrailer(piece.content);
      return true;
  }
  return false;
}

/// Tells damage from a save that never finished: behind damage there is another segment.
bool HasSegmentBehind(Bytes bytes, std::size_t at) {
  for (at = format::FindSegmentMark(bytes, at + 1); at < bytes.size();
       at = format::FindSegmentMark(bytes, at + 1)) {
    if (format::ReadSegmentHeader(bytes.substr(at), at)) return true;
  }
  return false;
}

/// In a file that is read as a whole, all shapes are in its content.
bool FindNoShape(std::uint64_t /*at*/) { return false; }

/// Finds what is in a file that is in memory.
void FindSegments(Bytes bytes, FileContent& content) {
  Bytes rest = bytes;
  std::optional<format::FileHeader> header = format::TakeFileHeader(rest);
  if (!header) {
    content.error = kNotARegistryFile;
    return;
  }
  content.header = *std::move(header);
  content.start = bytes.size() - rest.size();
  content.end = content.start;
  while (const std::size_t size =
             AddSegment(bytes.substr(content.end), content.end, content, &FindNoShape)) {
    content.end += size;
  }
  // A file gets its name only with its first segment in it, so one without was cut off later.
  const bool damaged = content.end == content.start ||
                       (content.end < bytes.size() && HasSegmentBehind(bytes, content.end));
  if (damaged) content.error = kDamaged;
}

/// Of a file that cannot be read now. Without a stamp it counts as changed, so that it is read
/// again.
FileContent CannotBeOpened() {
  FileContent content;
  content.error = kCannotBeOpened;
  return content;
}

/// Reads an open file from its start, as it is just now.
FileContent ReadOnce(const os::File& file) {
  const std::optional<os::FileStamp> stamp = file.Stamp();
  if (!stamp) return CannotBeOpened();
  FileContent content;
  content.stamp = *stamp;
  if (stamp->size > kReadUnasked) {
    // No more is read of what is no registry file, however large.
    unsigned char header[format::kMaxFileHeader];
    const auto headerSize = file.Read(0, header, sizeof header);
    if (!headerSize) return CannotBeOpened();
    Bytes start(header, *headerSize);
    if (!format::TakeFileHeader(start)) {
      content.error = kNotARegistryFile;
      return content;
    }
  }
  content.memory = os::Memory(stamp->size);
  const auto size = file.Read(0, content.memory.get(), stamp->size);
  if (!size) return CannotBeOpened();
  FindSegments(Bytes(content.memory.get(), *size), content);
  return content;
}

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
std::optional<NewFile> Compact(FileContent content, Buffer segment) {
  const Buffer& added = content.moreMemory.emplace_back(std::move(segment));
  if (AddSegment({added.data(), added.size()}, content.end, content, &FindNoShape) == 0) {
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
  if (*stamp == position.stamp && position.end == tree.content().end) {
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

/// Writes a segment behind the end of a file, and makes it durable.
bool Append(os::File& file, std::uint64_t end, const Buffer& segment) {
  std::size_t done = 0;
  if (segment.size() > format::kCheckedWithItsTrailer) {
    done = segment.size() - format::kTrailer;
    if (!file.Write(end, segment.data(), done) || !file.Flush()) return false;
  }
  return file.Write(end + done, segment.data() + done, segment.size() - done) && file.Flush();
}

}  // namespace

const Bytes* FileContent::ShapeAt(std::uint64_t at) const {
  const auto found = shapes.find(at);
  return found == shapes.end() ? nullptr : &found->second;
}

std::size_t AddSegment(Bytes bytes, std::uint64_t at, FileContent& content,
                       const FindShape& findShape) {
  const std::size_t trees = content.trees.size();
  const std::size_t entries = content.entries.size();
  const record::KeyRecord container = content.container;
  const format::Trailer trailer = content.trailer;
  format::SegmentHeader header;
  const std::size_t size = format::TakeSegment(bytes, at, header, [&](const format::Piece& piece) {
    return TakePiece(piece, content, findShape);
  });
  if (size == 0 || content.trailer.segmentAt != at) {
    content.container = container;
    content.trailer = trailer;
    content.trees.resize(trees);
    content.entries.resize(entries);
    content.shapes.erase(content.shapes.lower_bound(at), content.shapes.end());
    return 0;
  }
  content.superseded = header.superseded;
  return size;
}

FileContent ReadRegistryFile(const os::File& file) {
  for (;;) {
    FileContent content = ReadOnce(file);
    // What looks like damage can be a save that others cut off and wrote over meanwhile.
    if (content.error != kDamaged || file.Stamp() == content.stamp) return content;
  }
}

FileContent ReadRegistryFile(const std::filesystem::path& path) {
  const std::optional<os::File> file = os::File::OpenToRead(path);
  return file ? ReadRegistryFile(*file) : CannotBeOpened();
}

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
  std::optional<FileGrowth> growth;
  growth.swap(tree.position.growth);
  FilePosition at = tree.position;
  at.growth.swap(growth);
  const bool isFirst = !at.growth;
  std::optional<FileContent> others;
  const AppendResult result = CatchUp(*file, tree, at, others);
  if (result == AppendResult::kFailed) return result;
  if (!tree.HasUnsaved()) {
    if (result == AppendResult::kAppended) tree.position = std::move(at);
    return result;
  }
  // What others have put in the place of the file may have its entries in another key, or in none.
  const KeyTree::Key* const container = others ? tree.FindContainer(*others) : tree.Container();
  const bool addsOnly =
      container && tree.AddsEntriesOnly(*container) &&
      !(others && (!others->container || HoldsAnyOf(*others, tree.UnsavedIn(*container))));
  const bool losesIndex = at.growth->HasAreas() && (at.growth->HasIndex() ? !addsOnly : isFirst);
  Buffer segment;
  SegmentWriter writer(*at.growth, segment, at.end);
  if (!addsOnly) tree.WriteUnsavedTree(writer, container);
  if (container) tree.WriteUnsavedEntries(writer, *container);
  at.superseded += tree.superseded();
  writer.Finish(at.superseded, addsOnly);
  if (losesIndex || at.superseded > (at.end + segment.size()) / 2) {
    std::optional<NewFile> whole = Compact(ReadRegistryFile(*file), segment);
    if (!whole) return AppendResult::kFailed;
    if (const auto stamp = PublishFile(path, whole->bytes, &*file)) {
      tree.position = {*stamp, whole->bytes.size(), 0, true, std::move(whole->growth)};
      return result;
    }
    // An append needs less room, and fewer rights. But the new file may have the name already.
    const std::optional<os::FileStamp> named = os::StampOf(path);
    if (!named || !named->IsSameFile(at.stamp)) return AppendResult::kFailed;
    ForgetFileError();
  }
  // A name that may not be durable yet would take with it what is promised below.
  at.isNameDurable = at.isNameDurable || FileFuncs::flushName(path);
  if (!at.isNameDurable) {
    KeepFileError();
    return AppendResult::kFailed;
  }
  const bool cutOff = at.stamp.size == at.end || file->Truncate(at.end);
  if (!cutOff || !Append(*file, at.end, segment)) {
    file->Truncate(at.end);
    return AppendResult::kFailed;
  }
  at.end += segment.size();
  at.stamp = file->Stamp().value_or(os::FileStamp());
  tree.position = std::move(at);
  return result;
}

}  // namespace orx
