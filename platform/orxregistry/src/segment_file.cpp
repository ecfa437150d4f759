#include "segment_file.h"

#include <algorithm>
#include <cstring>
#include <string_view>
#include <utility>

#include "key_tree.h"
#include "orxutils/file_error.h"
#include "orxutils/file_funcs.h"

#define XXH_INLINE_ALL
#include <xxhash.h>

namespace orx {
namespace {

using record::Buffer;
using record::Bytes;

// File header: magic, registry version, bytes of the description, the description, checksum.
constexpr unsigned char kMagic[8] = {0x89, 'O', 'R', 'X', '\r', '\n', 0x1A, '\n'};
constexpr std::size_t kVersionAt = sizeof kMagic;
constexpr std::size_t kDescriptionSizeAt = kVersionAt + sizeof(std::uint32_t);
constexpr std::size_t kDescriptionAt = kDescriptionSizeAt + sizeof(std::uint32_t);
constexpr std::size_t kMaxDescription = 4096;
constexpr std::size_t kChecksum = sizeof(std::uint64_t);
constexpr std::size_t kMaxFileHeader = kDescriptionAt + kMaxDescription + kChecksum;
/// A file of at most so many bytes is read in one piece, before it is known what it is.
constexpr std::uint64_t kReadUnasked = 1U << 16U;

// Segment header: mark, zero, size of the tree, superseded bytes, checksum of the tree, checksum of
// the header itself, for which its place in the file is the seed.
constexpr std::uint32_t kSegmentMark = 0x31474553;  // "SEG1"
constexpr std::size_t kTreeSizeAt = 8;
constexpr std::size_t kSupersededAt = 16;
constexpr std::size_t kTreeChecksumAt = 24;
constexpr std::size_t kHeaderChecksumAt = 32;
constexpr std::size_t kSegmentHeader = 40;

std::uint64_t Checksum(const unsigned char* bytes, std::size_t size, std::uint64_t seed = 0) {
  return XXH3_64bits_withSeed(bytes, size, seed);
}

struct SegmentHeader {
  std::uint64_t treeSize;
  std::uint64_t superseded;
  std::uint64_t treeChecksum;
};

/// Size of the file's header, or 0 when the bytes do not begin with one.
std::size_t CheckFileHeader(Bytes bytes) {
  if (bytes.size() < kDescriptionAt + kChecksum) return 0;
  if (std::memcmp(bytes.data(), kMagic, sizeof kMagic) != 0) return 0;
  if (record::Load<std::uint32_t>(bytes.data() + kVersionAt) != kRegistryVersion) return 0;
  const auto description = record::Load<std::uint32_t>(bytes.data() + kDescriptionSizeAt);
  if (description > kMaxDescription || description % sizeof(char16_t) != 0) return 0;
  const std::size_t checked = kDescriptionAt + description;
  if (bytes.size() < checked + kChecksum) return 0;
  const auto stored = record::Load<std::uint64_t>(bytes.data() + checked);
  return stored == Checksum(bytes.data(), checked) ? checked + kChecksum : 0;
}

std::u16string DescriptionOf(Bytes bytes) {
  const auto size = record::Load<std::uint32_t>(bytes.data() + kDescriptionSizeAt);
  std::u16string description(size / sizeof(char16_t), u'\0');
  std::memcpy(description.data(), bytes.data() + kDescriptionAt, size);
  return description;
}

Buffer MakeFileHeader(const std::u16string& description) {
  const std::size_t size = std::min(description.size() * sizeof(char16_t), kMaxDescription);
  Buffer header;
  header.reserve(kDescriptionAt + size + kChecksum);
  header.insert(header.end(), kMagic, kMagic + sizeof kMagic);
  record::Append(header, std::uint32_t{kRegistryVersion});
  record::Append(header, static_cast<std::uint32_t>(size));
  const auto* const text = reinterpret_cast<const unsigned char*>(description.data());
  header.insert(header.end(), text, text + size);
  record::Append(header, Checksum(header.data(), header.size()));
  return header;
}

bool IsSegmentHeader(Bytes bytes, std::size_t at) {
  if (bytes.size() - at < kSegmentHeader) return false;
  const unsigned char* const header = bytes.data() + at;
  return record::Load<std::uint32_t>(header) == kSegmentMark &&
         record::Load<std::uint64_t>(header + kHeaderChecksumAt) ==
             Checksum(header, kHeaderChecksumAt, at);
}

SegmentHeader SegmentHeaderAt(const unsigned char* header) {
  return {record::Load<std::uint64_t>(header + kTreeSizeAt),
          record::Load<std::uint64_t>(header + kSupersededAt),
          record::Load<std::uint64_t>(header + kTreeChecksumAt)};
}

/// Fills in a segment's header, for which there is room in front of its tree.
/// \param start where in `bytes` the header is; the tree is all that comes behind it
/// \param at where in the file the segment will be
void FinishSegment(Buffer& bytes, std::size_t start, std::uint64_t at, std::uint64_t superseded) {
  unsigned char* const header = bytes.data() + start;
  const unsigned char* const tree = header + kSegmentHeader;
  const std::uint64_t treeSize = bytes.size() - start - kSegmentHeader;
  record::Store(header, kSegmentMark);
  record::Store(header + kTreeSizeAt, treeSize);
  record::Store(header + kSupersededAt, superseded);
  record::Store(header + kTreeChecksumAt, Checksum(tree, treeSize));
  record::Store(header + kHeaderChecksumAt, Checksum(header, kHeaderChecksumAt, at));
}

/// Tells damage from a save that never finished: behind damage there is another segment.
bool HasSegmentBehind(Bytes bytes, std::size_t at) {
  const std::string_view text(reinterpret_cast<const char*>(bytes.data()), bytes.size());
  const std::string_view mark(reinterpret_cast<const char*>(&kSegmentMark), sizeof kSegmentMark);
  for (at = text.find(mark, at + 1); at != text.npos; at = text.find(mark, at + 1)) {
    if (IsSegmentHeader(bytes, at)) return true;
  }
  return false;
}

/// Finds the segments of a file that is in memory.
void FindSegments(Bytes bytes, FileContent& content) {
  std::size_t at = CheckFileHeader(bytes);
  if (at == 0) {
    content.error = kNotARegistryFile;
    return;
  }
  content.description = DescriptionOf(bytes);
  content.end = at;
  while (at < bytes.size()) {
    if (!IsSegmentHeader(bytes, at)) break;
    const SegmentHeader header = SegmentHeaderAt(bytes.data() + at);
    const std::size_t treeAt = at + kSegmentHeader;
    if (header.treeSize > bytes.size() - treeAt) break;
    if (Checksum(bytes.data() + treeAt, header.treeSize) != header.treeChecksum) break;
    content.segments.push_back(bytes.substr(treeAt, header.treeSize));
    content.superseded = header.superseded;
    at = treeAt + header.treeSize;
    content.end = at;
  }
  // A file gets its name only with its first segment in it, so one without was cut off later.
  const bool damaged =
      content.segments.empty() || (at < bytes.size() && HasSegmentBehind(bytes, at));
  if (damaged) content.error = kDamaged;
}

/// Reads an open file from its start, as it is just now.
FileContent ReadOnce(const os::File& file) {
  FileContent content;
  const std::optional<os::FileStamp> stamp = file.Stamp();
  if (!stamp) {
    content.error = kCannotBeOpened;
    return content;
  }
  content.stamp = *stamp;
  if (stamp->size > kReadUnasked) {
    // No more is read of what is no registry file, however large.
    unsigned char header[kMaxFileHeader];
    const auto headerSize = file.Read(0, header, sizeof header);
    if (!headerSize || CheckFileHeader(Bytes(header, *headerSize)) == 0) {
      content.error = headerSize ? kNotARegistryFile : kCannotBeOpened;
      return content;
    }
  }
  content.memory = os::Memory(stamp->size);
  const auto size = file.Read(0, content.memory.get(), stamp->size);
  if (!size) {
    content.error = kCannotBeOpened;
    return content;
  }
  FindSegments(Bytes(content.memory.get(), *size), content);
  return content;
}

/// Reads an open file from its start.
FileContent ReadContent(const os::File& file) {
  for (;;) {
    FileContent content = ReadOnce(file);
    // What looks like damage can be a save that others cut off and wrote over meanwhile.
    if (content.error != kDamaged || file.Stamp() == content.stamp) return content;
  }
}

/// The content of a file and one more tree, written anew without what is superseded.
std::optional<Buffer> Compact(FileContent content, Bytes added) {
  content.segments.push_back(added);
  KeyTree merged(std::move(content));
  return MakeRegistryFile(merged);
}

/// Brings the position up to what is in the locked file.
/// \return kFailed when the file is not one to append to
AppendResult CatchUp(const os::File& file, FilePosition& position) {
  const std::optional<os::FileStamp> stamp = file.Stamp();
  if (!stamp) return AppendResult::kFailed;
  if (*stamp == position.stamp) return AppendResult::kAppended;
  const FileContent content = ReadContent(file);
  if (content.error != kRegistryOk) return AppendResult::kFailed;
  position = {content.stamp, content.end, content.superseded, false};
  return AppendResult::kBehindOthers;
}

}  // namespace

FileContent ReadRegistryFile(const std::filesystem::path& path) {
  const std::optional<os::File> file = os::File::OpenToRead(path);
  if (file) return ReadContent(*file);
  FileContent content;
  content.error = kCannotBeOpened;
  return content;
}

std::optional<Buffer> MakeRegistryFile(KeyTree& tree) {
  std::optional<Buffer> file = MakeFileHeader(tree.description);
  const std::size_t start = file->size();
  file->resize(start + kSegmentHeader);
  tree.WriteAll(*file);
  if (tree.error != kRegistryOk) return std::nullopt;
  FinishSegment(*file, start, start, 0);
  return file;
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

AppendResult AppendUnsaved(const std::filesystem::path& name, KeyTree& tree) {
  const std::filesystem::path path = os::WithoutLinks(name);
  std::optional<os::File> file = os::File::OpenLocked(path);
  if (!file) return AppendResult::kFailed;
  FilePosition at = tree.position;
  const AppendResult result = CatchUp(*file, at);
  if (result == AppendResult::kFailed || !tree.HasUnsaved()) return result;

  Buffer segment(kSegmentHeader);
  tree.WriteUnsaved(segment);
  at.superseded += tree.superseded();
  if (at.superseded > (at.end + segment.size()) / 2) {
    const Bytes unsaved(segment.data() + kSegmentHeader, segment.size() - kSegmentHeader);
    const std::optional<Buffer> whole = Compact(ReadContent(*file), unsaved);
    if (!whole) return AppendResult::kFailed;
    if (const auto stamp = PublishFile(path, *whole, &*file)) {
      tree.position = {*stamp, whole->size(), 0, true};
      return result;
    }
    // An append needs less room, and fewer rights. But the new file may have the name already.
    const std::optional<os::FileStamp> named = os::StampOf(path);
    if (!named || !named->IsSameFile(at.stamp)) return AppendResult::kFailed;
    ForgetFileError();
  }
  FinishSegment(segment, 0, at.end, at.superseded);
  // A name that may not be durable yet would take with it what is promised below.
  at.isNameDurable = at.isNameDurable || FileFuncs::flushName(path);
  if (!at.isNameDurable) {
    KeepFileError();
    return AppendResult::kFailed;
  }
  const bool cutOff = at.stamp.size == at.end || file->Truncate(at.end);
  const bool written =
      cutOff && file->Write(at.end, segment.data(), segment.size()) && file->Flush();
  if (!written) {
    file->Truncate(at.end);
    return AppendResult::kFailed;
  }
  at.end += segment.size();
  at.stamp = file->Stamp().value_or(os::FileStamp());
  tree.position = at;
  return result;
}

}  // namespace orx
