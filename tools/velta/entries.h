#pragma once

#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "description.h"
#include "orxregistry/in_file_key.h"
#include "orxregistry/registry_key.h"
#include "projmath/rect_rgn.h"
#include "velta/datum_data.h"
#include "velta/rtcm_messages.h"

/// The entries of datum and projection files as they are stored, and as the library would store
/// what has been received.
namespace velta_tool {

/// An entry of a file.
struct Entry {
  std::string name;
  std::optional<Description> content;                   ///< nothing when it is incomplete
  std::optional<orx::cs::projmath::TRectRgn> area;      ///< of validity, of a datum; radians
  std::optional<orx::cs::projmath::TRectRgn> gridArea;  ///< radians, of a plane grid metres
};

/// What a file holds.
struct Entries {
  std::string error;  ///< what is wrong with the file; empty when nothing is
  std::string name;   ///< of the container key: the datum's
  std::vector<Entry> entries;
};

/// Reads a datum file or a projection file, by its extension.
Entries ReadEntries(const std::string& file);

/// A place on the ellipsoid, radians, or in the plane, metres.
struct Position {
  double north;
  double east;
};

/// The name of the entry of which the library makes a message: the first whose area, or whose
/// residual grid, holds the position; of a projection's parameters the first of all.
/// \param message number of the message, 1021 standing for a 1022, 1025 for a 1027
/// \return empty when there is none; also when an entry in front is not readable, at which the
///     library ends its search
std::string UsedFor(unsigned message, const std::string& file, const Position& position);

/// True when a file has an entry of the other kind than its extension says.
bool HoldsOtherKind(const std::string& file);

/// The datum message of a set that has one.
const orx::cs::velta::RtcmBasicTransformMessage& BasicMessage(
    const orx::cs::velta::MsgUtilized& set);

/// What the datum message of a set and its residual grid describe.
orx::cs::velta::DatumData DatumOf(const orx::cs::velta::MsgUtilized& set);

/// What a message set becomes: an entry's name, and what would be stored.
struct ReceivedEntry {
  unsigned message;  ///< number of the one that makes the entry
  std::wstring name;
  Description content;
};
ReceivedEntry ReceivedDatum(const orx::cs::velta::MsgUtilized& set);
/// \return those that the library takes, in the order in which it does: of a 1025, of a 1027
std::vector<ReceivedEntry> ReceivedProjections(const orx::cs::velta::MsgUtilized& set);

/// Asks the tree of a file that the library shares for an entry.
/// \param file whole name, by whose extension the kind is known
/// \return the entry; nothing when there is none of that name, or no such file
std::optional<Entry> FindEntry(const std::wstring& file, const std::wstring& name);

}  // namespace velta_tool
