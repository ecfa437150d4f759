#include <gtest/gtest.h>

#include <cstdint>
#include <regex>
#include <sstream>
#include <string>
#include <vector>

#include "orxutils/orx_string.h"
#include "support/worked_messages.h"

namespace velta_test {
namespace {

using namespace orx::cs::velta;
using namespace orx::cs::velta::rtcm3;

std::string Frame(const std::string& payload) {
  std::string frame;
  AppendFrame(payload, frame);
  return frame;
}

/// A stream that has no more to give for now: who asks waits for ever.
struct LiveStream : std::stringbuf {
  using std::stringbuf::stringbuf;
  int_type underflow() override { throw std::logic_error("waits"); }
};

const std::string kFirst = Frame("first payload");
const std::string kSecond = Frame("second");
const std::vector<std::string> kBoth = {"first payload", "second"};

class FrameReaderTest : public testing::Test {
 protected:
  void Read(std::streambuf&& stream) {
    counts = {};
    payloads.clear();
    FrameReader reader(stream, counts);
    while (const auto found = reader.Next()) payloads.emplace_back(found->begin(), found->end());
  }

  FrameCounts counts;
  std::vector<std::string> payloads;
};

TEST_F(FrameReaderTest, FindsTheFramesAmongEverythingElse) {
  const std::string bad = kSecond.substr(0, kSecond.size() - 1) + "?";
  const std::string longest(kMaxPayload, '\xD3');
  // A stream, its payloads, the bytes passed over and the bad checksums.
  const std::tuple<std::string, std::vector<std::string>, std::uint64_t, std::uint64_t> cases[] = {
      {"noise" + kFirst + "between" + kSecond + "\xD3", kBoth, 13, 0},
      {"\xD3" + kFirst + "\xD3" + kSecond, kBoth, 2, 0},
      {std::string("\xD3\0\x13", 3) + kFirst + kSecond, kBoth, 3, 1},      // swallows a frame
      {std::string("\xD3\x03\xFF", 3) + kFirst + kSecond, kBoth, 3, 0},    // beyond the end
      {std::string("\xD3\0\x02\xD3", 4) + kFirst + kSecond, kBoth, 4, 1},  // one in another
      {std::string("\xD3\x04\0\x5B\x9B\x90", 6) + kFirst + kSecond, kBoth, 6, 0},  // reserved bits
      {bad + kFirst + kSecond, kBoth, bad.size(), 1},
      {Frame("") + Frame(longest), {"", longest}, 0, 0},
  };
  for (const auto& [stream, expected, skippedBytes, badCrcs] : cases) {
    SCOPED_TRACE(testing::PrintToString(stream));
    Read(std::stringbuf(stream));
    EXPECT_EQ(payloads, expected);
    EXPECT_EQ(counts.bytes, stream.size());
    EXPECT_EQ(counts.frames, expected.size());
    EXPECT_EQ(counts.skippedBytes, skippedBytes);
    EXPECT_EQ(counts.badCrcs, badCrcs);
  }
}

TEST_F(FrameReaderTest, ACutOrAFlippedBitAnywhereCostsThatFrameOnly) {
  for (std::size_t bit = 0; bit < kFirst.size() * 8; ++bit) {
    SCOPED_TRACE(bit);
    std::string broken = kFirst;
    broken[bit / 8] = static_cast<char>(broken[bit / 8] ^ 1 << bit % 8);
    Read(std::stringbuf(broken + kSecond + kFirst.substr(0, bit / 8)));
    EXPECT_EQ(payloads, std::vector{kBoth[1]});
    EXPECT_EQ(counts.skippedBytes, kFirst.size() + bit / 8);
  }
}

TEST_F(FrameReaderTest, LongStreamLosesNothingWhereItsBufferEnds) {
  std::string stream;
  std::vector<std::string> sent;
  for (std::size_t i = 0; stream.size() < 300'000; ++i) {
    sent.emplace_back(i * 37 % (kMaxPayload + 1), static_cast<char>(i));
    stream += Frame(sent.back()) + std::string(i % 5, '.');
  }
  Read(std::stringbuf(stream));
  EXPECT_EQ(payloads, sent);
}

TEST_F(FrameReaderTest, LiveFrameIsHandedOutBeforeMoreIsAwaited) {
  EXPECT_THROW(Read(LiveStream(kFirst + "?" + kSecond)), std::logic_error);
  EXPECT_EQ(payloads, kBoth);
}

/// What comes out of a payload: the message's JSON, or nothing when it is too short.
std::string JsonOfPayload(const std::string& payload) {
  Message message;
  return Decode(payload, message) < Decoded::kOther ? JsonOf(message) : "";
}

/// For each message from 1021 to 1027.
class Codec : public testing::TestWithParam<unsigned> {
 protected:
  const std::string json = Worked(GetParam());
};
INSTANTIATE_TEST_SUITE_P(Of, Codec, testing::Range(1021U, 1028U));

TEST_P(Codec, WorkedMessageIsItsFrameBothWaysAndMayGrow) {
  EXPECT_EQ(FrameOf(json), FromHex(Worked(GetParam(), "worked_frames.hex")));
  EXPECT_EQ(JsonOfPayload(PayloadOf(FrameOf(json)) + "grown"), json);
}

TEST_P(Codec, CutMessageIsTakenWhenItsLastFieldLacksLessThanAByte) {
  const std::string payload = PayloadOf(FrameOf(json));
  const std::string cut = payload.substr(0, payload.size() - 1);
  Message message;
  // The last fields of a datum message are shorter than what a byte takes with it.
  const bool isTaken = GetParam() > 1022;
  EXPECT_EQ(Decode(cut, message), isTaken ? Decoded::kCutMessage : Decoded::kTooShort);
  EXPECT_EQ(JsonOfPayload(cut), isTaken ? JsonOfPayload(cut + '\0') : "");
  for (std::size_t size = 0; size < cut.size(); ++size) {
    EXPECT_EQ(JsonOfPayload(payload.substr(0, size)), "") << size;
  }
}

TEST(Indicator, IsReadFromEitherEndAndWrittenInItsOrder) {
  // As it is sent, as the record has it, and as it is written then.
  const std::tuple<std::string, std::uint32_t, std::string> cases[] = {
      {"0000000000", 0, "0000000000"},   {"1000000000", 1, "1000000000"},
      {"1010000000", 5, "1010000000"},   {"0000100000", 16, "0000100000"},
      {"0000000101", 5, "1010000000"},   {"0000010000", 16, "0000100000"},
      {"1000000001", 513, "1000000001"}, {"1111111111", 1023, "1111111111"},
  };
  const auto payloadOf = [](const std::string& indicator) {
    const std::string number = "001111111101";
    const std::string noNames = "0000000000";
    const std::string systemId = "00000001";
    std::string bits = number + noNames + systemId + indicator;
    bits.resize(416, '0');
    std::string payload;
    for (std::size_t i = 0; i < bits.size(); i += 8) {
      payload += static_cast<char>(std::stoi(bits.substr(i, 8), nullptr, 2));
    }
    return payload;
  };
  for (const auto& [sent, indicator, written] : cases) {
    SCOPED_TRACE(sent);
    Message message;
    ASSERT_EQ(Decode(payloadOf(sent), message), Decoded::kMessage);
    EXPECT_EQ(std::get<Rtcm1021>(message).utilizedMsgIndicator, indicator);
    std::string frame;
    Encode(message, frame);
    EXPECT_EQ(PayloadOf(frame), payloadOf(written));
  }
}

std::string ErrorOf(const std::string& line) {
  try {
    return JsonOf(ParseJsonLine(line));
  } catch (const FieldError& error) {
    return error.what();
  }
}

TEST_P(Codec, EveryFieldTravelsFromEndToEndOfItsRange) {
  const std::regex fields(R"re("(\w+)": \[?(-?\d+))re");
  const std::regex ends("must be .* from (-?\\d+) to (\\d+)");
  for (std::sregex_iterator field(json.begin(), json.end(), fields), none; field != none; ++field) {
    if (field->str(1) == "message") continue;
    const std::string before(json.begin(), (*field)[2].first);
    const std::string behind((*field)[2].second, json.end());
    const std::string error = ErrorOf(before + "99999999999" + behind);
    std::smatch range;
    ASSERT_TRUE(std::regex_search(error, range, ends)) << error;
    for (const std::string& end : {range.str(1), range.str(2)}) {
      const std::string changed = before + end + behind;
      EXPECT_EQ(JsonOfPayload(PayloadOf(FrameOf(changed))), changed);
    }
  }
}

TEST(Encode, RecordThatDoesNotFitIsRefusedWhole) {
  Rtcm1022 datum;
  datum.targetName.assign(32, 'x');
  Rtcm1023 grid;
  grid.residualH[15] = 256;
  Rtcm1021 reserved;
  reserved.utilizedMsgIndicator = 32;
  std::string out = "before";
  EXPECT_THROW(Encode(reserved, out), FieldError);
  EXPECT_THROW(Encode(datum, out), FieldError);
  EXPECT_THROW(Encode(grid, out), FieldError);
  EXPECT_EQ(out, "before");
}

}  // namespace
}  // namespace velta_test
