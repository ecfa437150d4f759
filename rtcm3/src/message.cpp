#include "rtcm3/message.h"

#include <cstring>
#include <stdexcept>
#include <string_view>
#include <utility>

#include "rtcm3/fields.h"
#include "velta/projection_data.h"

namespace orx::cs::velta::rtcm3 {
namespace {

/// A message's type is its number less this.
constexpr unsigned kTypeBase = 1000;

template <std::size_t Index>
void Emplace(Message& message) {
  message.emplace<Index>().messageType = kFirstMessage + Index - kTypeBase;
}

template <std::size_t... Index>
void EmplaceAt(Message& message, std::size_t index, std::index_sequence<Index...>) {
  ((Index == index ? Emplace<Index>(message) : void()), ...);
}

/// The values of a message's fields as bytes, one field behind the other.
class FieldBytes {
 public:
  explicit FieldBytes(const Message& message) {
    std::visit([this](const auto& record) { VisitFields(*this, record); }, message);
  }

  template <class Member>
  void Number(const char* name, unsigned, Member value) {
    Append(value);
    End(name);
  }
  void BitSet(const char* name, unsigned width, std::uint32_t value) { Number(name, width, value); }
  void Text(const char* name, const std::string& text, std::uint32_t) {
    bytes_ += text;
    End(name);
  }
  template <class... Columns>
  void Points(unsigned, Columns... columns) {
    (AppendColumn(columns), ...);
  }

  std::size_t size() const { return fields_.size(); }
  const char* Name(std::size_t field) const { return fields_[field].name; }
  std::string_view Bytes(std::size_t field) const {
    const std::size_t begin = field == 0 ? 0 : fields_[field - 1].end;
    return std::string_view(bytes_).substr(begin, fields_[field].end - begin);
  }

 private:
  struct Field {
    const char* name;
    std::size_t end;
  };

  template <class Member>
  void Append(Member value) {
    char bytes[sizeof value];
    std::memcpy(bytes, &value, sizeof value);
    bytes_.append(bytes, sizeof bytes);
  }
  template <class Values>
  void AppendColumn(const Column<Values>& column) {
    for (const auto value : column.values) Append(value);
    End(column.name);
  }
  void End(const char* name) { fields_.push_back({name, bytes_.size()}); }

  std::string bytes_;
  std::vector<Field> fields_;
};

/// \throws std::invalid_argument when the record is not what its type says
template <class Record>
const Record& As(const RtcmMessage& record) {
  const auto* const found = dynamic_cast<const Record*>(&record);
  if (!found)
    throw std::invalid_argument("a record is not of its type " +
                                std::to_string(record.messageType));
  return *found;
}

}  // namespace

bool Reset(Message& message, std::uint64_t number) {
  if (number < kFirstMessage || number >= kFirstMessage + kMessageTypes) return false;
  const auto index = static_cast<std::size_t>(number - kFirstMessage);
  EmplaceAt(message, index, std::make_index_sequence<kMessageTypes>());
  return true;
}

Message FromRecord(const RtcmMessage& record) {
  switch (record.messageType + kTypeBase) {
    case 1021: {
      Rtcm1021 message;
      static_cast<RtcmBasicTransformMessage&>(message) = As<RtcmBasicTransformMessage>(record);
      return message;
    }
    case 1022:
      return As<Rtcm1022>(record);
    case 1023:
      return As<Rtcm1023>(record);
    case 1024:
      return As<Rtcm1024>(record);
    case 1025:
      return As<Rtcm1025>(record);
    case 1027:
      return As<Rtcm1027>(record);
    default:
      throw std::invalid_argument("no message of type " + std::to_string(record.messageType));
  }
}

std::uint32_t SystemIdOf(const Message& message) {
  return std::visit([](const auto& record) { return record.systemId; }, message);
}

std::vector<std::string> DifferingFields(const Message& a, const Message& b) {
  if (a.index() != b.index()) return {"message"};
  const FieldBytes ofA(a);
  const FieldBytes ofB(b);
  std::vector<std::string> names;
  for (std::size_t i = 0; i < ofA.size(); ++i) {
    if (ofA.Bytes(i) != ofB.Bytes(i)) names.emplace_back(ofA.Name(i));
  }
  return names;
}

bool HasUnlikelyScale(const Message& message) {
  if (const auto* const projection = std::get_if<Rtcm1025>(&message)) {
    return projection->addSNO == 0 && HasScaleFactor(projection->projectionType);
  }
  const auto* const oblique = std::get_if<Rtcm1027>(&message);
  return oblique && oblique->addSIL == 0;
}

}  // namespace orx::cs::velta::rtcm3
