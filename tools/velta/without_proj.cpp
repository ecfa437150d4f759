#include <CLI/App.hpp>
#include <stdexcept>

#include "command.h"
#include "geodesy/exports.h"
#include "versions.h"

/// What a build without PROJ has in the place of what needs it.
namespace velta_tool {
namespace {

[[noreturn]] void Refuse() {
  throw std::runtime_error("this needs PROJ, without which the program was built");
}

}  // namespace

const bool kHasProj = false;

std::string ProjVersions() { return "without PROJ"; }

std::string Wkt(const Definition&, std::size_t, const TellLeftOut&) { Refuse(); }

GridTiffs MakeGridTiffs(const Definition&, const TellLeftOut&) { Refuse(); }

void AddTransform(CLI::App& program, Action& action) {
  CLI::App* command = program.add_subcommand(
      "transform", "Not in this build, which has no PROJ: transforms positions on Linux.");
  command->allow_extras();
  command->footer(
      "\"velta export --format proj\" writes what PROJ's cct transforms positions by.\n"
      "\n"
      "Example:\n"
      "  velta ingest --datum-dir . --projection-dir . examples/streams/dhdn.rtcm3\n"
      "  velta export --format proj AUTO_DHDN_BESEL.dff AUTO_DHDN_BESEL.prj -o pipeline");
  command->callback([&action] { action = []() -> int { Refuse(); }; });
}

}  // namespace velta_tool
