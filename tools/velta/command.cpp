#include "command.h"

#include <cstdint>
#include <cstdio>
#include <iostream>

#include "terminal.h"

namespace velta_tool {

void ReportFailure(std::string_view what) {
  ClearLine();
  std::cerr << WithoutControls("velta: " + std::string(what) + '\n');
}

void ReportNote(std::string_view what) {
  if (!IsQuiet()) ReportFailure("note: " + std::string(what));
}

std::string CodeText(orx::cs::velta::ResultCode code) {
  char text[sizeof "0x00000000"];
  std::snprintf(text, sizeof text, "0x%08x", static_cast<unsigned>(code));
  return text;
}

std::string Meaning(orx::cs::velta::ResultCode code) {
  for (const auto& [known, meaning] : orx::cs::velta::kResultMeanings) {
    if (known == code) return CodeText(code) + " " + meaning;
  }
  return CodeText(code) + " a code of RTCMGridHost or of the system";
}

}  // namespace velta_tool
