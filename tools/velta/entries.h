#pragma once

#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "description.h"
#include "orxregistry/in_file_key.h"
#include "orxregistry/registry_key.h"
#include "velta/rtcm_messages.h"

/// The entries of datum and projection files as they are stored, and as the library would store
/// what has been received.
namespace velta_tool {

/// An entry of a file.
struct Entry {
  std::string name;
  std::optional<Description> content;  ///< nothing when it is incomplete
};

/// What a file holds.
struct Entries {
  std::uint32_t error = 0;  ///< the file's error state
  std::string name;         ///< of the container key: the datum's
  std::vector<Entry> entries;
};

/// Reads a datum file or a projection file, by its extension.
Entries ReadEntries(const std::string& file);

/// True when the file has entries of the kind that its extension says, and none of the other.
bool HoldsItsKind(const std::string& file);

/// The datum message of a set that has one.
const orx::cs::velta::RtcmBasicTransformMessage& BasicMessage(
    const orx::cs::velta::MsgUtilized& set);

/// Where a message set goes: the entries' names, and what would be stored.
struct ReceivedEntry {
  std::wstring name;
  Description content;
};
ReceivedEntry ReceivedDatum(const orx::cs::velta::MsgUtilized& set);
/// \return nothing when the set has no projection that the library takes
std::optional<ReceivedEntry> ReceivedProjection(const orx::cs::velta::MsgUtilized& set);

/// Asks the tree of a file that the library shares for an entry.
/// \param file whole name, by whose extension the kind is known
/// \return the entry; nothing when there is none of that name, or no such file
std::optional<Entry> FindEntry(const std::wstring& file, const std::wstring& name);

}  // namespace velta_tool
