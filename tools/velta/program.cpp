#include "program.h"

#include <CLI/CLI.hpp>
#include <string>

#include "argument.h"
#include "terminal.h"
#include "versions.h"

namespace velta_tool {
namespace {

constexpr char kHelp[] =
    "Turns RTCM 3 coordinate-transformation messages (1021 to 1027) into datum files (.dff) and\n"
    "projection files (.prj), these files back into messages, and positions into coordinates of\n"
    "the local system.";

constexpr char kFooter[] =
    "\"velta COMMAND --help\" tells more about a command. As a FILE of messages or of JSON,\n"
    "\"-\" is standard input; as an output it is standard output.\n"
    "\n"
    "Exit status:\n"
    "  0  everything was done\n"
    "  1  something of it failed\n"
    "  2  the call was wrong\n"
    "\n"
    "The examples are typed beside a folder \"examples\": that of the source tree, or a copy of\n"
    "the package's, share/doc/velta/examples.\n"
    "\n"
    "Example: what is in a stream\n"
    "  velta decode examples/streams/dhdn.rtcm3";

/// The options of the help texts as everywhere else.
class Formatter : public CLI::Formatter {
 public:
  std::string make_option_opts(const CLI::Option* option) const override {
    const Argument argument = Describe(*option);
    std::string text;
    if (argument.isOption && !argument.value.empty()) text += ' ' + argument.value;
    if (!argument.isOption) text += Joined(argument.extensions, " or ");
    if (argument.isRepeated) text += " ...";
    if (!argument.remarks.empty()) text += " (" + Joined(argument.remarks, "; ") + ')';
    return text;
  }
};

}  // namespace

std::unique_ptr<CLI::App> MakeProgram(Action& action) {
  auto program = std::make_unique<CLI::App>(kHelp, "velta");
  program->formatter(std::make_shared<Formatter>());
  program->allow_windows_style_options(false);  // "/" begins a file name
  program->footer(kFooter);
  program->set_help_flag("-h,--help", "show this help");
  program->set_version_flag("--version", Versions, "show the version and those of the libraries");
  program->require_subcommand(1);
  for (const auto add : {AddIngest, AddList, AddGenerate, AddTransform, AddExport, AddMap, AddMerge,
                         AddDecode, AddEncode, AddDump}) {
    add(*program, action);
  }
  for (CLI::App* const command : program->get_subcommands([](CLI::App*) { return true; })) {
    command->add_flag_callback(
        "--quiet", BeQuiet, "tell failures only: no notes, no progress, nothing of what was done");
  }
  return program;
}

}  // namespace velta_tool
