#include "argument.h"
#include "completions.h"

namespace velta_manual {
namespace {

using velta_tool::Argument;
using velta_tool::Joined;
using Kind = Argument::Kind;

constexpr char kBegin[] = R"(# Completion of velta for bash.

_velta_words() {
  mapfile -t COMPREPLY < <(compgen -W "$*" -- "$word")
}

_velta_directories() {
  compopt -o filenames
  mapfile -t COMPREPLY < <(compgen -d -- "$word")
}

# Files with one of the extensions, or any, and the directories on the way.
_velta_files() {
  local extension
  _velta_directories
  for extension in "${@:-}"; do
    mapfile -t -O ${#COMPREPLY[@]} COMPREPLY < <(compgen -f -X "!*$extension" -- "$word")
  done
}

# _velta_argument OPTIONS COMMAND...: one of the options, or what the command completes.
_velta_argument() {
  local options=$1
  shift
  if [[ $word == -* ]]; then
    _velta_words "$options"
  else
    "$@"
  fi
}

_velta() {
  local word=${COMP_WORDS[COMP_CWORD]} before=${COMP_WORDS[COMP_CWORD - 1]}
  # Bash takes "--option=value" for three words.
  if [ "$word" = = ]; then
    word=
  elif [ "$before" = = ]; then
    before=${COMP_WORDS[COMP_CWORD - 2]}
  fi
  COMPREPLY=()
  if ((COMP_CWORD == 1)); then before=velta; fi
  case ${COMP_WORDS[1]}:$before in
)";

constexpr char kEnd[] = R"(  esac
}

complete -F _velta velta
)";

std::string Completing(const Argument& argument) {
  switch (argument.kind) {
    case Kind::kFile:
      return "_velta_files " + Joined(argument.extensions, " ");
    case Kind::kDirectory:
      return "_velta_directories";
    case Kind::kChoice:
      return "_velta_words " + Joined(argument.choices, " ");
    default:
      return ":";
  }
}

std::string Case(const std::string& pattern, const std::string& completing) {
  return "    " + pattern + ") " + completing + " ;;\n";
}

/// \param places what completes what is no option
std::string Arguments(const CLI::App& command, std::string places) {
  std::string options;
  for (const Argument& argument : velta_tool::ArgumentsOf(command)) {
    if (argument.isOption) options += (options.empty() ? "" : " ") + Joined(argument.names, " ");
    if (!argument.isOption) places = Completing(argument);
  }
  return "_velta_argument " + Quoted(options) + ' ' + places;
}

}  // namespace

std::string BashCompletion(const CLI::App& program) {
  std::string names;
  std::string cases;
  for (const CLI::App* const command : program.get_subcommands({})) {
    names += ' ' + command->get_name();
    const std::string begin = command->get_name() + ':';
    for (const Argument& argument : velta_tool::ArgumentsOf(*command)) {
      if (!argument.isOption || argument.kind == Kind::kFlag) continue;
      for (const std::string& name : argument.names) {
        cases += Case(begin + name, Completing(argument));
      }
    }
    cases += Case(begin + '*', Arguments(*command, ":"));
  }
  return kBegin + Case("*:velta", Arguments(program, "_velta_words" + names)) + cases + kEnd;
}

}  // namespace velta_manual
