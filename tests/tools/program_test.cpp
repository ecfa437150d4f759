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
  std::string out;
  std::string err;
};

/// Calls the program with a directory of the test's own.
class ProgramTest : public testing::Test {
 protected:
  /// \param arguments as typed, without quotation marks but for '' alone, an empty one; "\ " is a
  ///     blank in one, "@" begins the name of a file of the test's directory, "%" that of an
  ///     example stream
  /// \param input what standard input gives
  Outcome Run(const std::string& arguments, const std::string& input = "") {
    WriteBytes(directory_ / "stdin", input);
    std::vector<std::string> call = {PROGRAM};
    std::istringstream words(arguments);
    for (std::string word; words >> word;) {
      std::string more;
      while (word.ends_with('\\') && words >> more) {
        word.back() = ' ';
        word += more;
      }
      call.push_back(word == "''" ? "" : Named(word));
    }
    const int status =
        RunProgram(call, directory_ / "stdin", directory_ / "stdout", directory_ / "stderr");
    return {status, ReadBytes(directory_ / "stdout"), ReadBytes(directory_ / "stderr")};
  }

  /// A word with the names of its files.
  std::string Named(const std::string& word) const {
    std::string named;
    for (const char c : word) {
      const std::string streams = EXAMPLE_STREAMS "/";
      const std::string own = (directory_ / "").string();
      named += c == '@' ? own : c == '%' ? streams : std::string(1, c);
    }
    return named;
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
///     <[ 9               a line of so many brackets
///     cp name other      a file that is copied before
///     ~ name             a file that is damaged in its middle before
///     = 1                its exit status, when it is not 0
///     > text, ! text     parts of its standard output and error in their order; without any, none
struct Call {
  std::string arguments;
  std::string input;
  std::string copied;
  std::string damaged;
  int status = 0;
  std::vector<std::string> out;
  std::vector<std::string> err;
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
  const std::string_view marks = "$ < <- <+ <| << <[ cp ~ = > !";
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
    if (mark == "<[") call.input += std::string(std::stoul(text), '[') + "\n";
    if (mark == "cp") call.copied = text;
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
    if (!call.copied.empty()) {
      const std::size_t space = call.copied.find(' ');
      std::filesystem::copy_file(directory_ / call.copied.substr(0, space),
                                 directory_ / call.copied.substr(space + 1));
    }
    if (!call.damaged.empty()) Damage(directory_ / call.damaged);
    const Outcome outcome = Run(call.arguments, call.input);
    EXPECT_EQ(outcome.status, call.status);
    ExpectParts(outcome.out, call.out);
    ExpectParts(outcome.err, call.err);
  }
}

INSTANTIATE_TEST_SUITE_P(Of, Session,
                         testing::Values("convert", "files", "ingest", "map" SESSIONS_WITH_PROJ),
                         [](const auto& name) { return std::string(name.param); });

/// A 1021 whose indicator has its ten bits in the order of those who number them from the other
/// end.
std::string WithMirroredIndicator(const std::string& frame) {
  constexpr std::size_t kBits = 10;
  std::string payload = PayloadOf(frame);
  const auto bit = [&payload](std::size_t place) {
    return payload[place / 8] >> (7 - place % 8) & 1;
  };
  const auto text = [&](std::size_t at) {  // its end
    std::size_t count = 0;
    for (std::size_t i = 0; i < 5; ++i) count = count * 2 + static_cast<std::size_t>(bit(at + i));
    return at + 5 + 8 * count;
  };
  const std::size_t indicator = text(text(12)) + 8;  // behind number, names and system
  for (std::size_t i = 0; i < kBits / 2; ++i) {
    const std::size_t first = indicator + i;
    const std::size_t last = indicator + kBits - 1 - i;
    if (bit(first) == bit(last)) continue;
    for (const std::size_t place : {first, last}) {
      payload[place / 8] = static_cast<char>(payload[place / 8] ^ (0x80 >> place % 8));
    }
  }
  std::string mirrored;
  orx::cs::velta::rtcm3::AppendFrame(payload, mirrored);
  return mirrored;
}

TEST_F(ProgramTest, TakesWhatAnOperatorSendsWhereverTheRecordingEnds) {
  const std::string datum = FrameOf(With(Worked(1021), "utilizedMsgIndicator", "1"));
  const std::string grid = FrameOf(Worked(1023));
  const std::string next = FrameOf(With(Worked(1023), "phi0", "374505"));
  const std::string projection = CutShort(FrameOf(Worked(1025)));
  const std::string stream = datum + grid + projection + datum + next + projection;
  const std::string mirrored = WithMirroredIndicator(datum);
  ASSERT_NE(mirrored, datum);
  EXPECT_EQ(Run("ingest --datum-dir @a --projection-dir @a -", stream).status, 0);
  EXPECT_EQ(Run("ingest --datum-dir @b --projection-dir @b -",
                mirrored + grid + projection + mirrored + next + projection)
                .status,
            0);
  for (const char* const file : {"AUTO_DHDN_BESEL.dff", "AUTO_DHDN_BESEL.prj"}) {
    EXPECT_EQ(ReadBytes(directory_ / "a" / file), ReadBytes(directory_ / "b" / file));
  }
  constexpr std::size_t kStep = 11;
  const std::size_t whole = datum.size() + grid.size();
  for (std::size_t size = whole; size < stream.size(); size += kStep) {
    const Outcome cut = Run("ingest --datum-dir @c --projection-dir @c -", stream.substr(0, size));
    EXPECT_EQ(cut.status, 0) << "the first " << size << " bytes: " << cut.err;
  }
}

#ifdef __linux__
TEST_F(ProgramTest, NamesWhatCannotBeReadAndGoesOn) {
  const std::string unreadable = "/proc/self/mem";  // opens, and has nothing at its start
  const std::string error = "velta: /proc/self/mem: cannot be read: Input/output error\n";
  const Outcome ingested =
      Run("ingest --datum-dir @ --projection-dir @ " + unreadable + " %dhdn.rtcm3 " + unreadable);
  EXPECT_EQ(ingested.status, 1);
  EXPECT_EQ(ingested.err, error + error);
  EXPECT_NE(ingested.out.find("sets: 1 ingested"), std::string::npos) << ingested.out;
  const Outcome decoded = Run("decode " + unreadable);
  EXPECT_EQ(decoded.status, 1);
  EXPECT_EQ(decoded.err, error);
}
#endif

}  // namespace
}  // namespace velta_test
