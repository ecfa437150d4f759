#include <CLI/App.hpp>
#include <CLI/Config.hpp>
#include <CLI/Formatter.hpp>
#include <memory>
#include <stdexcept>
#include <string>
#include <variant>

#include "command.h"
#include "description.h"
#include "files.h"
#include "rtcm3/message.h"
#include "velta/rtcm_generator.h"

namespace velta_tool {
namespace rtcm3 = orx::cs::velta::rtcm3;
namespace {

using orx::cs::velta::DatumData;
using orx::cs::velta::RTCMGenerator;

struct Options {
  std::string file;
  bool json = false;
};

void Print(const Description& description, bool json, Output& out) {
  out.pending() += json ? ToJson(description).dump() + '\n' : ToText(description);
  out.FlushMuch();
}

int ListDatums(const Options& options) {
  const auto datums = RTCMGenerator(0, ToWide(options.file), L"").getAllDatums();
  if (datums.empty()) throw std::runtime_error(options.file + ": no complete datum entry in it");
  Output out;
  for (const DatumData& datum : datums) {
    if (!options.json && &datum != &datums.front()) out.pending() += '\n';
    Print(Describe(datum), options.json, out);
  }
  out.Flush();
  return kDone;
}

int ListProjection(const Options& options) {
  const auto record = RTCMGenerator(0, L"", ToWide(options.file)).getRtcmProjMessage();
  if (!record) throw std::runtime_error(options.file + ": no usable projection in it");
  const rtcm3::Message message = rtcm3::FromRecord(*record);
  const auto* oblique = std::get_if<orx::cs::velta::Rtcm1027>(&message);
  Output out;
  Print(oblique ? Describe(*oblique) : Describe(std::get<orx::cs::velta::Rtcm1025>(message)),
        options.json, out);
  out.Flush();
  return kDone;
}

int Run(const Options& options) {
  RequireFile(options.file);
  const bool isDamaged = ReportErrorState(options.file);
  const int status =
      KindOf(options.file) == FileKind::kDatum ? ListDatums(options) : ListProjection(options);
  return isDamaged ? kFailed : status;
}

}  // namespace

void AddList(CLI::App& program, Action& action) {
  const auto options = std::make_shared<Options>();
  CLI::App* command = program.add_subcommand(
      "list", "Lists the entries of a datum file, or the projection of a projection file.");
  command->add_option("FILE", options->file, "the file")->required()->check(kDatumOrProjectionFile);
  command->add_flag("--json", options->json, "print JSON, one object a line");
  command->footer(
      "Angles are in degrees, rotations and residuals of angles in arc-seconds, scale corrections\n"
      "in ppm, lengths in metres. Of a projection file the first entry is shown.\n"
      "\n"
      "Example:\n"
      "  velta ingest --dir out examples/streams/dhdn.rtcm3\n"
      "  velta list out/datums/rtcmdata/AUTO_DHDN_BESEL.dff");
  command->callback([&action, options] { action = [options] { return Run(*options); }; });
}

}  // namespace velta_tool
