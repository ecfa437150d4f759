#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "tools/program_fixture.h"

namespace velta_test {
namespace {

TEST_F(ProgramTest, ExampleStreamsAreWhatTheirLinesEncodeTo) {
  for (const std::string name : {"dhdn", "molodenski"}) {
    const std::string lines = Example(name + ".jsonl");
    const std::string frames = Example(name + ".rtcm3");
    const Outcome encoded = Run("encode - -o @out", lines);
    EXPECT_EQ(encoded.status, 0) << encoded.err;
    EXPECT_EQ(Read("out"), frames);
    const Outcome decoded = Run("decode -", frames);
    EXPECT_EQ(decoded.out, lines);
    EXPECT_EQ(decoded.err, "");
    EXPECT_EQ(decoded.status, 0);
  }
}

TEST_F(ProgramTest, EncodeNamesTheLineAndGoesOn) {
  const WorkedMessage good = WorkedMessages()[4];
  const Outcome outcome = Run(
      "encode -", good.json + "\r\n\nnonsense\n" + With(good.json, "fe", "-1") + "\n" + good.json);
  EXPECT_EQ(outcome.out, good.frame + good.frame);
  EXPECT_EQ(outcome.err,
            "velta: -:3: not a JSON object\n"
            "velta: -:4: fe must be an integer from 0 to 68719476735, not -1\n");
  EXPECT_EQ(outcome.status, 1);
}

TEST_F(ProgramTest, DecodeReportsWhatItPassedOver) {
  const WorkedMessage good = WorkedMessages()[4];
  std::string shortMessage;
  velta_tool::rtcm3::AppendFrame(good.frame.substr(3, 10), shortMessage);
  const Outcome outcome = Run("decode -", good.frame + shortMessage + "?");
  EXPECT_EQ(outcome.out, good.json + "\n");
  EXPECT_EQ(outcome.err,
            "velta: note: -: byte 31: 1025 ends before its last field\n"
            "velta: note: -: byte 47: 1 bytes that are no frame\n"
            "velta: note: -: frames: 2 (1025: 1, too short: 1); passed over: 1 bytes, 0 wrong "
            "checksums\n"
            "velta: -: 1 messages end before their last field\n");
  EXPECT_EQ(outcome.status, 1);
}

/// Ingests an example and generates from what it gave.
class RoundTripTest : public ProgramTest {
 protected:
  std::string Generate(const std::string& example, const std::string& position) {
    const Outcome ingested = Ingest(Example(example + ".rtcm3"));
    EXPECT_EQ(ingested.status, 0) << ingested.err;
    const std::string datum = example == "dhdn" ? "AUTO_DHDN_BESEL" : "Local_B_O_7";
    const std::string call =
        "generate --datum @" + datum + ".dff --projection @" + datum + ".prj " + position;
    const Outcome frames = Run(call + " -o @frames");
    EXPECT_EQ(frames.status, 0) << frames.err;
    EXPECT_EQ(frames.out, "");
    std::string lines = Run("decode @frames").out;
    EXPECT_EQ(Run(call + " --json").out, lines);
    return lines;
  }

