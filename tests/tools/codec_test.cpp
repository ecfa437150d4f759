#include <gtest/gtest.h>

#include <cstdint>
#include <random>
#include <span>
#include <string>
#include <variant>

#include "rtcm3/fields.h"
#include "tools/worked_messages.h"

namespace velta_tool::rtcm3 {
namespace {

using velta_test::FrameOf;
using velta_test::JsonOf;
using velta_test::With;
using velta_test::WorkedMessage;
using velta_test::WorkedMessages;

constexpr std::size_t kHeaderSize = 3;
constexpr std::size_t kCrcSize = 3;

std::span<const std::uint8_t> Payload(const std::string& frame) {
  return {reinterpret_cast<const std::uint8_t*>(frame.data()) + kHeaderSize,
          frame.size() - kHeaderSize - kCrcSize};
}

TEST(Codec, WorkedMessagesAreTheirFramesBothWays) {
  for (const auto& [json, frame] : WorkedMessages()) {
    EXPECT_EQ(FrameOf(json), frame) << json;
    Message message;
    ASSERT_EQ(Decode(Payload(frame), message), Decoded::kMessage) << json;
    EXPECT_EQ(JsonOf(message), json);
    std::visit([&](const auto& record) { EXPECT_EQ(record.messageType + 1000, NumberOf(message)); },
               message);
  }
}

TEST(Codec, PayloadMayBeLongerThanTheFieldsButNotShorter) {
  for (const auto& [json, frame] : WorkedMessages()) {
    const auto payload = Payload(frame);
    Message message;
    for (std::size_t size = 2; size < payload.size(); ++size) {
      EXPECT_EQ(Decode(payload.first(size), message), Decoded::kTooShort) << json << size;
    }
    std::string longer(payload.begin(), payload.end());
    longer += "grown";
    const std::span bytes(reinterpret_cast<const std::uint8_t*>(longer.data()), longer.size());
    EXPECT_EQ(Decode(bytes, message), Decoded::kMessage);
    EXPECT_EQ(JsonOf(message), json);
  }
}

TEST(Codec, OtherNumbersAreOtherMessages) {
  const std::uint8_t payloads[][3] = {
      {0x3F, 0xC0, 0}, {0x40, 0x40, 0}, {0, 0, 0}};  // 1020, 1028, 0
  Message message;
  for (const auto& payload : payloads) EXPECT_EQ(Decode(payload, message), Decoded::kOther);
  EXPECT_EQ(Decode({}, message), Decoded::kOther);
}

/// Fills a record with values from the ends and the middle of the fields' ranges.
class RandomFields {
 public:
  explicit RandomFields(unsigned seed) : random_(seed) {}

  template <class Member>
  void Number(const char*, unsigned width, Member& value) {
    const auto [min, max] = FieldRange::Of<Member>(width);
    const std::int64_t values[] = {min, max, std::uniform_int_distribution(min, max)(random_)};
    value = static_cast<Member>(values[random_() % std::size(values)]);
  }

  void Text(const char*, std::string& text, std::uint32_t& counter) {
    counter = static_cast<std::uint32_t>(random_() % (kMaxTextLength + 1));
    text.resize(counter);
    for (char& c : text) c = static_cast<char>(random_());
  }

  template <class... Columns>
  void Points(unsigned width, Columns... columns) {
    VisitPoints(*this, width, columns...);
  }

