#include "rtcm3/frame.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <sstream>
#include <stdexcept>
#include <streambuf>
#include <string>
#include <vector>

#include "tools/worked_messages.h"

namespace velta_tool::rtcm3 {
namespace {

/// What a reader makes of a stream.
struct Found {
  std::vector<std::string> payloads;
  FrameCounts counts;

  explicit Found(const std::string& stream) {
    std::stringbuf in(stream);
    FrameReader reader(in, counts);
    while (const auto payload = reader.Next())
      payloads.emplace_back(payload->begin(), payload->end());
  }
};

std::string Frame(const std::string& payload) {
  std::string frame;
  AppendFrame(payload, frame);
  return frame;
}

const std::string kFirst = Frame("first payload");
const std::string kSecond = Frame("second");
const std::vector<std::string> kBoth = {"first payload", "second"};

TEST(FrameReader, FindsTheFramesAmongEverythingElse) {
  std::string wrongCrc = kFirst;
  wrongCrc.back() = static_cast<char>(wrongCrc.back() ^ 1);
  const struct {
    const char* what;
    std::string stream;
    std::vector<std::string> payloads;
    std::uint64_t skippedBytes;
    std::uint64_t badCrcs;
  } cases[] = {
      {"nothing", "", {}, 0, 0},
      {"no frame", "plain text", {}, 10, 0},
      {"frames one after another", kFirst + kSecond, kBoth, 0, 0},
      {"noise around", "abc" + kFirst + "de" + kSecond + "\xD3", kBoth, 6, 0},
      {"preamble right before a frame", "\xD3" + kFirst + "\xD3" + kSecond, kBoth, 2, 0},
      {"preamble with a length that swallows a frame",
       std::string("\xD3\0\x13", 3) + kFirst + kSecond, kBoth, 3, 1},
      {"preamble with a length beyond the end", std::string("\xD3\x03\xFF", 3) + kFirst + kSecond,
       kBoth, 3, 0},
      {"preamble inside a broken frame",
       std::string("\xD3\0\x02\xD3", 4) + kFirst,
       {kBoth[0]},
       4,
       1},
      {"reserved bits set", "\xD3\x04" + kFirst, {kBoth[0]}, 2, 0},
      {"wrong checksum", wrongCrc + kSecond, {kBoth[1]}, wrongCrc.size(), 1},
      {"empty payload", Frame("") + kSecond, {"", "second"}, 0, 0},
      {"longest payload",
       Frame(std::string(kMaxPayload, '\xD3')),
       {std::string(kMaxPayload, '\xD3')},
       0,
       0},
  };
  for (const auto& [what, stream, payloads, skippedBytes, badCrcs] : cases) {
    const Found found(stream);
    EXPECT_EQ(found.payloads, payloads) << what;
    EXPECT_EQ(found.counts.bytes, stream.size()) << what;
    EXPECT_EQ(found.counts.frames, payloads.size()) << what;
    EXPECT_EQ(found.counts.skippedBytes, skippedBytes) << what;
    EXPECT_EQ(found.counts.badCrcs, badCrcs) << what;
  }
}

TEST(FrameReader, EveryFlippedBitIsNoticedAndTheNextFrameFound) {
  for (std::size_t bit = 0; bit < kFirst.size() * 8; ++bit) {
    std::string broken = kFirst;
    broken[bit / 8] = static_cast<char>(broken[bit / 8] ^ 1 << bit % 8);
    EXPECT_EQ(Found(broken + kSecond).payloads, std::vector{kBoth[1]}) << bit;
  }
}

TEST(FrameReader, StreamCutAnywhereGivesTheWholeFrames) {
  const std::string stream = kFirst + kSecond;
  for (std::size_t size = 0; size < stream.size(); ++size) {
    const std::size_t whole = size >= kFirst.size() ? 1 : 0;
    const Found found(stream.substr(0, size));
    EXPECT_EQ(found.payloads.size(), whole) << size;
    EXPECT_EQ(found.counts.skippedBytes, size - whole * kFirst.size()) << size;
  }
}

TEST(FrameReader, LongStreamLosesNothingWhereItsBufferEnds) {
  std::string stream;
  std::vector<std::string> payloads;
  for (std::size_t i = 0; stream.size() < 300'000; ++i) {
    payloads.emplace_back(i * 37 % (kMaxPayload + 1), static_cast<char>(i));
    stream += Frame(payloads.back()) + std::string(i % 5, '.');
  }
  EXPECT_EQ(Found(stream).payloads, payloads);
}

/// A stream that delivers its bytes in small pieces and must not be asked for more than it has.
class LiveStream : public std::streambuf {
 public:
  explicit LiveStream(std::string bytes) : bytes_(std::move(bytes)) {}

 private:
  int_type underflow() override {
    constexpr std::size_t kPiece = 5;
    if (next_ == bytes_.size()) throw std::logic_error("waits for ever");
    const std::size_t size = std::min(kPiece, bytes_.size() - next_);
    setg(bytes_.data() + next_, bytes_.data() + next_, bytes_.data() + next_ + size);
    next_ += size;
    return traits_type::to_int_type(*gptr());
  }

  std::string bytes_;
  std::size_t next_ = 0;
};

TEST(FrameReader, LiveFrameIsHandedOutBeforeMoreIsAwaited) {
  LiveStream stream(kFirst + "?" + kSecond);
  FrameCounts counts;
  FrameReader reader(stream, counts);
  for (const std::string& expected : kBoth) {
    const auto payload = reader.Next();
    ASSERT_TRUE(payload);
    EXPECT_EQ(std::string(payload->begin(), payload->end()), expected);
  }
}

TEST(MessageReader, CountsWhatItPassesOver) {
  const auto worked = velta_test::WorkedMessages();
  std::string shortMessage = worked[4].frame.substr(3, 20);
  std::stringbuf in(Frame("\x3E\xD0") + worked[4].frame + Frame(shortMessage) + "noise" +
                    worked[0].frame);
  StreamCounts counts;
  MessageReader reader(in, counts);
  std::vector<unsigned> numbers;
  while (const Message* message = reader.Next()) numbers.push_back(NumberOf(*message));
  EXPECT_EQ(numbers, (std::vector<unsigned>{1025, 1021}));
  EXPECT_EQ(Summary(counts),
            "frames: 4 (1021: 1, 1025: 1, other: 1, too short: 1); "
            "passed over: 5 bytes, 0 wrong checksums");
}

}  // namespace
}  // namespace velta_tool::rtcm3
