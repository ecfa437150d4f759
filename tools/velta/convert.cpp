#include <CLI/App.hpp>
#include <CLI/Config.hpp>
#include <CLI/Formatter.hpp>
#include <cstdint>
#include <memory>
#include <string>

#include "angle.h"
#include "command.h"
#include "field_units.h"
#include "files.h"
#include "interrupt.h"
#include "lines.h"
#include "rtcm3/codec.h"
#include "rtcm3/json_lines.h"
#include "rtcm3/message_reader.h"
#include "stream_notes.h"
#include "terminal.h"

namespace velta_tool {
namespace rtcm3 = orx::cs::velta::rtcm3;
namespace {

struct Conversion {
  std::string from;
  std::string to = "-";
  bool units = false;
  bool dms = false;
};

int DecodeStream(const Conversion& files) {
  Input in(files.from);
  Output out(files.to, OutputKind::kText, {files.from});
  Progress progress(SizeTogether({files.from}));
  rtcm3::StreamCounts counts;
  StreamNotes notes(files.from, counts);
  rtcm3::MessageReader messages(in.buffer(), counts, [&] {
    out.Flush();
    notes.Tell();
    progress.Show(counts.frames.bytes);
  });
  const auto finish = [&] {
    // Also what an interrupted reader holds back.
    while (const rtcm3::Message* message = messages.Next()) {
      files.units ? AppendJsonLineInUnits(*message, files.dms, out.pending())
                  : rtcm3::AppendJsonLine(*message, out.pending());
      out.FlushIfLarge();
    }
    counts.frames.frames > 0 ? out.Finish() : out.Discard();
    ClearLine();
    notes.Tell();
    if (PassedOver(counts)) ReportNote(files.from + ": " + Summary(counts));
    if (counts.shortMessages > 0) {
      ReportFailure(files.from + ": " + std::to_string(counts.shortMessages) +
                    " messages end before their last field");
      return kFailed;
    }
    if (counts.frames.frames == 0) {
      ReportFailure(files.from + ": no RTCM 3 frame in it");
      return kFailed;
    }
    return kDone;
  };
  FinishWhenInterrupted(finish);
  return finish();
}

int EncodeLines(const Conversion& files) {
  Input in(files.from);
  Output out(files.to, OutputKind::kBinary, {files.from});
  Progress progress(SizeTogether({files.from}));
  std::uint64_t bytes = 0;
  int status = kDone;
  bool hasFrames = false;
  const auto finish = [&] {
    ClearLine();
    status == kDone || hasFrames ? out.Finish() : out.Discard();
    return status;
  };
  FinishWhenInterrupted(finish);
  std::string line;
  for (std::size_t number = 1; ReadLine(in.buffer(), line, rtcm3::kMaxJsonLine); ++number) {
    bytes += line.size() + 1;
    progress.Show(bytes);
    if (line.find_first_not_of(" \t\r") == std::string::npos) continue;
    try {
      rtcm3::Encode(rtcm3::ParseJsonLine(line), out.pending());
      hasFrames = true;
    } catch (const rtcm3::FieldError& error) {
      ReportFailure(files.from + ":" + std::to_string(number) + ": " + error.what());
      status = kFailed;
    }
    if (line.size() > rtcm3::kMaxJsonLine) SkipLine(in.buffer());
    const bool mayWait = in.buffer().in_avail() <= 0;
    mayWait ? out.Flush() : out.FlushIfLarge();
  }
  return finish();
}

std::shared_ptr<Conversion> AddConversion(CLI::App& command, Action& action,
                                          int (*work)(const Conversion&)) {
  auto files = std::make_shared<Conversion>();
  command.add_option("FILE", files->from, "the input, \"-\" for standard input")
      ->required()
      ->check(kFileName);
  command.add_option("-o,--output", files->to, "the output, \"-\" for standard output")
      ->check(kFileName)
      ->capture_default_str();
  command.callback([&action, files, work] { action = [files, work] { return work(*files); }; });
  return files;
}

}  // namespace

void AddDecode(CLI::App& program, Action& action) {
  CLI::App* command = program.add_subcommand(
      "decode", "Shows the messages 1021 to 1027 of an RTCM 3 stream as JSON, one object a line.");
  const auto files = AddConversion(*command, action, DecodeStream);
  auto* units = command->add_flag("--units", files->units,
                                  "show degrees, metres, arc-seconds and ppm, not integers");
  AddDms(*command, files->dms)->needs(units);
  command->footer(
      "Names are those of the records' members, numbers the integers of the messages, as \"velta\n"
      "encode\" takes them. What is no such message is passed over and counted. With --units\n"
      "numbers are in the units below; what is not named there is a code, a count or a day.\n" +
      FieldsByUnit() +
      "\n"
      "Examples:\n"
      "  velta decode examples/streams/dhdn.rtcm3\n"
      "  velta decode --units examples/streams/dhdn.rtcm3");
}

void AddEncode(CLI::App& program, Action& action) {
  CLI::App* command = program.add_subcommand(
      "encode", "Turns JSON lines, as \"velta decode\" writes them, into RTCM 3 frames.");
  AddConversion(*command, action, EncodeLines);
  command->footer(
      "Every field must be there, and nothing else. A line that cannot be encoded is reported\n"
      "and left out.\n"
      "\n"
      "Example: there and back again\n"
      "  velta encode examples/streams/dhdn.jsonl | velta decode -");
}

}  // namespace velta_tool
