#pragma once

#include <cstdint>
#include <filesystem>
#include <string>

#include "support/numbered_set.h"
#include "velta/rtcm_data_support.h"
#include "velta/rtcm_generator.h"

/// What the benchmarks work on: message sets of one datum whose entries differ by their residual
/// grids, as a network service sends them to rovers on the road.
namespace velta_bench {

using MessageSet = velta_test::NumberedSet;

/// Where a query looks.
struct Position {
  double latitude;   ///< radians
  double longitude;  ///< radians
};

/// The middle of the grid of a set, and of its area of validity, which no other set shares.
Position MiddleOf(const MessageSet& set);

/// Between a set and the next one, in the area and the grid of neither.
/// \param number of the set, odd: behind these the room is for both
Position GapBehind(std::uint32_t number);

/// A query for a position.
struct Query {
  const char* name;
  /// \return true when an entry was found
  bool (*ask)(const orx::cs::velta::RTCMGenerator& generator, const Position& at);
};
extern const Query kQueries[2];

/// Name of the file that the sets go into.
inline const char* const kDatumFile = "ROVERS.dff";

/// Ingests the sets of the numbers from `first` on into a directory, in memory where the system
/// has a file system there, and copies the file to `path`.
void MakeDatumFile(const std::filesystem::path& path, std::uint32_t first, std::uint32_t count);

/// The bytes of the values of a file's first entry, without their names.
std::size_t ValueBytes(const std::filesystem::path& path);

/// Fails the benchmark program with a message: a figure for work that was not done is worthless.
void Require(bool done, const std::string& what);

}  // namespace velta_bench
