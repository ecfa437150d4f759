#include "rtcm3/message_sets.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "support/worked_messages.h"

namespace velta_test {
namespace {

using namespace orx::cs::velta;
using namespace orx::cs::velta::rtcm3;

/// Puts messages of system 1, unless told otherwise, and notes what is handed over.
class MessageSetsTest : public testing::Test {
 protected:
  /// \param announced the numbers that it announces
  /// \param area tells datum messages apart
  void Datum(const std::vector<unsigned>& announced, int area = 0, unsigned system = 1) {
    auto datum = WorkedRecord<Rtcm1021>(1021);
    datum.utilizedMsgIndicator = 0;
    for (const unsigned number : announced) datum.utilizedMsgIndicator |= AnnouncementBit(number);
    datum.phiV = area;
    datum.systemId = system;
    sets_.Put(datum);
  }
  void Grid(int cell, unsigned system = 1) {
    auto grid = WorkedRecord<Rtcm1023>(1023);
    grid.phi0 = cell;
    grid.systemId = system;
    sets_.Put(grid);
  }
  void Projection() {
    auto projection = WorkedRecord<Rtcm1025>(1025);
    projection.systemId = 1;
    sets_.Put(projection);
  }
  /// What was handed over since the last call: the numbers of each set, a grid with its cell.
  std::vector<std::string> HandedOver() { return std::exchange(handedOver_, {}); }

  bool isTaken_ = true;
  std::vector<std::string> handedOver_;
  MessageSets sets_{[this](const MessageSet& set) {
    const MsgUtilized records = set.Records();
    std::string numbers;
    if (records.msg1021) numbers += "1021";
    if (records.info.use1023) numbers += " 1023:" + std::to_string(records.msg1023->phi0);
    if (records.info.use1025) numbers += " " + std::to_string(records.msg1025->messageType);
    handedOver_.push_back(numbers);
    return isTaken_;
  }};
};

using Sets = std::vector<std::string>;

TEST_F(MessageSetsTest, SetIsHandedOverWhenAllThatItAnnouncesHasComeInAnyOrder) {
  Grid(1);
  Datum({1023, 1025});
  EXPECT_EQ(HandedOver(), Sets());
  Projection();
  EXPECT_EQ(HandedOver(), Sets{"1021 1023:1 25"});
  Datum({1026}, 2);
  EXPECT_EQ(HandedOver(), Sets{"1021"}) << "a 1026 is not waited for";
}

TEST_F(MessageSetsTest, WhatComesNewOrDifferentIsHandedOverAtOnceAndARepeatIsNot) {
  Datum({1023});
  Grid(1);
  EXPECT_EQ(HandedOver(), Sets{"1021 1023:1"});
  Grid(2);
  EXPECT_EQ(HandedOver(), Sets{"1021 1023:2"});
  Projection();
  EXPECT_EQ(HandedOver(), Sets{"1021 1023:2 25"}) << "it was not announced";
  Grid(2);
  Projection();
  Datum({1023});
  EXPECT_EQ(HandedOver(), Sets());
  EXPECT_EQ(sets_.counts().repeats, 3U);
}

TEST_F(MessageSetsTest, WhatComesWhileASetWaitsIsHandedOverInItsTurn) {
  Grid(1);
  Grid(2);
  Datum({1023, 1025});
  Grid(3);
  Projection();
  EXPECT_EQ(HandedOver(), (Sets{"1021 1023:1 25", "1021 1023:2 25", "1021 1023:3 25"}));
}

TEST_F(MessageSetsTest, AnotherDatumMessageBeginsANewSet) {
  Datum({1023});
  Datum({1023}, 2);
  EXPECT_EQ(sets_.counts().givenUp, 1U);
  EXPECT_FALSE(sets_.Incomplete().at(0).hadCompleteSet);
  Grid(1);
  EXPECT_EQ(HandedOver(), Sets{"1021 1023:1"});
  Datum({1023, 1025}, 3);
  const IncompleteSet waiting = sets_.Incomplete().at(0);
  EXPECT_TRUE(waiting.hadCompleteSet);
  EXPECT_EQ(waiting.missing, (std::vector<unsigned>{1023, 1025}));
  EXPECT_EQ(HandedOver(), Sets());
}

TEST_F(MessageSetsTest, SystemsAreKeptApart) {
  Datum({1023}, 0, 1);
  Datum({1023}, 0, 2);
  Grid(5, 2);
  EXPECT_EQ(HandedOver(), Sets{"1021 1023:5"});
  EXPECT_EQ(sets_.Incomplete().at(0).systemId, 1U);
  EXPECT_EQ(sets_.Incomplete().size(), 1U);
}

TEST_F(MessageSetsTest, SetThatCouldNotBeTakenIsHandedOverAgainWithARepeat) {
  isTaken_ = false;
  Datum({});
  isTaken_ = true;
  Datum({});
  Datum({});
  EXPECT_EQ(HandedOver(), (Sets{"1021", "1021"}));
}

TEST_F(MessageSetsTest, WhatWaitsForEverIsBounded) {
  constexpr int kMost = MessageSets::kMostWaiting;
  for (int cell = 0; cell < kMost + 3; ++cell) Grid(cell);
  EXPECT_EQ(sets_.counts().dropped, 2U);
  Datum({1023});
  const Sets sets = HandedOver();
  EXPECT_EQ(sets.size(), kMost + 1U);
  EXPECT_EQ(sets.front(), "1021 1023:0");
  EXPECT_EQ(sets.at(1), "1021 1023:3");
}

}  // namespace
}  // namespace velta_test
