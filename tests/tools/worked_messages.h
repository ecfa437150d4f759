#pragma once

#include <fstream>
#include <stdexcept>
#include <string>
#include <vector>

#include "rtcm3/codec.h"
#include "rtcm3/frame.h"
#include "rtcm3/json_lines.h"
#include "rtcm3/message_reader.h"

namespace velta_test {

/// A message and the frame that an independent encoder made of it.
struct WorkedMessage {
  std::string json;  ///< without the line's end
  std::string frame;
};

/// The messages 1021 to 1027, in this order.
inline std::vector<WorkedMessage> WorkedMessages() {
  std::ifstream lines(WORKED_MESSAGES "/worked_messages.jsonl");
  std::ifstream frames(WORKED_MESSAGES "/worked_frames.hex");
  std::vector<WorkedMessage> all(velta_tool::rtcm3::kMessageTypes);
  for (WorkedMessage& message : all) {
    std::string hex;
    if (!std::getline(lines, message.json) || !std::getline(frames, hex)) {
      throw std::runtime_error("the worked messages are missing");
    }
    for (std::size_t i = 0; i < hex.size(); i += 2) {
      message.frame += static_cast<char>(std::stoi(hex.substr(i, 2), nullptr, 16));
    }
  }
  return all;
}

inline std::string FrameOf(const std::string& json) {
  std::string frame;
  velta_tool::rtcm3::Encode(velta_tool::rtcm3::ParseJsonLine(json), frame);
  return frame;
}

inline std::string JsonOf(const velta_tool::rtcm3::Message& message) {
  std::string line;
  velta_tool::rtcm3::AppendJsonLine(message, line);
  line.pop_back();
  return line;
}

/// A worked message with one field's value replaced, the value as it stands in the JSON.
inline std::string With(std::string json, const std::string& field, const std::string& value) {
  const std::string name = "\"" + field + "\": ";
  const std::size_t start = json.find(name);
  if (start == std::string::npos) throw std::runtime_error("no field " + field);
  const std::size_t begin = start + name.size();
  const std::size_t end = json.find_first_of(json[begin] == '[' ? "]" : ",}", begin);
  const std::size_t length = end - begin + (json[begin] == '[' ? 1 : 0);
  return json.replace(begin, length, value);
}

}  // namespace velta_test
