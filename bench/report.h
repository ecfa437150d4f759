#pragma once

#include <benchmark/benchmark.h>

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

/// The figures of a run as ratios beside their limits.
namespace velta_bench {

/// Whose time a benchmark measures.
enum class Side { kVelta, kLimit, kPeer };

/// The limit of work that is measured in bytes, not in seconds.
inline constexpr const char* kFileSize = "the file's size";

/// A row of the report: a piece of work at a number of entries.
struct Row {
  std::string work;
  std::int64_t entries = 0;
  std::string limit;           ///< what is measured beside it; empty: a note of its own
  std::optional<double> goal;  ///< the most times the limit that the work may take
  double velta = 0.0;          ///< seconds; of memory, bytes
  double beside = 0.0;         ///< the same of the limit
  double peer = 0.0;           ///< seconds of the peer; 0: none
};

/// Collects the rows of a run.
class Report : public benchmark::BenchmarkReporter {
 public:
  /// Adds a row behind those of the same work. What is timed for it is registered under the names
  /// that NameOf gives.
  void Add(const Row& row);
  static std::string NameOf(const std::string& work, std::int64_t entries, Side side);

  bool ReportContext(const Context&) override { return true; }
  /// Takes the median of each benchmark's repetitions.
  void ReportRuns(const std::vector<Run>& runs) override;

  /// A table for people.
  void Print() const;
  void WriteJson(const std::string& path) const;

  std::vector<Row>& rows() { return rows_; }

 private:
  std::vector<Row> rows_;
};

}  // namespace velta_bench
