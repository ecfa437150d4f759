#include "argument.h"
#include "completions.h"

namespace velta_manual {
namespace {

using velta_tool::Argument;
using velta_tool::Joined;
using Kind = Argument::Kind;

constexpr char kBegin[] = R"(# Completion of velta for fish.

# Files with one of the extensions, and the directories on the way.
function __velta_files
    set -l ends (string escape --style=regex -- $argv | string join '|')
    __fish_complete_path (commandline -ct) | string match -r -- "^.*(?:$ends|/)(?:\t.*)?\$"
end

complete -c velta -f
)";

std::string Completing(const Argument& argument) {
  switch (argument.kind) {
    case Kind::kFile:
      return argument.extensions.empty()
                 ? " -r -F"
                 : " -x -a '(__velta_files " + Joined(argument.extensions, " ") + ")'";
    case Kind::kDirectory:
      return " -x -a '(__fish_complete_directories)'";
    case Kind::kChoice:
      return " -x -a " + Quoted(Joined(argument.choices, " "));
    case Kind::kOther:
      return " -x";
    default:
      return "";
  }
}

std::string Arguments(const CLI::App& command, const std::string& begin) {
  std::string lines;
  for (const Argument& argument : velta_tool::ArgumentsOf(command)) {
    lines += begin;
    for (const std::string& name : argument.names) {
      if (!argument.isOption) continue;
      lines += name.starts_with("--") ? " -l " + name.substr(2) : " -s " + name.substr(1);
    }
    lines += Completing(argument) + " -d " + Quoted(argument.text) + '\n';
  }
  return lines;
}

constexpr char kAsCommand[] = "complete -c velta -n __fish_use_subcommand";

std::string Command(const CLI::App& command) {
  const std::string& name = command.get_name();
  return kAsCommand + (" -a " + name) + " -d " + Quoted(command.get_description()) + '\n' +
         Arguments(command, "complete -c velta -n '__fish_seen_subcommand_from " + name + '\'');
}

}  // namespace

std::string FishCompletion(const CLI::App& program) {
  std::string lines = kBegin + Arguments(program, kAsCommand);
  for (const CLI::App* const command : program.get_subcommands({})) lines += Command(*command);
  return lines;
}

}  // namespace velta_manual
