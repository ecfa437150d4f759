#pragma once

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <string>

#include "support/file_bytes.h"
#include "support/temporary_directory.h"
#include "tools/worked_messages.h"

#ifndef _WIN32
#include <sys/wait.h>
#endif

namespace velta_test {

/// Calls the program in a directory of the test's own.
class ProgramTest : public testing::Test {
 protected:
  struct Outcome {
    int status;
    std::string out;
    std::string err;
  };

  /// \param arguments as typed; "@" begins the name of a file of the test's directory
  /// \param input what standard input gives
  Outcome Run(const std::string& arguments, const std::string& input = "") {
    std::string call = (std::filesystem::path(".") / "velta").make_preferred().string() + " ";
    for (const char c : arguments) {
      if (c == '@') {
        call += (directory_.path() / "").make_preferred().string();
      } else {
        call += c;
      }
    }
    Write("stdin", input);
    call += " <" + Path("stdin") + " >" + Path("stdout") + " 2>" + Path("stderr");
    const int status = std::system(call.c_str());
    return {ExitStatus(status), Read("stdout"), Read("stderr")};
  }

  /// Ingests frames into the test's directory.
  Outcome Ingest(const std::string& frames, const std::string& options = "") {
    return Run("ingest --datum-dir @. --projection-dir @. - " + options, frames);
  }

  std::string Path(const std::string& name) const { return (directory_ / name).string(); }
  void Write(const std::string& name, const std::string& bytes) {
    WriteBytes(directory_ / name, bytes);
  }
  std::string Read(const std::string& name) const { return ReadBytes(directory_ / name); }

  static std::string Example(const std::string& name) {
    return ReadBytes(std::filesystem::path(EXAMPLE_STREAMS) / name);
  }

 private:
  static int ExitStatus(int status) {
#ifdef _WIN32
    return status;
#else
    return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
#endif
  }

  TemporaryDirectory directory_;
};

}  // namespace velta_test
