#include <gtest/gtest.h>

#include <sstream>
#include <string>
#include <vector>

#include "support/file_bytes.h"
#include "support/run_program.h"
#include "support/temporary_directory.h"
#include "support/worked_messages.h"

namespace velta_test {
namespace {

struct Outcome {
  int status;
  std::string out, err;
};

/// Calls the program with a directory of the test's own.
class ProgramTest : public testing::Test {
 protected:
  /// \param arguments as typed, without quotation marks but for '' alone, an empty one; "@" begins
  ///     the name of a file of the test's directory, "%" that of an example stream
  /// \param input what standard input gives
  Outcome Run(const std::string& arguments, const std::string& input = "") {
    WriteBytes(directory_ / "stdin", input);
    std::string named;
    for (const char c : arguments) {
      const std::string streams = EXAMPLE_STREAMS "/";
      const std::string own = (directory_ / "").string();
      named += c == '@' ? own : c == '%' ? streams : std::string(1, c);
    }
    std::vector<std::string> call = {PROGRAM};
    std::istringstream words(named);
    for (std::string word; words >> word;) call.push_back(word == "''" ? "" : word);
    const int status =
        RunProgram(call, directory_ / "stdin", directory_ / "stdout", directory_ / "stderr");
    return {status, ReadBytes(directory_ / "stdout"), ReadBytes(directory_ / "stderr")};
  }

  TemporaryDirectory directory_;
};

/// A call of the program in a session, which is a file of lines
///
///     $ arguments        the call
///     < 1021 name=value  on its standard input: the frame of a worked message, fields changed
///     <- 1021 name=value the same frame without the last byte of its payload
///     <+ 1021 name=value the same message as a line of JSON
///     <| 3FC0            a frame of these bytes
///     << text            a line of text
///     ~ name             a file that is damaged in its middle before
///     = 1                its exit status, when it is not 0
///     > text, ! text     parts of its standard output and error in their order; without any, none
struct Call {
  std::string arguments, input, damaged;
  int status = 0;
  std::vector<std::string> out, err;
};

std::string ChangedJson(const std::string& text) {
  std::istringstream words(text);
  unsigned number = 0;
  words >> number;
  std::string json = Worked(number);
  for (std::string word; words >> word;) {
    const std::size_t equals = word.find('=');
    json = With(json, word.substr(0, equals), word.substr(equals + 1));
  }
  return json;
}

/// A frame without the last byte of its payload.
std::string CutShort(const std::string& frame) {
  std::string cut;
  orx::cs::velta::rtcm3::AppendFrame(PayloadOf(frame).substr(0, PayloadOf(frame).size() - 1), cut);
  return cut;
}

std::vector<Call> ReadSession(const std::string& name) {
  const std::string_view marks = "$ < <- <+ <| << ~ = > !";
  std::vector<Call> calls;
  std::ifstream lines(SESSIONS "/" + name);
  for (std::string line; std::getline(lines, line);) {
    const std::size_t space = std::min(line.find(' '), line.size());
    const std::string mark = line.substr(0, space);
    const std::string text = line.substr(std::min(space + 1, line.size()));
    if (mark.empty() || mark == "#") continue;
    if (mark == "$") calls.emplace_back().arguments = text;
    Call& call = calls.at(calls.size() - 1);
    if (mark == "<") call.input += FrameOf(ChangedJson(text));
    if (mark == "<-") call.input += CutShort(FrameOf(ChangedJson(text)));
    if (mark == "<+") call.input += ChangedJson(text) + "\n";
    if (mark == "<|") orx::cs::velta::rtcm3::AppendFrame(FromHex(text), call.input);
    if (mark == "<<") call.input += text + "\n";
    if (mark == "~") call.damaged = text;
    if (mark == "=") call.status = std::stoi(text);
    if (mark == ">") call.out.push_back(text);
    if (mark == "!") call.err.push_back(text);
    if (marks.find(mark) == marks.npos) throw std::runtime_error("what is " + line);
  }
  return calls;
}

void ExpectParts(const std::string& text, const std::vector<std::string>& parts) {
  std::size_t from = 0;
  for (const std::string& part : parts) {
    from = text.find(part, from);
    ASSERT_NE(from, std::string::npos) << part << "\nis not where it should be in\n" << text;
    from += part.size();
  }
  EXPECT_EQ(text.empty(), parts.empty()) << text;
}

class Session : public ProgramTest, public testing::WithParamInterface<const char*> {};

TEST_P(Session, GoesAsItShould) {
  const std::vector<Call> calls = ReadSession(GetParam() + std::string(".txt"));
  EXPECT_FALSE(calls.empty());
  for (const Call& call : calls) {
    SCOPED_TRACE("velta " + call.arguments);
    if (!call.damaged.empty()) Damage(directory_ / call.damaged);
    const Outcome outcome = Run(call.arguments, call.input);
    EXPECT_EQ(outcome.status, call.status);
    ExpectParts(outcome.out, call.out);
    ExpectParts(outcome.err, call.err);
  }
}

INSTANTIATE_TEST_SUITE_P(Of, Session, testing::Values("convert", "files", "ingest"),
                         [](const auto& name) { return std::string(name.param); });

TEST_F(ProgramTest, ConvertsTheExamplesToTheByteBothWays) {
  for (const std::string name : {"dhdn", "molodenski"}) {
    const std::string frames = ReadBytes(EXAMPLE_STREAMS "/" + name + ".rtcm3");
    const std::string lines = ReadBytes(EXAMPLE_STREAMS "/" + name + ".jsonl");
    EXPECT_EQ(Run("encode -", lines).out, frames);
    EXPECT_EQ(Run("decode -", frames).out, lines);
  }
}

}  // namespace
}  // namespace velta_test
