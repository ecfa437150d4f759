#pragma once

#include <fstream>
#include <string>

#include "rtcm3/codec.h"
#include "rtcm3/frame.h"
#include "rtcm3/json_lines.h"

namespace velta_test {

/// What a file of seven lines has about a message, 1021 to 1027: worked_messages.jsonl its JSON,
/// worked_frames.hex the frame that an independent encoder made of this.
inline std::string Worked(unsigned message, const std::string& file = "worked_messages.jsonl") {
  std::ifstream lines(WORKED_MESSAGES "/" + file);
  std::string line;
  for (unsigned n = orx::cs::velta::rtcm3::kFirstMessage; n <= message; ++n)
    std::getline(lines, line);
  return line;
}

template <class Record>
Record WorkedRecord(unsigned message) {
  return std::get<Record>(orx::cs::velta::rtcm3::ParseJsonLine(Worked(message)));
}

inline std::string JsonOf(const orx::cs::velta::rtcm3::Message& message) {
  std::string line;
  orx::cs::velta::rtcm3::AppendJsonLine(message, line);
  line.pop_back();
  return line;
}

inline std::string FrameOf(const std::string& json) {
  std::string frame;
  orx::cs::velta::rtcm3::Encode(orx::cs::velta::rtcm3::ParseJsonLine(json), frame);
  return frame;
}

inline std::string PayloadOf(const std::string& frame) { return frame.substr(3, frame.size() - 6); }

inline std::string FromHex(const std::string& hex) {
  std::string bytes;
  for (std::size_t i = 0; i < hex.size(); i += 2) {
    bytes += static_cast<char>(std::stoi(hex.substr(i, 2), nullptr, 16));
  }
  return bytes;
}

/// A message's JSON with one field's value replaced, the value as it stands in the JSON.
inline std::string With(std::string json, const std::string& field, const std::string& value) {
  const std::string name = "\"" + field + "\": ";
  const std::size_t begin = json.find(name) + name.size();
  const std::size_t end = json.find_first_of(json[begin] == '[' ? "]" : ",}", begin);
  return json.replace(begin, end - begin + (json[begin] == '[' ? 1 : 0), value);
}

}  // namespace velta_test
