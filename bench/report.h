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

enum class Unit { kSeconds, kBytes };

/// A row of the report: a piece of work at a number of entries.
struct Row {
  std::string work = {};
  std::int64_t entries = 0;
  std::string limit = {};                     ///< what is measured beside it; empty: nothing
  std::optional<double> goal = std::nullopt;  ///< the most times the limit that the work may take
  std::optional<double> peerGoal = std::nullopt;  ///< the most times the peer's
  std::optional<double> most = std::nullopt;      ///< the most that it may take by itself
  Unit unit = Unit::kSeconds;
  double velta = 0.0;
  double beside = 0.0;  ///< the same of the limit
  double peer = 0.0;    ///< of the peer; 0: none
};

/// The one in the middle of some values.
double MedianOf(std::vector<double> values);

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

  const std::vector<Row>& rows() const { return rows_; }

 private:
  std::vector<Row> rows_;
};

}  // namespace velta_bench
