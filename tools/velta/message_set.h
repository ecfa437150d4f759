#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "rtcm3/message.h"
#include "velta/rtcm_data_support.h"
#include "velta/rtcm_messages.h"

namespace velta_tool {

/// The messages received for one System Identification Number since its last complete set.
class MessageSet {
 public:
  /// Takes a message; one of the same number makes room for it.
  /// \param support is asked which messages a datum message announces
  void Put(const rtcm3::Message& message, orx::cs::velta::RTCMDataSupport& support);

  /// What the set still needs, "1021 or 1022" for the datum message. A 1026 is never needed, as
  /// the library does not take one.
  std::vector<std::string> Missing() const;

  /// True when the set has a datum message and everything that this announces.
  bool Complete() const { return Missing().empty(); }

  bool Has(unsigned number) const;

  /// True when a datum message announces the message of that number, 1023 to 1027.
  bool Announces(unsigned number) const;

  /// The set as the library takes it; it points into this object.
  orx::cs::velta::MsgUtilized Records() const;

 private:
  template <class Record>
  const Record* Find() const;

  std::array<std::optional<rtcm3::Message>, rtcm3::kMessageTypes> messages_;
  orx::cs::velta::UtilizedMsgInfo announced_;
};

}  // namespace velta_tool
