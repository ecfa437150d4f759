#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "files.h"
#include "rtcm3/message_reader.h"
#include "velta/result_codes.h"

namespace velta_tool {

namespace rtcm3 = orx::cs::velta::rtcm3;

/// One of the two files that a set goes into.
struct IngestedPart {
  std::vector<unsigned> messages;  ///< what goes there
  std::string file;                ///< name without its directory
  bool isThere = false;            ///< the file has the entry
  bool added = false;              ///< it has got it now
  /// Labels of the values that differ from the received ones; the file's stay.
  std::vector<std::string> different;
  bool isDifferenceNew = false;  ///< that has not been told yet
};

struct IngestedSet {
  std::uint32_t systemId;
  orx::cs::velta::ResultCode result;
  std::vector<IngestedPart> parts;
  std::vector<std::string> changed;    ///< fields of the datum message that changed
  std::vector<unsigned> notAnnounced;  ///< received, but not announced by the datum message

  bool IsDone() const { return result == orx::cs::velta::kSuccess; }
  /// True when a file has got an entry.
  bool HasAdded() const;
  /// True when a file has other values than received.
  bool IsDifferent() const;
  /// True when there is something to tell that has not been told.
  bool HasNews() const;
};

struct IngestTotals {
  std::size_t ingested = 0;
  std::size_t alreadyThere = 0;  ///< of those ingested, with the same values
  std::size_t different = 0;     ///< of those ingested, there with other values
  std::size_t failed = 0;
  std::size_t incomplete = 0;
  std::uint64_t repeats = 0;  ///< messages that brought nothing new
  rtcm3::StreamCounts stream;
  std::string datumDirectory;
  std::string projectionDirectory;
};

/// Tells on standard output what became of each set, as text or as JSON lines.
class IngestReport {
 public:
  IngestReport(bool json, Output& out) : json_(json), out_(out) {}

  void Add(const IngestedSet& set);
  void AddIncomplete(std::uint32_t systemId, const std::vector<std::string>& missing);
  void Close(const IngestTotals& totals);

 private:
  bool json_;
  Output& out_;
};

}  // namespace velta_tool
