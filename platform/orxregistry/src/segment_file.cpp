#include "segment_file.h"

#include <algorithm>
#include <cstring>
#include <string_view>
#include <utility>

#include "key_tree.h"

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
/// A file of so many bytes is read in one piece, whatever it is.
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

/// \param at where in the file the segment will be
void AppendSegmentTo(Buffer& to, std::uint64_t at, const Buffer& tree, std::uint64_t superseded) {
  const std::size_t start = to.size();
  record::Append(to, kSegmentMark);
  record::Append(to, std::uint32_t{0});
  record::Append(to, std::uint64_t{tree.size()});
  record::Append(to, superseded);
  record::Append(to, Checksum(tree.data(), tree.size()));
  record::Append(to, Checksum(to.data() + start, kHeaderChecksumAt, at));
  to.insert(to.end(), tree.begin(), tree.end());
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

/// Reads an open file from its start.
FileContent ReadContent(const os::File& file) {
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

/// The content of a file and one more segment, written anew without what is superseded.
std::optional<Buffer> Compact(FileContent content, const Buffer& added) {
  content.segments.emplace_back(added.data(), added.size());
  const std::u16string description = content.description;
  const auto merged = std::make_shared<KeyTree>(std::move(content));
  const Buffer tree = merged->WriteAll();
  if (merged->error != kRegistryOk) return std::nullopt;
  return MakeRegistryFile(description, tree);
}

/// Brings the position up to what is in the locked file.
/// \return kFailed when the file is not one to append to
AppendResult CatchUp(const os::File& file, FilePosition& position) {
  const std::optional<os::FileStamp> stamp = file.Stamp();
  if (!stamp) return AppendResult::kFailed;
  if (*stamp == position.stamp) return AppendResult::kAppended;
  const FileContent content = ReadContent(file);
  if (content.error != kRegistryOk) return AppendResult::kFailed;
  position = {content.stamp, content.end, content.superseded};
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

Buffer MakeRegistryFile(const std::u16string& description, const Buffer& tree) {
  Buffer bytes = MakeFileHeader(description);
  bytes.reserve(bytes.size() + kSegmentHeader + tree.size());
  AppendSegmentTo(bytes, bytes.size(), tree, 0);
  return bytes;
}

std::optional<os::FileStamp> PublishFile(const std::filesystem::path& path, const Buffer& bytes,
                                         bool replace) {
  std::filesystem::path beside = path;
  beside += ".new";
  std::optional<os::File> file = os::File::OpenLocked(beside, true);
  if (!file) return std::nullopt;
  std::optional<os::FileStamp> stamp;
  if (file->Truncate(0) && file->Write(0, bytes.data(), bytes.size()) && file->Flush()) {
    // Taken while nobody else can have the file: under its new name others may append to it.
    stamp = file->Stamp();
  }
  if (stamp && os::Rename(beside, path, replace)) return stamp;
  os::Remove(beside);
  return std::nullopt;
}

AppendResult AppendSegment(const std::filesystem::path& path, FilePosition& position,
                           const Buffer& tree, std::uint64_t superseded) {
  std::optional<os::File> file = os::File::OpenLocked(path, false);
  if (!file) return AppendResult::kFailed;
  FilePosition at = position;
  const AppendResult result = CatchUp(*file, at);
  if (result == AppendResult::kFailed || tree.empty()) return result;

  at.superseded += superseded;
  Buffer segment;
  segment.reserve(kSegmentHeader + tree.size());
  AppendSegmentTo(segment, at.end, tree, at.superseded);
  if (at.superseded > (at.end + segment.size()) / 2) {
    const std::optional<Buffer> whole = Compact(ReadContent(*file), tree);
    const auto stamp = whole ? PublishFile(path, *whole, true) : std::nullopt;
    if (!stamp) return AppendResult::kFailed;
    position = {*stamp, whole->size(), 0};
    return result;
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
  position = at;
  return result;
}

}  // namespace orx
