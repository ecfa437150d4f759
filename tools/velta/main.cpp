#include <CLI/CLI.hpp>
#include <algorithm>
#include <cstdio>
#include <exception>
#include <iostream>
#include <memory>
#include <sstream>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

#include "command.h"
#include "files.h"
#include "orxregistry/in_file_key.h"
#include "orxutils/file_funcs.h"
#include "orxutils/orx_string.h"
#include "program.h"
#include "suggestion.h"
#include "terminal.h"

namespace {

using namespace velta_tool;

/// \throws WrongCall when the first word of the command line is no command
void RequireCommand(const CLI::App& program, const std::string& word) {
  std::vector<std::string> commands = {"--help", "--version"};
  if (word == "-h" || word == commands[0] || word == commands[1]) return;
  for (const CLI::App* const command : program.get_subcommands({})) {
    if (command->get_name() == word) return;
    commands.push_back(command->get_name());
  }
  const std::string nearest = NearestWord(word, commands);
  throw WrongCall("there is no command \"" + word + "\"" +
                  (nearest.empty() ? "" : "; is \"velta " + nearest + "\" meant?") +
                  "\n\"velta --help\" tells the commands");
}

int Run(std::vector<std::string> arguments) {
  Action action;
  const std::unique_ptr<CLI::App> program = MakeProgram(action);
  if (arguments.size() > 1) RequireCommand(*program, arguments[1]);
  orx::OnAwaitedLock([](const std::wstring& file) {
    ReportNote(orx::ToUtf8(file) + ": waits for another program that holds its lock");
  });
  try {
    // Takes them from the last to the first, without the program's name.
    std::reverse(arguments.begin(), arguments.end());
    if (!arguments.empty()) arguments.pop_back();
    program->parse(std::move(arguments));
  } catch (const CLI::ParseError& error) {
    std::ostringstream out;
    std::ostringstream err;
    const int status = program->exit(error, out, err);
    if (!(std::cout << out.str() << std::flush)) {
      throw std::runtime_error("standard output: cannot be written");
    }
    std::cerr << WithoutControls(err.str());  // names of files among it
    return status == 0 ? kDone : kWrongCall;
  }
  return action();
}

}  // namespace

int main(int argc, char** argv) {
  try {
    orx::FileFuncs::openStandardStreams();
    std::ios::sync_with_stdio(false);
    for (std::FILE* stream : {stdin, stdout, stderr}) orx::FileFuncs::setBinaryMode(stream);
    return Run(orx::FileFuncs::programArguments(argc, argv));
  } catch (const WrongCall& error) {
    ReportFailure(error.what());
    return kWrongCall;
  } catch (const std::exception& error) {
    ReportFailure(error.what());
    return kFailed;
  }
}
