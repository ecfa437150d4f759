#include "argument.h"
#include "completions.h"

namespace velta_manual {
namespace {

using velta_tool::Argument;
using velta_tool::Joined;
using Kind = Argument::Kind;

constexpr char kBegin[] = R"(#compdef velta

local context state state_descr line
typeset -A opt_args
local -a commands=(
)";

/// With the separators of _arguments as text.
std::string Escaped(const std::string& text) {
  std::string escaped;
  for (const char c : text) {
    if (c == ':' || c == '[' || c == ']' || c == '\\') escaped += '\\';
    escaped += c;
  }
  return escaped;
}

std::string Completing(const Argument& argument) {
  const std::string value =
      ':' + Escaped(argument.isOption ? argument.value : argument.names[0]) + ':';
  switch (argument.kind) {
    case Kind::kFlag:
      return "";
    case Kind::kFile: {
      std::string patterns;
      for (const std::string& extension : argument.extensions) patterns += " *" + extension;
      return value + "_files" + (patterns.empty() ? "" : " -g \"" + patterns.substr(1) + '"');
    }
    case Kind::kDirectory:
      return value + "_files -/";
    case Kind::kChoice:
      return value + '(' + Joined(argument.choices, " ") + ')';
    default:
      return value + ' ';
  }
}

/// What completes an argument, each part followed by a blank; an option has one by each name.
std::string LineFor(const Argument& argument) {
  if (!argument.isOption)
    return Quoted((argument.isRepeated ? "*" : "") + Completing(argument)) + ' ';
  std::string line;
  for (const std::string& name : argument.names) {
    const char* const follows = argument.kind == Kind::kFlag ? "" : name.size() == 2 ? "+" : "=";
    line += Quoted('(' + Joined(argument.names, " ") + ')' + name + follows + '[' +
                   Escaped(argument.text) + ']' + Completing(argument)) +
            ' ';
  }
  return line;
}

std::string Arguments(const CLI::App& command) {
  std::string lines;
  for (const Argument& argument : velta_tool::ArgumentsOf(command)) {
    lines += LineFor(argument);
  }
  return lines;
}

}  // namespace

std::string ZshCompletion(const CLI::App& program) {
  std::string commands;
  std::string cases;
  for (const CLI::App* const command : program.get_subcommands({})) {
    const std::string& name = command->get_name();
    commands += "  " + Quoted(name + ':' + command->get_description()) + '\n';
    cases += "      " + name + ") _arguments " + Arguments(*command) + ";;\n";
  }
  return kBegin + commands + ")\n_arguments " + Arguments(program) +
         "'1: :->command' '*:: :->argument'\n"
         "case $state in\n"
         "  command) _describe command commands ;;\n"
         "  argument)\n"
         "    case $words[1] in\n" +
         cases + "    esac ;;\nesac\n";
}

}  // namespace velta_manual
