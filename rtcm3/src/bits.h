#pragma once

#include <boost/endian/conversion.hpp>
#include <cstddef>
#include <cstdint>
#include <limits>
#include <span>
#include <string>

namespace orx::cs::velta::rtcm3 {

/// The widest field that the reader and the writer take, in bits.
inline constexpr unsigned kMaxFieldWidth = 57;

/// Reads big-endian bit fields, most significant bit first.
class BitReader {
 public:
  explicit BitReader(std::span<const std::uint8_t> bytes) : bytes_(bytes), end_(bytes.size() * 8) {}

  /// \return the field, zeros standing for bits behind the end
  std::uint64_t Unsigned(unsigned width) {
    last_ = position_;
    position_ += width;
    const auto offset = static_cast<unsigned>(last_ % 8);
    return Window(last_ / 8) << offset >> (64 - width);
  }

  /// As Unsigned, two's complement.
  std::int64_t Signed(unsigned width) {
    const auto top = static_cast<std::int64_t>(Unsigned(width) << (64 - width));
    return top >> (64 - width);
  }

  /// How many bits were read that are not there.
  std::size_t Missing() const { return position_ > end_ ? position_ - end_ : 0; }
  /// True when the field read last has its begin, but not its end.
  bool LastIsCut() const { return last_ < end_ && position_ > end_; }

 private:
  /// The 64 bits that begin at a byte; zeros stand for what lies behind the end.
  std::uint64_t Window(std::size_t byte) const {
    constexpr std::size_t kBytes = sizeof(std::uint64_t);
    if (byte + kBytes <= bytes_.size()) return boost::endian::load_big_u64(bytes_.data() + byte);
    std::uint64_t window = 0;
    for (std::size_t i = byte; i < byte + kBytes; ++i) {
      window = window << 8 | (i < bytes_.size() ? bytes_[i] : 0U);
    }
    return window;
  }

  std::span<const std::uint8_t> bytes_;
  std::size_t position_ = 0;
  std::size_t last_ = 0;  ///< where the field read last begins
  std::size_t end_;
};

/// Appends big-endian bit fields to a string of bytes.
class BitWriter {
 public:
  explicit BitWriter(std::string& bytes) : bytes_(bytes) {}

  /// Appends the low `width` bits of a value.
  void Write(std::uint64_t value, unsigned width) {
    pending_ =
        pending_ << width | (value & std::numeric_limits<std::uint64_t>::max() >> (64 - width));
    for (pendingBits_ += width; pendingBits_ >= 8; pendingBits_ -= 8) {
      bytes_.push_back(static_cast<char>(pending_ >> (pendingBits_ - 8)));
    }
  }

  /// Fills the last byte up with zero bits.
  void Pad() {
    if (pendingBits_ != 0) Write(0, 8 - pendingBits_);
  }

 private:
  std::string& bytes_;
  std::uint64_t pending_ = 0;
  unsigned pendingBits_ = 0;
};

}  // namespace orx::cs::velta::rtcm3
