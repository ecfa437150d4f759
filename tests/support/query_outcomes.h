#pragma once

#include <sstream>
#include <string>
#include <vector>

#include "velta/rtcm_generator.h"

namespace velta_test {

/// Where a query looks.
struct Position {
  double north;
  double east;
};

/// A file of the same content that is read as a whole: behind its last save there is one that never
/// finished.
inline std::string WithoutIndex(const std::string& bytes) { return bytes + '\0'; }

/// What each query of a file answers, a line each: what tells one entry from another, or "none".
inline std::string Outcomes(const std::wstring& path, const std::vector<Position>& positions) {
  const orx::cs::velta::RTCMGenerator generator(1, path, path);
  std::string outcomes;
  const auto add = [&](const auto& message, const auto& describe) {
    outcomes += message ? describe(*message) : "none";
    outcomes += '\n';
  };
  const auto grid = [](const auto& message) { return std::to_string(message.residualH[0]); };
  for (const auto& [north, east] : positions) {
    add(generator.getRtcmDatumMessage(north, east, 0), [](const auto& message) {
      return std::to_string(message.messageType) + " " + std::to_string(message.dX) + " " +
             std::to_string(message.phiV) + " " + message.targetName;
    });
    add(generator.get1023(north, east, 0), grid);
    add(generator.get1024(north, east, 0), grid);
  }
  add(generator.getRtcmProjMessage(),
      [](const auto& message) { return std::to_string(message.messageType); });
  return outcomes;
}

/// True when each line of a text is that of one of two others of as many lines.
inline bool IsEachOfEither(const std::string& text, const std::string& one,
                           const std::string& other) {
  std::istringstream lines(text);
  std::istringstream ones(one);
  std::istringstream others(other);
  std::string line;
  std::string inOne;
  std::string inOther;
  while (std::getline(lines, line)) {
    if (!std::getline(ones, inOne) || !std::getline(others, inOther)) return false;
    if (line != inOne && line != inOther) return false;
  }
  return true;
}

}  // namespace velta_test
