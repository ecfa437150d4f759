// Writes what is made of the program's help texts as it is laid out below share/:
//
//   velta-manual DIRECTORY DATE
//
// The texts are those of the commands themselves, which are linked in: what help says, the manual
// says.

#include <CLI/App.hpp>
#include <exception>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <memory>
#include <string>

#include "completions.h"
#include "man_page.h"
#include "program.h"

namespace {

namespace fs = std::filesystem;

void Write(const fs::path& file, const std::string& text) {
  fs::create_directories(file.parent_path());
  std::ofstream out(file, std::ios::binary);
  out.exceptions(std::ios::failbit | std::ios::badbit);
  out << text << std::flush;
}

void WriteAll(const fs::path& share, const std::string& date) {
  velta_tool::Action action;
  const std::unique_ptr<const CLI::App> program = velta_tool::MakeProgram(action);
  const auto writePage = [&](const CLI::App& command) {
    Write(share / "man" / "man1" / (velta_manual::PageName(command) + ".1"),
          velta_manual::ManPage(command, date));
  };
  writePage(*program);
  for (const CLI::App* const command : program->get_subcommands({})) writePage(*command);
  Write(share / "bash-completion" / "completions" / "velta",
        velta_manual::BashCompletion(*program));
  Write(share / "zsh" / "vendor-completions" / "_velta", velta_manual::ZshCompletion(*program));
  Write(share / "fish" / "vendor_completions.d" / "velta.fish",
        velta_manual::FishCompletion(*program));
}

}  // namespace

int main(int argc, char** argv) {
  try {
    if (argc != 3) throw std::invalid_argument("usage: velta-manual DIRECTORY DATE");
    WriteAll(argv[1], argv[2]);
    return 0;
  } catch (const std::exception& error) {
    std::cerr << "velta-manual: " << error.what() << '\n';
    return 1;
  }
}
