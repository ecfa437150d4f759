#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <deque>
#include <functional>
#include <map>
#include <optional>
#include <vector>

#include "rtcm3/export.h"
#include "rtcm3/message.h"
#include "velta/rtcm_messages.h"

namespace orx::cs::velta::rtcm3 {

/// A datum message and the messages that belong to it, all of one System Identification Number.
class MessageSet {
 public:
  /// \return the message of a number, which lives as long as the set; null when it is not there
  VELTA_RTCM3_EXPORT const Message* Find(unsigned number) const;

  /// \return the 1021 or 1022; null when neither is there
  VELTA_RTCM3_EXPORT const Message* FindDatum() const;

  /// True when the datum message announces the message of a number, 1023 to 1027.
  VELTA_RTCM3_EXPORT bool Announces(unsigned number) const;

  /// True when the datum message is there and everything that it announces. A 1026 is not waited
  /// for, as the library does not take one.
  VELTA_RTCM3_EXPORT bool IsComplete() const;

  /// The numbers that are waited for; 1021 stands for either datum message.
  VELTA_RTCM3_EXPORT std::vector<unsigned> Missing() const;

  /// The set as RTCMDataSupport takes it, with the flag of every message that is there, announced
  /// or not. Points into this object.
  VELTA_RTCM3_EXPORT MsgUtilized Records() const;

 private:
  friend class MessageSets;

  bool Awaits(unsigned number) const;

  std::array<std::optional<Message>, kMessageTypes> messages_;
};

/// A set that still waits for messages.
struct IncompleteSet {
  std::uint32_t systemId;         ///< its System Identification Number
  std::vector<unsigned> missing;  ///< as MessageSet::Missing() has them
  bool hadCompleteSet;            ///< an earlier set of the system was complete
};

/// What did not lead to a set.
struct CollectingCounts {
  std::uint64_t repeats = 0;  ///< messages that said what was there
  std::uint64_t givenUp = 0;  ///< incomplete sets that another datum message ended
  std::uint64_t dropped = 0;  ///< messages that waited too long for the rest of their set
};

/// Collects the messages of a stream into sets.
///
/// A message 1023 to 1027 belongs to the newest datum message of its System Identification Number;
/// what comes before the first one belongs to that. A set is handed over as soon as it is complete,
/// and again for each message that comes new or different after that: a rover's next grid does not
/// wait for the next datum message. Whatever comes different while a set waits is handed over, in
/// its turn, when the set is complete. What is not announced is not waited for, but taken. A datum
/// message that differs from the one before begins a new set.
class MessageSets {
 public:
  /// Takes a set, which is only lent.
  /// \return false: it could not be taken for now, as with a full disk, and is to be handed over
  ///     again when one of its messages is repeated
  using TakeSet = std::function<bool(const MessageSet& set)>;

  /// The most messages of a system that wait for the rest of their set. Beyond it the oldest goes.
  static constexpr std::size_t kMostWaiting = 1000;

  /// \param take called by Put(); what it throws passes through
  VELTA_RTCM3_EXPORT explicit MessageSets(TakeSet take);
  VELTA_RTCM3_EXPORT ~MessageSets();
  MessageSets(const MessageSets&) = delete;
  MessageSets& operator=(const MessageSets&) = delete;

  /// Takes a message and hands over what it completes.
  VELTA_RTCM3_EXPORT void Put(const Message& message);

  /// The sets that are not complete now, by their System Identification Numbers.
  VELTA_RTCM3_EXPORT std::vector<IncompleteSet> Incomplete() const;

  /// What was counted so far; lives as long as the object.
  const CollectingCounts& counts() const { return counts_; }

 private:
  struct System {
    MessageSet set;
    std::deque<Message> waiting;  ///< different from what is there, in their order
    bool hadCompleteSet = false;
    bool isTaken = false;  ///< the set as it is was handed over and taken
  };

  void HandOver(System& system);

  TakeSet take_;
  std::map<std::uint32_t, System> systems_;
  CollectingCounts counts_;
};

}  // namespace orx::cs::velta::rtcm3
