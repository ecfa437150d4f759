#include "rtcm3/codec.h"

#include <cstddef>
#include <type_traits>
#include <variant>

#include "rtcm3/bits.h"
#include "rtcm3/fields.h"
#include "rtcm3/frame.h"

namespace velta_tool::rtcm3 {
namespace {

constexpr unsigned kMessageNumberWidth = 12;
constexpr unsigned kCharacterWidth = 8;

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
    const FieldRange range = FieldRange::Of<Member>(width);
    const auto wide =
        static_cast<std::conditional_t<std::is_same_v<Member, bool>, int, Member>>(value);
    if (!range.Holds(wide)) throw range.Error(name, std::to_string(wide));
    bits_.Write(static_cast<std::uint64_t>(value), width);
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

Decoded Decode(std::span<const std::uint8_t> payload, Message& message) {
  BitReader bits(payload);
  if (!Reset(message, bits.Unsigned(kMessageNumberWidth))) return Decoded::kOther;
  FieldReader reader(bits);
  std::visit([&reader](auto& record) { VisitFields(reader, record); }, message);
  return bits.Overrun() ? Decoded::kTooShort : Decoded::kMessage;
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

}  // namespace velta_tool::rtcm3
