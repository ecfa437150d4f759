#include "rtcm3/json_lines.h"

#include <array>
#include <charconv>
#include <nlohmann/json.hpp>
#include <optional>
#include <set>
#include <string>
#include <type_traits>
#include <variant>

#include "field_range.h"
#include "orxutils/orx_string.h"
#include "rtcm3/fields.h"

namespace orx::cs::velta::rtcm3 {
namespace {

using nlohmann::json;

class JsonWriter {
 public:
  explicit JsonWriter(std::string& out) : out_(out) {}

  template <class Member>
  void Number(const char* name, unsigned, Member value) {
    Name(name);
    Append(value);
  }

  void BitSet(const char* name, unsigned width, std::uint32_t value) { Number(name, width, value); }

  void Text(const char* name, const std::string& text, std::uint32_t) {
    Name(name);
    out_ += json(ToUtf8(Widen(text))).dump();
  }

  template <class... Columns>
  void Points(unsigned, Columns... columns) {
    (Array(columns), ...);
  }

 private:
  void Name(const char* name) {
    out_ += ", \"";
    out_ += name;
    out_ += "\": ";
  }

  /// A stream is mostly residuals: they are put together before they are appended.
  template <class Values>
  void Array(const Column<Values>& column) {
    Name(column.name);
    std::array<char, kMaxDigits * std::extent_v<std::remove_const_t<Values>>> text;
    char* end = text.data();
    for (const auto value : column.values) {
      *end = end == text.data() ? '[' : ' ';
      ++end;
      end = std::to_chars(end, text.data() + text.size(), value).ptr;
      *end++ = ',';
    }
    end[-1] = ']';
    out_.append(text.data(), end);
  }

  template <class Integer>
  void Append(Integer value) {
    std::array<char, kMaxDigits> digits;
    out_.append(digits.data(), std::to_chars(digits.begin(), digits.end(), value).ptr);
  }
  void Append(bool value) { out_ += value ? '1' : '0'; }

  /// Of a 64-bit integer, with its sign and what separates it from others.
  static constexpr std::size_t kMaxDigits = 24;

  std::string& out_;
};

/// The begin of a text that is not ours, for an error that names it.
std::string Excerpt(std::string text) {
  constexpr std::size_t kMost = 40;
  if (text.size() <= kMost) return text;
  const auto isInsideCharacter = [](char c) {
    return (static_cast<unsigned char>(c) & 0xC0U) == 0x80U;
  };
  std::size_t end = kMost;
  while (isInsideCharacter(text[end])) --end;
  return text.substr(0, end) + "...";
}

/// The integer that a JSON value holds, if it holds one of the range.
template <class Member>
Member Integer(const std::string& field, unsigned width, const json& value) {
  const FieldRange range = FieldRange::Of<Member>(width);
  const bool held = value.is_number_unsigned()  ? Holds(range, value.get<std::uint64_t>())
                    : value.is_number_integer() ? Holds(range, value.get<std::int64_t>())
                                                : false;
  if (!held) throw RangeError(range, field, Excerpt(value.dump()));
  return static_cast<Member>(value.get<std::int64_t>());
}

/// Takes the fields out of a JSON object, so that what is left belongs to no field.
class JsonReader {
 public:
  explicit JsonReader(json& object) : object_(object) {}

  template <class Member>
  void Number(const char* name, unsigned width, Member& value) {
    value = Integer<Member>(name, width, Take(name));
  }

  void BitSet(const char* name, unsigned width, std::uint32_t& value) {
    Number(name, width, value);
  }

  void Text(const char* name, std::string& text, std::uint32_t& counter) {
    const json value = Take(name);
    if (!value.is_string()) throw TextError(name);
    const std::optional<std::wstring> wide = FromUtf8(value.get_ref<const std::string&>());
    if (!wide || wide->size() > kMaxTextLength) throw TextError(name);
    for (const wchar_t c : *wide) {
      if (static_cast<char32_t>(c) > 0xFF) throw TextError(name);
    }
    text = Narrow(*wide);
    counter = static_cast<std::uint32_t>(text.size());
  }

  template <class... Columns>
  void Points(unsigned width, Columns... columns) {
    (Array(width, columns), ...);
  }

  /// \throws FieldError when something is left
  void Finish() const {
    if (!object_.empty())
      throw FieldError(Excerpt(object_.begin().key()) + " is no field of the message");
  }

  json Take(const char* name) {
    const auto found = object_.find(name);
    if (found == object_.end()) throw FieldError(std::string(name) + " is missing");
    json value = std::move(*found);
    object_.erase(found);
    return value;
  }

 private:
  template <class Values>
  void Array(unsigned width, const Column<Values>& column) {
    const json array = Take(column.name);
    const std::size_t size = std::size(column.values);
    if (!array.is_array() || array.size() != size) {
      throw FieldError(std::string(column.name) + " must be an array of " + std::to_string(size) +
                       " integers");
    }
    for (std::size_t i = 0; i < size; ++i) {
      const std::string element = std::string(column.name) + "[" + std::to_string(i) + "]";
      column.values[i] = Integer<std::remove_extent_t<Values>>(element, width, array[i]);
    }
  }

  json& object_;
};

/// Parses a line that holds an object of numbers, texts and arrays of numbers.
/// \throws FieldError for anything else, and for a name that comes twice
json ParseFlatObject(std::string_view line) {
  constexpr int kDepthOfFields = 1;
  std::set<std::string> names;
  const auto check = [&names](int depth, json::parse_event_t event, json& parsed) {
    const bool opens =
        event == json::parse_event_t::array_start || event == json::parse_event_t::object_start;
    if (opens && depth > kDepthOfFields) throw FieldError("a field has fields of its own");
    if (event != json::parse_event_t::key || depth > kDepthOfFields) return true;
    const auto& name = parsed.get_ref<const std::string&>();
    if (!names.insert(name).second) throw FieldError(Excerpt(name) + " comes twice");
    return true;
  };
  json object = json::parse(line, check, false);
  if (!object.is_object()) throw FieldError("not a JSON object");
  return object;
}

}  // namespace

void AppendJsonLine(const Message& message, std::string& out) {
  out += "{\"message\": " + std::to_string(NumberOf(message));
  JsonWriter writer(out);
  std::visit([&writer](const auto& record) { VisitFields(writer, record); }, message);
  out += "}\n";
}

Message ParseJsonLine(std::string_view line) {
  if (line.size() > kMaxJsonLine) {
    throw FieldError("longer than " + std::to_string(kMaxJsonLine) + " bytes");
  }
  json object = ParseFlatObject(line);
  JsonReader reader(object);
  Message message;
  const json number = reader.Take("message");
  if (!number.is_number_unsigned() || !Reset(message, number.get<std::uint64_t>())) {
    throw FieldError("message must be an integer from 1021 to 1027, not " + Excerpt(number.dump()));
  }
  std::visit([&reader](auto& record) { VisitFields(reader, record); }, message);
  reader.Finish();
  return message;
}

}  // namespace orx::cs::velta::rtcm3
