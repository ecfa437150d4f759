#pragma once

#include <cstdint>
#include <filesystem>
#include <string>

/// Work that is done once, in a process that has just been started.
namespace velta_bench {

/// What a process does besides the queries for a position, which go by their own names.
inline constexpr const char* kDoNothing = "nothing";
inline constexpr const char* kAskForAll = "getAllDatums";
inline constexpr const char* kIngest = "ingest";

/// The option behind which such a process gets its work, file and number.
inline constexpr const char* kFreshOption = "--fresh";

struct FreshRun {
  double seconds;  ///< of the call alone
  double peak;     ///< the most memory that the process has had in use, bytes
};

/// Starts this program again and has it work.
/// \param file the datum file
/// \param number of the set that is ingested, or in whose middle a query is
FreshRun RunInFreshProcess(const std::string& work, const std::filesystem::path& file,
                           std::uint32_t number);

/// What such a process does; tells the other how it went by its output.
void WorkAsFreshProcess(const std::string& work, const std::filesystem::path& file,
                        std::uint32_t number);

}  // namespace velta_bench
