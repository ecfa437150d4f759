#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "tools/program_fixture.h"

namespace velta_test {
namespace {

class IngestTest : public ProgramTest {
 protected:
  void SetUp() override {
    for (const auto& [json, frame] : WorkedMessages()) messages_.push_back(json);
  }

  /// The frame of a worked message of another system.
  std::string Frame(unsigned number, unsigned systemId) const {
    return FrameOf(With(messages_[number - 1021], "systemId", std::to_string(systemId)));
  }

  /// As Frame, a datum message that announces other messages and has a name of its own.
  std::string Datum(unsigned systemId, unsigned announced, const std::string& name,
                    const std::string& field = "plateNumber",
                    const std::string& value = "7") const {
    std::string json = With(messages_[0], "systemId", std::to_string(systemId));
    json = With(json, "utilizedMsgIndicator", std::to_string(announced));
    return FrameOf(With(With(json, "targetName", "\"" + name + "\""), field, value));
  }

  std::vector<std::string> messages_;
};

constexpr unsigned kGrid = 1;
constexpr unsigned kPlaneGrid = 2;
constexpr unsigned kPlain = 4;
constexpr unsigned kLambert = 8;

TEST_F(IngestTest, SetIsIngestedWhenItsLastMessageComesInWhateverOrder) {
  const std::string added =
      "system 1: 1021 + 1023 in A.dff, added; 1025 in A.prj, added\n"
      "sets: 1 ingested, 0 failed, 0 incomplete\n"
      "frames: 3 (1021: 1, 1023: 1, 1025: 1); passed over: 0 bytes, 0 wrong checksums\n";
  const std::string present =
      "system 1: 1021 + 1023 in A.dff, already there; 1025 in A.prj, already there\n";
  std::vector<std::string> frames = {Datum(1, kGrid | kPlain, "A"), Frame(1023, 1), Frame(1025, 1)};
  std::sort(frames.begin(), frames.end());
  bool first = true;
  do {
    const Outcome outcome = Ingest(frames[0] + frames[1] + frames[2]);
    const std::string& expected = first ? added : present;
    EXPECT_EQ(outcome.out.substr(0, expected.size()), expected);
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.err, "");
    first = false;
  } while (std::next_permutation(frames.begin(), frames.end()));
}

TEST_F(IngestTest, InterleavedSystemsAndFilesAreKeptApart) {
  Write("1.rtcm3", Datum(1, kGrid, "A") + Datum(2, kGrid, "B") + Frame(1023, 2));
  Write("2.rtcm3", Frame(1023, 1));
  const Outcome outcome =
      Run("ingest --datum-dir @. --projection-dir @. @1.rtcm3 @nowhere @2.rtcm3");
  EXPECT_EQ(outcome.out.substr(0, outcome.out.find("frames")),
            "system 2: 1021 + 1023 in B.dff, added\n"
            "system 1: 1021 + 1023 in A.dff, added\n"
            "sets: 2 ingested, 0 failed, 0 incomplete\n");
  EXPECT_EQ(outcome.status, 1);
  EXPECT_NE(outcome.err.find("nowhere: cannot be read"), std::string::npos) << outcome.err;
}

TEST_F(IngestTest, NewerMessageReplacesAndTheNextSetStartsEmpty) {
  const std::string elsewhere =
      FrameOf(With(With(messages_[2], "systemId", "1"), "phi0", "374505"));
  const Outcome outcome = Ingest(Datum(1, kGrid, "OLD") + Datum(1, kGrid, "NEW") + Frame(1023, 1) +
                                 elsewhere + Datum(1, kGrid, "NEW") + Datum(1, kGrid, "NEW"));
  EXPECT_EQ(outcome.out.substr(0, outcome.out.find("frames")),
            "system 1: 1021 + 1023 in NEW.dff, added\n"
            "system 1: 1021 + 1023 in NEW.dff, added\n"
            "sets: 2 ingested, 0 failed, 1 incomplete\n");
  EXPECT_EQ(outcome.err, "velta: system 1: incomplete, not received: 1023\n");
  EXPECT_FALSE(std::filesystem::exists(Path("OLD.dff")));
}

TEST_F(IngestTest, NothingOfAnEarlierSetGetsIntoTheNext) {
  Ingest(Datum(1, kGrid, "A") + Frame(1023, 1) + Datum(2, 0, "B"));
  EXPECT_NE(Run("list @A.dff --json").out.find("latitudeResiduals"), std::string::npos);
  EXPECT_NE(Run("list @B.dff --json").out.find("\"gridArea\":null"), std::string::npos);
}

TEST_F(IngestTest, WhatIsMissingOrNotSupportedOrNotAnnouncedIsSaid) {
  const struct {
    std::string stream;
    std::string firstLine;
    std::string err;
  } cases[] = {
      {Datum(1, kGrid | kPlaneGrid | kPlain, "A") + Frame(1024, 1),
       "sets: 0 ingested, 0 failed, 1 incomplete",
       "velta: system 1: incomplete, not received: 1023, 1025\n"},
      {Frame(1025, 7), "sets: 0 ingested, 0 failed, 1 incomplete",
       "velta: system 7: incomplete, not received: 1021 or 1022\n"},
      {Datum(1, kLambert, "B") + Frame(1026, 1), "system 1: 1021 in B.dff, added",
       "velta: system 1: 1026: 0x80040638 projection type not supported\n"},
      {Frame(1025, 1) + Datum(1, 0, "C"), "system 1: 1021 in C.dff, added; not announced: 1025",
       ""},
      {Datum(1, 0, "D", "computationIndicator", "4"), "system 1: 1021, failed",
       "velta: system 1: 0x80040635 unacceptable computation indicator\n"},
      {Datum(1, 0, ""), "system 1: 1021 in .dff, added",
       "velta: system 1: 0x80040643 no target datum name\n"},
      {"no frame", "sets: 0 ingested, 0 failed, 0 incomplete",
       "velta: note: -: byte 0: 8 bytes that are no frame\nvelta: -: no RTCM 3 frame in it\n"},
      {"", "sets: 0 ingested, 0 failed, 0 incomplete", "velta: -: no RTCM 3 frame in it\n"},
  };
  for (const auto& [stream, firstLine, err] : cases) {
    const Outcome outcome = Ingest(stream);
    EXPECT_EQ(outcome.out.substr(0, outcome.out.find('\n')), firstLine);
    EXPECT_EQ(outcome.err, err);
    EXPECT_EQ(outcome.status, err.empty() ? 0 : 1) << firstLine;
  }
}

TEST_F(IngestTest, JsonSaysTheSame) {
  const Outcome outcome =
      Ingest("x" + Datum(1, kGrid, "A") + Frame(1023, 1) + Frame(1025, 2), "--json");
  EXPECT_EQ(
      outcome.out,
      R"({"systemId":1,"result":"0x00000000","parts":[{"messages":[1021,1023],"file":"A.dff",)"
      R"("added":true}],"notAnnounced":[]})"
      "\n"
      R"({"systemId":2,"missing":["1021 or 1022"]})"
      "\n"
      R"({"ingested":1,"failed":0,"incomplete":1,"frames":3,"messages":{"1021":1,"1022":0,)"
      R"("1023":1,"1024":0,"1025":1,"1026":0,"1027":0},"otherMessages":0,"shortMessages":0,)"
      R"("skippedBytes":1,"badCrcs":0})"
      "\n");
  EXPECT_EQ(outcome.status, 1);
}

TEST_F(IngestTest, RoverStreamGivesAnEntryForEachCellAcrossTheNoise) {
  const Outcome outcome = Ingest(Example("rover.rtcm3"));
  EXPECT_EQ(outcome.status, 0);
  EXPECT_NE(outcome.out.find("sets: 468 ingested, 0 failed, 0 incomplete\n"), std::string::npos);
  const std::string list = Run("list --json @ROVER_NET.dff").out;
  EXPECT_EQ(std::count(list.begin(), list.end(), '\n'), 468);
}

}  // namespace
}  // namespace velta_test