  /// The example's lines with what the files do not keep set to what comes back.
  std::string Expected(const std::string& example,
                       const std::vector<std::array<std::string, 3>>& changes) {
    std::string lines = Example(example + ".jsonl");
    for (const auto& [after, field, value] : changes) {
      const std::size_t start = lines.find("\"message\": " + after);
      const std::size_t end = lines.find('\n', start);
      lines.replace(start, end - start, With(lines.substr(start, end - start), field, value));
    }
    return lines;
  }
};

TEST_F(RoundTripTest, HelmertSetComesBackButForItsTruncatedResiduals) {
  EXPECT_EQ(
      Generate("dhdn", "--lat 52.002 --lon 9.002 --system-id 23"),
      Expected("dhdn", {{"1021", "targetName", "\"AUTO_DHDN_BESEL\""},
                        {"1021", "plateNumber", "0"},
                        {"1021", "horQualityIndicator", "0"},
                        {"1021", "vertQualityIndicator", "0"},
                        {"1023", "meanDLambda", "13"},
                        {"1023", "residualPhi",
                         "[10, 9, 7, 5, 4, 2, 0, -2, -3, -5, -7, -9, -10, -12, -14, -16]"},
                        {"1023", "residualLambda",
                         "[-10, -7, -4, -1, -10, -8, -5, -2, -12, -9, -6, -3, -13, -10, -7, -4]"},
                        {"1023", "horGridQualityIndicator", "0"},
                        {"1023", "vertGridQualityIndicator", "0"},
                        {"1023", "mjd", "0"}}));
}

TEST_F(RoundTripTest, MolodenskiSetIsAnnouncedAsItIsSent) {
  const std::string lines =
      Generate("molodenski",
               "--lat -34.02 --lon -111.17 --northing -5150000 --easting 500000 --system-id 41");
  EXPECT_EQ(
      lines.substr(0, lines.find("\"plateNumber\"")),
      R"({"message": 1022, "sourceName": "WGS84", "targetName": "Local_B_O_7", "systemId": 41, )"
      R"("utilizedMsgIndicator": 19, )");
  const std::string example = Example("molodenski.jsonl");
  EXPECT_EQ(lines.substr(lines.find("{\"message\": 1027")),
            example.substr(example.find("{\"message\": 1027")));

  const Outcome off = Run("generate --datum @Local_B_O_7.dff --lat 10 --lon 20 --json");
  EXPECT_NE(off.out.find("\"utilizedMsgIndicator\": 0,"), std::string::npos) << off.out;
  EXPECT_EQ(off.status, 0);
  EXPECT_NE(off.err.find("no 1023 sent"), std::string::npos);
}

class FilesTest : public ProgramTest {
 protected:
  void SetUp() override { Ingest(Example("dhdn.rtcm3") + Example("molodenski.rtcm3")); }
};

TEST_F(FilesTest, PositionOutsideNamesTheAreas) {
  const Outcome outcome = Run("generate --datum @AUTO_DHDN_BESEL.dff --lat 2 --lon -9.5");
  EXPECT_EQ(outcome.status, 1);
  EXPECT_EQ(outcome.out, "");
  EXPECT_NE(outcome.err.find("no area holds latitude 2, longitude -9.5 degrees, or an entry "
                             "up to the one that does cannot be used; the areas are\n"
                             "  latitude 49.10222 to 53.10222, longitude 8.362778 to 12.36278"),
            std::string::npos)
      << outcome.err;
}

TEST_F(FilesTest, ListSaysThatAFileIsDamaged) {
  std::string bytes = Read("AUTO_DHDN_BESEL.dff");
  bytes[bytes.size() / 2] ^= 1;
  Write("bad.dff", bytes);
  const Outcome outcome = Run("list @bad.dff");
  EXPECT_EQ(outcome.status, 1);
  EXPECT_NE(outcome.err.find("damaged"), std::string::npos) << outcome.err;
}

TEST_F(FilesTest, ListShowsPhysicalUnits) {
  const std::string datum = Run("list @Local_B_O_7.dff").out;
  for (const char* line :
       {"source system             WGS84\n", "method                    Molodenski-Badekas\n",
        "area                      south -90, north 90, west -180, east 180 degrees\n",
        "rotation point            -4123456.789 2987654.321 -1 m\n",
        "target ellipsoid          a 6378137.001, b 6356752.315 m\n",
        "grid spacing              21 10.5 arc-seconds\n"}) {
    EXPECT_NE(datum.find(line), std::string::npos) << line << datum;
  }
  const std::string projection = Run("list --json @Local_B_O_7.prj").out;
  EXPECT_EQ(
      projection.substr(0, projection.find("\"latitudeOfCentre\"")),
      R"({"message":1027,"projectionType":7,"projection":"Oblique Mercator","rectified":true,)");
  EXPECT_NE(projection.find(R"("eastingAtCentre":500000.0,"northingAtCentre":-10000.0)"),
            std::string::npos);
}

TEST_F(FilesTest, MergeBringsTheEntries) {
  const Outcome merged = Run("merge --json @AUTO_DHDN_BESEL.dff @Local_B_O_7.dff");
  EXPECT_EQ(merged.status, 0) << merged.err;
  EXPECT_NE(merged.out.find(R"("result":"0x00000000"})"), std::string::npos);
  const std::string list = Run("list --json @AUTO_DHDN_BESEL.dff").out;
  EXPECT_EQ(std::count(list.begin(), list.end(), '\n'), 2);

  Write("damaged.dff", "no registry file");
  const Outcome failed = Run("merge @AUTO_DHDN_BESEL.dff @damaged.dff");
  EXPECT_EQ(failed.status, 1);
  EXPECT_NE(failed.err.find("0x80040632 datum file damaged"), std::string::npos) << failed.err;
}

TEST_F(FilesTest, DumpShowsTheTreeAndWhatIsLeftOfADamagedOne) {
  const Outcome whole = Run("dump @AUTO_DHDN_BESEL.dff");
  EXPECT_EQ(whole.status, 0);
  EXPECT_EQ(whole.err, "");
  for (const char* part :
       {R"({"name": "", "dimension": 0, "values": [], "keys": [)",
        R"({"name":"rtcm_datumName","type":5,"size":32,"dimension":1,"data":"4100550054004f005f00)",
        R"("value":"AUTO_DHDN_BESEL"})",
        R"({"name": "S_91984_18653_T_374415_64815", "dimension": 0,)",
        R"({"name":"Version","type":3,"size":2,"dimension":1,"data":"0001","value":256})",
        R"({"name":"StandardMethod","type":1,"size":4,"dimension":1,"data":"01000000"})",
        R"({"name":"HtIndicator","type":2,"size":1,"dimension":1,"data":"01","value":1})"}) {
    EXPECT_NE(whole.out.find(part), std::string::npos) << part;
  }
  const std::size_t firstSave = Read("AUTO_DHDN_BESEL.dff").size();
  Run("merge @AUTO_DHDN_BESEL.dff @Local_B_O_7.dff");
  std::string bytes = Read("AUTO_DHDN_BESEL.dff");
  bytes[firstSave - 1] = static_cast<char>(bytes[firstSave - 1] ^ 1);
  Write("damaged.dff", bytes);
  const Outcome damaged = Run("dump @damaged.dff");
  EXPECT_EQ(damaged.status, 1);
  EXPECT_EQ(damaged.out.substr(0, 9), R"({"name": )");
  EXPECT_NE(damaged.err.find("damaged.dff: error state 3: damaged"), std::string::npos);
}

TEST_F(FilesTest, CallsThatCannotBeAreToldFromWorkThatFails) {
  Write("other.dff", "no registry file");
  Write("other.prj", "");
  const struct {
    const char* call;
    int status;
    const char* err;
  } cases[] = {
      {"", 2, "subcommand is required"},
      {"fly", 2, "subcommand is required"},
      {"ingest", 2, "FILE is required"},
      {"ingest --datum-dir @. -", 2, "requires --projection-dir"},
      {"list @other.txt", 2, "other.txt is no .dff or .prj file"},
      {"merge @AUTO_DHDN_BESEL.dff @AUTO_DHDN_BESEL.prj", 2, "do not mix"},
      {"generate --lat 1 --lon 1", 2, "--datum or --projection"},
      {"generate --datum @AUTO_DHDN_BESEL.dff --lon 9", 2, "requires --lat"},
      {"generate --datum @AUTO_DHDN_BESEL.dff --lat 91 --lon 9", 2, "--lat"},
      {"generate --projection @AUTO_DHDN_BESEL.prj --system-id 256", 2, "--system-id"},
      {"generate --projection @AUTO_DHDN_BESEL.prj --northing 1", 2, "requires --easting"},
      {"list @nowhere.dff", 1, "nowhere.dff: there is no such file"},
      {"list @other.dff", 1, "no complete datum entry"},
      {"list @other.prj", 1, "no usable projection"},
      {"merge @nowhere.dff @other.dff", 1, "nowhere.dff: there is no such file"},
      {"generate --projection @other.prj", 1, "no usable projection"},
      {"generate --datum @other.dff --lat 1 --lon 1", 1, "no complete entry"},
      {"generate --projection @AUTO_DHDN_BESEL.prj -o @no/such/place", 1, "cannot be written"},
      {"dump @nowhere", 1, "there is no such file"},
      {"decode @.", 1, "is a directory"},
      {"decode @nowhere", 1, "cannot be read"},
      {"decode @other.prj", 1, "no RTCM 3 frame"},
  };
  for (const auto& [call, status, err] : cases) {
    const Outcome outcome = Run(call);
    EXPECT_EQ(outcome.status, status) << call;
    EXPECT_NE(outcome.err.find(err), std::string::npos) << call << ": " << outcome.err;
  }
}

TEST_F(ProgramTest, HelpStandsOnItsOwn) {
  EXPECT_EQ(Run("--help").status, 0);
  for (const std::string command :
       {"ingest", "list", "generate", "merge", "decode", "encode", "dump"}) {
    const Outcome help = Run(command + " --help");
    EXPECT_EQ(help.status, 0);
    EXPECT_NE(help.out.find("Example"), std::string::npos) << command;
    EXPECT_NE(help.out.find("velta " + command + " "), std::string::npos) << command;
  }
}

}  // namespace
}  // namespace velta_test
