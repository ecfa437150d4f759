#include "rtcm3/codec.h"

#include <cstddef>
#include <type_traits>
#include <variant>

#include "bits.h"
#include "field_range.h"
#include "rtcm3/fields.h"
#include "rtcm3/frame.h"

namespace orx::cs::velta::rtcm3 {
namespace {

constexpr unsigned kMessageNumberWidth = 12;
constexpr unsigned kCharacterWidth = 8;

/// The lower half of a set of bits, as they are sent: reserved bits for who numbers them in the
/// right order, announcements for who numbers them from the other end.
constexpr std::uint32_t LowerHalf(unsigned width) { return (1U << width / 2) - 1; }

/// The bits of a set in the opposite order.
std::uint32_t Mirrored(std::uint32_t bits, unsigned width) {
  std::uint32_t mirrored = 0;
  for (unsigned i = 0; i < width; ++i) mirrored |= (bits >> i & 1U) << (width - 1 - i);
  return mirrored;
}

class FieldReader {
 public:
  explicit FieldReader(BitReader& bits) : bits_(bits) {}

  template <class Member>
  void Number(const char*, unsigned width, Member& value) {
    if constexpr (std::is_signed_v<Member>) {
      value = static_cast<Member>(bits_.Signed(width));
    } else {
      value = static_cast<Member>(bits_.Unsigned(width));
    }
  }

  void BitSet(const char*, unsigned width, std::uint32_t& value) {
    const auto sent = static_cast<std::uint32_t>(bits_.Unsigned(width));
    const bool isFromTheOtherEnd = (sent & ~LowerHalf(width)) == 0;
    value = isFromTheOtherEnd ? sent : Mirrored(sent, width);
  }

  void Text(const char*, std::string& text, std::uint32_t& counter) {
    counter = static_cast<std::uint32_t>(bits_.Unsigned(kTextCounterWidth));
    text.resize(counter);
    for (char& c : text) c = static_cast<char>(bits_.Unsigned(kCharacterWidth));
  }

  template <class... Columns>
  void Points(unsigned width, Columns... columns) {
    VisitPoints(*this, width, columns...);
  }

 private:
  BitReader& bits_;
};

class FieldWriter {
 public:
  explicit FieldWriter(BitWriter& bits) : bits_(bits) {}

  template <class Member>
  void Number(const char* name, unsigned width, Member value) {
    using Integer = std::conditional_t<std::is_same_v<Member, bool>, int, Member>;
    const auto integer = static_cast<Integer>(value);
    const FieldRange range = FieldRange::Of<Member>(width);
    if (!Holds(range, integer)) {
      // What was negative before it got into an unsigned member is shown as it was.
      const auto shown = static_cast<std::make_signed_t<Integer>>(integer);
      throw RangeError(range, name, std::to_string(shown));
    }
    bits_.Write(static_cast<std::uint64_t>(value), width);
  }

  void BitSet(const char* name, unsigned width, std::uint32_t value) {
    const FieldRange range = FieldRange::Of<std::uint32_t>(width);
    if (!Holds(range, value)) throw RangeError(range, name, std::to_string(value));
    const bool hasReservedAlone = value != 0 && (value & LowerHalf(width)) == 0;
    if (hasReservedAlone) {
      throw FieldError(std::string(name) + " must not be " + std::to_string(value) +
                       ": its reserved bits alone would be read as announcements");
    }
    bits_.Write(Mirrored(value, width), width);
  }

  void Text(const char* name, const std::string& text, std::uint32_t) {
    if (text.size() > kMaxTextLength) throw TextError(name);
    bits_.Write(text.size(), kTextCounterWidth);
    for (const char c : text) bits_.Write(static_cast<unsigned char>(c), kCharacterWidth);
  }

  template <class... Columns>
  void Points(unsigned width, Columns... columns) {
    VisitPoints(*this, width, columns...);
  }

 private:
  BitWriter& bits_;
};

}  // namespace

Decoded Decode(std::string_view payload, Message& message) {
  constexpr std::size_t kByte = 8;
  BitReader bits({reinterpret_cast<const std::uint8_t*>(payload.data()), payload.size()});
  const std::uint64_t number = bits.Unsigned(kMessageNumberWidth);
  if (bits.Missing() > 0 || !Reset(message, number)) return Decoded::kOther;
  FieldReader reader(bits);
  std::visit([&reader](auto& record) { VisitFields(reader, record); }, message);
  const std::size_t missing = bits.Missing();
  if (missing == 0) return Decoded::kMessage;
  return missing < kByte && bits.LastIsCut() ? Decoded::kCutMessage : Decoded::kTooShort;
}

void Encode(const Message& message, std::string& out) {
  std::string payload;
  BitWriter bits(payload);
  bits.Write(NumberOf(message), kMessageNumberWidth);
  FieldWriter writer(bits);
  std::visit([&writer](const auto& record) { VisitFields(writer, record); }, message);
  bits.Pad();
  AppendFrame(payload, out);
}

}  // namespace orx::cs::velta::rtcm3
