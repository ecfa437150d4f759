#include "rtcm3/message_sets.h"

#include <algorithm>
#include <utility>
#include <variant>

namespace orx::cs::velta::rtcm3 {
namespace {

constexpr unsigned kLastMessage = kFirstMessage + kMessageTypes - 1;
constexpr unsigned kUnsupported = 1026;

bool IsDatum(const Message& message) { return NumberOf(message) < kFirstAnnounced; }

bool IsSame(const Message& a, const Message& b) { return DifferingFields(a, b).empty(); }

std::uint32_t IndicatorOf(const Message* datum) {
  if (const auto* const record = std::get_if<Rtcm1021>(datum)) return record->utilizedMsgIndicator;
  if (const auto* const record = std::get_if<Rtcm1022>(datum)) return record->utilizedMsgIndicator;
  return 0;
}

}  // namespace

const Message* MessageSet::Find(unsigned number) const {
  if (number < kFirstMessage || number - kFirstMessage >= messages_.size()) return nullptr;
  const auto& message = messages_[number - kFirstMessage];
  return message ? &*message : nullptr;
}

const Message* MessageSet::FindDatum() const {
  const Message* const found = Find(1021);
  return found ? found : Find(1022);
}

bool MessageSet::Announces(unsigned number) const {
  return (IndicatorOf(FindDatum()) & AnnouncementBit(number)) != 0;
}

bool MessageSet::Awaits(unsigned number) const {
  return Announces(number) && number != kUnsupported && !Find(number);
}

bool MessageSet::IsComplete() const {
  if (!FindDatum()) return false;
  for (unsigned number = kFirstAnnounced; number <= kLastMessage; ++number) {
    if (Awaits(number)) return false;
  }
  return true;
}

std::vector<unsigned> MessageSet::Missing() const {
  if (!FindDatum()) return {1021};
  std::vector<unsigned> missing;
  for (unsigned number = kFirstAnnounced; number <= kLastMessage; ++number) {
    if (Awaits(number)) missing.push_back(number);
  }
  return missing;
}

MsgUtilized MessageSet::Records() const {
  MsgUtilized records;
  records.msg1021 = std::get_if<Rtcm1021>(Find(1021));
  records.msg1022 = std::get_if<Rtcm1022>(Find(1022));
  records.msg1023 = std::get_if<Rtcm1023>(Find(1023));
  records.msg1024 = std::get_if<Rtcm1024>(Find(1024));
  records.msg1025 = std::get_if<Rtcm1025>(Find(1025));
  records.msg1026 = std::get_if<Rtcm1026>(Find(1026));
  records.msg1027 = std::get_if<Rtcm1027>(Find(1027));
  for (unsigned number = kFirstAnnounced; number <= kLastMessage; ++number) {
    records.info.*kMessageFlags[number - kFirstAnnounced] = Find(number) != nullptr;
  }
  if (const Message* const datum = FindDatum()) {
    records.info.systemId = static_cast<std::int32_t>(SystemIdOf(*datum));
  }
  return records;
}

MessageSets::MessageSets(TakeSet take) : take_(std::move(take)) {}

MessageSets::~MessageSets() = default;

void MessageSets::Put(const Message& message) {
  System& system = systems_[SystemIdOf(message)];
  const Message* const datum = system.set.FindDatum();
  if (datum && IsDatum(message) && !IsSame(*datum, message)) {
    if (!system.set.IsComplete()) ++counts_.givenUp;
    system.set = MessageSet();
    system.waiting.clear();
  }

  std::optional<Message>& held = system.set.messages_[message.index()];
  const auto isOfItsNumber = [&](const Message& other) { return other.index() == message.index(); };
  const auto waiting = std::find_if(system.waiting.rbegin(), system.waiting.rend(), isOfItsNumber);
  const Message* const newest = waiting != system.waiting.rend() ? &*waiting
                                : held                           ? &*held
                                                                 : nullptr;
  if (!newest) {
    held = message;
    system.isTaken = false;
  } else if (IsSame(*newest, message)) {
    ++counts_.repeats;
  } else {
    system.waiting.push_back(message);
  }

  if (!system.set.IsComplete()) {
    if (system.waiting.size() <= kMostWaiting) return;
    system.waiting.pop_front();
    ++counts_.dropped;
    return;
  }
  if (!system.isTaken) HandOver(system);
  while (!system.waiting.empty()) {
    const std::size_t index = system.waiting.front().index();
    system.set.messages_[index] = std::move(system.waiting.front());
    system.waiting.pop_front();
    HandOver(system);
  }
}

std::vector<IncompleteSet> MessageSets::Incomplete() const {
  std::vector<IncompleteSet> incomplete;
  for (const auto& [systemId, system] : systems_) {
    std::vector<unsigned> missing = system.set.Missing();
    if (!missing.empty()) {
      incomplete.push_back({systemId, std::move(missing), system.hadCompleteSet});
    }
  }
  return incomplete;
}

void MessageSets::HandOver(System& system) {
  system.hadCompleteSet = true;
  system.isTaken = false;  // also when it throws
  system.isTaken = take_(system.set);
}

}  // namespace orx::cs::velta::rtcm3
