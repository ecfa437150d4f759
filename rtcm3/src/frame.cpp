#include "rtcm3/frame.h"

#include <algorithm>
#include <boost/crc.hpp>
#include <boost/endian/conversion.hpp>
#include <cstring>
#include <stdexcept>

namespace orx::cs::velta::rtcm3 {
namespace {

constexpr std::uint8_t kPreamble = 0xD3;
constexpr std::uint8_t kReservedBits = 0xFC;
constexpr std::size_t kHeaderSize = 3;
constexpr std::size_t kCrcSize = 3;
constexpr std::size_t kBufferSize = std::size_t{64} * 1024;

/// CRC-24Q.
std::uint32_t Crc(const void* data, std::size_t size) {
  boost::crc_optimal<24, 0x864CFB, 0, 0, false, false> crc;
  crc.process_bytes(data, size);
  return static_cast<std::uint32_t>(crc.checksum());
}

}  // namespace

void AppendFrame(std::string_view payload, std::string& out) {
  if (payload.size() > kMaxPayload) throw std::length_error("a payload has at most 1023 bytes");
  const std::size_t start = out.size();
  out.push_back(static_cast<char>(kPreamble));
  out.push_back(static_cast<char>(payload.size() >> 8));
  out.push_back(static_cast<char>(payload.size() & 0xFF));
  out.append(payload);
  const std::uint32_t crc = Crc(out.data() + start, out.size() - start);
  for (const int shift : {16, 8, 0}) out.push_back(static_cast<char>(crc >> shift & 0xFF));
}

FrameReader::FrameReader(std::streambuf& in, FrameCounts& counts, std::function<void()> beforeRead)
    : in_(in),
      counts_(counts),
      beforeRead_(std::move(beforeRead)),
      buffer_(kBufferSize),
      bytesBefore_(counts.bytes) {}

FrameReader::~FrameReader() = default;

std::optional<std::string_view> FrameReader::Next() {
  while (SkipToPreamble()) {
    const std::size_t size = FrameSize();
    if (size == 0) {
      Skip(1);
      continue;
    }
    const std::uint8_t* frame = buffer_.data() + begin_;
    const std::size_t checked = size - kCrcSize;
    if (Crc(frame, checked) != boost::endian::load_big_u24(frame + checked)) {
      ++counts_.badCrcs;
      ++skippedCrcs_;
      Skip(1);
      continue;
    }
    EndSkipping();
    ++counts_.frames;
    frameAt_ = Place();
    begin_ += size;
    const char* const payload = reinterpret_cast<const char*>(frame) + kHeaderSize;
    return std::string_view(payload, checked - kHeaderSize);
  }
  EndSkipping();
  return std::nullopt;
}

void FrameReader::Remark(const std::string& what) { RemarkAt(frameAt_, what); }

void FrameReader::RemarkAt(std::uint64_t place, const std::string& what) {
  counts_.remarks.push_back("byte " + std::to_string(place) + ": " + what);
}

/// Remarks on what was skipped up to here.
void FrameReader::EndSkipping() {
  if (skipped_ == 0) return;
  std::string what = std::to_string(skipped_) + " bytes that are no frame";
  if (skippedCrcs_ > 0) what += ", " + std::to_string(skippedCrcs_) + " wrong checksums among them";
  if (endsInFrame_) what += "; the stream ends inside a frame";
  if (skipRemarks_++ < kMostRemarks) RemarkAt(skippedAt_, what);
  skipped_ = skippedCrcs_ = 0;
  endsInFrame_ = false;
}

/// Moves to the next byte that may begin a frame.
bool FrameReader::SkipToPreamble() {
  while (Require(1)) {
    const void* found = std::memchr(buffer_.data() + begin_, kPreamble, end_ - begin_);
    if (found == nullptr) {
      Skip(end_ - begin_);
      continue;
    }
    Skip(static_cast<std::size_t>(static_cast<const std::uint8_t*>(found) - buffer_.data()) -
         begin_);
    return true;
  }
  return false;
}

void FrameReader::Skip(std::size_t bytes) {
  if (skipped_ == 0) skippedAt_ = Place();
  skipped_ += bytes;
  begin_ += bytes;
  counts_.skippedBytes += bytes;
}

/// Size of the frame that begins here, 0 when none does or the stream ends inside it.
std::size_t FrameReader::FrameSize() {
  if (!Require(kHeaderSize)) {
    endsInFrame_ = true;
    return 0;
  }
  const std::uint8_t* header = buffer_.data() + begin_;
  if ((header[1] & kReservedBits) != 0) return 0;
  const std::size_t size = kHeaderSize + boost::endian::load_big_u16(header + 1) + kCrcSize;
  if (Require(size)) return size;
  endsInFrame_ = true;
  return 0;
}

/// Makes so many bytes available; false when the stream ends before.
bool FrameReader::Require(std::size_t bytes) {
  while (end_ - begin_ < bytes) {
    if (!Fill()) return false;
  }
  return true;
}

/// Takes what the stream has to give; false at its end.
bool FrameReader::Fill() {
  if (begin_ > 0) {
    std::memmove(buffer_.data(), buffer_.data() + begin_, end_ - begin_);
    end_ -= begin_;
    begin_ = 0;
  }
  if (beforeRead_) beforeRead_();
  if (in_.sgetc() == std::streambuf::traits_type::eof()) return false;
  const auto room = static_cast<std::streamsize>(buffer_.size() - end_);
  const std::streamsize wanted = std::clamp<std::streamsize>(in_.in_avail(), 1, room);
  const auto got =
      static_cast<std::size_t>(in_.sgetn(reinterpret_cast<char*>(buffer_.data() + end_), wanted));
  end_ += got;
  counts_.bytes += got;
  return got > 0;
}

}  // namespace orx::cs::velta::rtcm3