 private:
  std::mt19937 random_;
};

TEST(Codec, AnyRecordSurvivesTheWireAndJson) {
  for (unsigned seed = 0; seed < 1000; ++seed) {
    Message message;
    ASSERT_TRUE(Reset(message, kFirstMessage + seed % kMessageTypes));
    RandomFields fields(seed);
    std::visit([&fields](auto& record) { VisitFields(fields, record); }, message);

    std::string frame;
    Encode(message, frame);
    Message decoded;
    ASSERT_EQ(Decode(Payload(frame), decoded), Decoded::kMessage);
    const std::string json = JsonOf(message);
    EXPECT_EQ(JsonOf(decoded), json);
    EXPECT_EQ(FrameOf(json), frame);
  }
}

TEST(Codec, RecordThatDoesNotFitIsRefusedWhole) {
  Rtcm1023 grid;
  grid.residualH[15] = 256;
  Rtcm1021 datum;
  datum.heightIndicator = 0xFFFFFFFF;
  Rtcm1022 named;
  named.targetName.assign(32, 'x');
  Rtcm1027 oblique;
  oblique.azIL = std::uint64_t{1} << 63;
  std::string out = "before";
  for (const Message& message : {Message(grid), Message(datum), Message(named), Message(oblique)}) {
    EXPECT_THROW(Encode(message, out), FieldError) << NumberOf(message);
  }
  EXPECT_EQ(out, "before");
}

TEST(Json, NamesThatAreNotAsciiAreUtf8) {
  const std::string json =
      With(WorkedMessages()[0].json, "sourceName", "\"Stra\u00DFe \\\"1\\\"\"");
  const Message message = ParseJsonLine(json);
  EXPECT_EQ(std::get<Rtcm1021>(message).sourceName,
            "Stra\xDF"
            "e \"1\"");
  EXPECT_EQ(std::get<Rtcm1021>(message).sourceNameCounter, 10U);
  EXPECT_EQ(JsonOf(message), json);
}

TEST(Json, WhatIsWrongIsNamedWithFieldAndRange) {
  const std::vector<WorkedMessage> worked = WorkedMessages();
  const std::string& datum = worked[0].json;
  const std::string& grid = worked[2].json;
  const std::string& oblique = worked[6].json;
  const std::string many = "[" + std::string(32, '1') + "]";
  const struct {
    std::string line;
    std::string error;
  } cases[] = {
      {"", "not a JSON object"},
      {"[1021]", "not a JSON object"},
      {datum.substr(0, datum.size() - 1), "not a JSON object"},
      {"{}", "message is missing"},
      {R"({"message": 1020})", "message must be an integer from 1021 to 1027, not 1020"},
      {R"({"message": "1021"})", "message must be an integer from 1021 to 1027, not \"1021\""},
      {R"({"message": 1025})", "systemId is missing"},
      {With(grid, "mjd", "0, \"mjD\": 1"), "mjD is no field of the message"},
      {With(grid, "phi0", "1048576"),
       "phi0 must be an integer from -1048576 to 1048575, not 1048576"},
      {With(grid, "meanDPhi", "-129"), "meanDPhi must be an integer from -128 to 127, not -129"},
      {With(grid, "mjd", "-1"), "mjd must be an integer from 0 to 65535, not -1"},
      {With(grid, "mjd", "1.0"), "mjd must be an integer from 0 to 65535, not 1.0"},
      {With(grid, "mjd", "null"), "mjd must be an integer from 0 to 65535, not null"},
      {With(grid, "horShiftIndicator", "2"),
       "horShiftIndicator must be an integer from 0 to 1, not 2"},
      {With(oblique, "epc", "18446744073709551615"),
       "epc must be an integer from 0 to 68719476735, not 18446744073709551615"},
      {With(oblique, "laPC", "18446744073709551616"), "laPC must be an integer from -8589934592"},
      {With(grid, "residualPhi", "[1, 2]"), "residualPhi must be an array of 16 integers"},
      {With(grid, "residualPhi", "7"), "residualPhi must be an array of 16 integers"},
      {With(grid, "residualH", "[0,0,0,256,0,0,0,0,0,0,0,0,0,0,0,0]"),
       "residualH[3] must be an integer from -256 to 255, not 256"},
      {With(datum, "sourceName", "5"), "sourceName must be a text of at most 31 ISO 8859-1"},
      {With(datum, "targetName", "\"" + many + "\""), "targetName must be a text of at most 31"},
      {With(datum, "targetName", "\"\u0141\""), "targetName must be a text of at most 31"},
      {With(datum, "targetName", "\"\xFF\""), "not a JSON object"},
  };
  for (const auto& [line, error] : cases) {
    try {
      ParseJsonLine(line);
      ADD_FAILURE() << line;
    } catch (const FieldError& thrown) {
      EXPECT_EQ(std::string(thrown.what()).substr(0, error.size()), error);
    }
  }
}

}  // namespace
}  // namespace velta_tool::rtcm3
