#include "report.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <fstream>
#include <nlohmann/json.hpp>

namespace velta_bench {
namespace {

double* FieldOf(Row& row, Side side) {
  switch (side) {
    case Side::kVelta:
      return &row.velta;
    case Side::kLimit:
      return &row.beside;
    case Side::kPeer:
      return &row.peer;
  }
  return nullptr;
}

/// Nothing for 0.
std::string Amount(double value, Unit unit) {
  constexpr double kLargeBytes = 1e5;
  char text[32] = "";
  if (value == 0) return text;
  if (unit == Unit::kSeconds) {
    std::snprintf(text, sizeof text, "%.4f ms", value * 1e3);
  } else if (std::abs(value) < kLargeBytes) {
    std::snprintf(text, sizeof text, "%.0f bytes", value);
  } else {
    std::snprintf(text, sizeof text, "%.3f MB", value * 1e-6);
  }
  return text;
}

std::string Times(double of, double by) {
  char text[32];
  std::snprintf(text, sizeof text, by > 0 && of > 0 ? "%.2f" : "", of / by);
  return text;
}

std::string Goal(const std::optional<double>& goal) {
  char text[32] = "";
  if (goal) std::snprintf(text, sizeof text, "%.4g", *goal);
  return text;
}

bool IsAbove(double of, double by, const std::optional<double>& goal) {
  return goal && by > 0 && of / by > *goal;
}

bool IsMissed(const Row& row) {
  return IsAbove(row.velta, row.beside, row.goal) || IsAbove(row.velta, row.peer, row.peerGoal) ||
         IsAbove(row.velta, 1.0, row.most);
}

}  // namespace

double MedianOf(std::vector<double> values) {
  const auto middle = values.begin() + static_cast<std::ptrdiff_t>(values.size() / 2);
  std::nth_element(values.begin(), middle, values.end());
  return *middle;
}

void Report::Add(const Row& row) {
  const auto last = std::find_if(rows_.rbegin(), rows_.rend(),
                                 [&](const Row& other) { return other.work == row.work; });
  rows_.insert(last == rows_.rend() ? rows_.end() : last.base(), row);
}

std::string Report::NameOf(const std::string& work, std::int64_t entries, Side side) {
  return work + "/" + std::to_string(entries) + "/" + std::to_string(static_cast<int>(side));
}

void Report::ReportRuns(const std::vector<Run>& runs) {
  std::vector<double> seconds;
  for (const Run& run : runs) {
    if (run.run_type != Run::RT_Iteration || run.iterations == 0) continue;
    seconds.push_back(run.real_accumulated_time / static_cast<double>(run.iterations));
  }
  if (seconds.empty()) return;
  const double median = MedianOf(seconds);
  const std::string& name = runs.front().run_name.function_name;
  for (Row& row : rows_) {
    for (const Side side : {Side::kVelta, Side::kLimit, Side::kPeer}) {
      if (name == NameOf(row.work, row.entries, side)) *FieldOf(row, side) = median;
    }
  }
}

void Report::Print() const {
  constexpr const char* kFormat = "%-35s %7s  %12s %10s  %12s %6s %6s  %12s %6s %6s  %s%s\n";
  std::printf(kFormat, "work", "entries", "velta", "at most", "limit", "ratio", "goal", "SQLite",
              "ratio", "goal", "limit is to", "");
  for (const Row& row : rows_) {
    std::printf(kFormat, row.work.c_str(), std::to_string(row.entries).c_str(),
                Amount(row.velta, row.unit).c_str(),
                Amount(row.most.value_or(0.0), row.unit).c_str(),
                Amount(row.beside, row.unit).c_str(), Times(row.velta, row.beside).c_str(),
                Goal(row.goal).c_str(), Amount(row.peer, row.unit).c_str(),
                Times(row.velta, row.peer).c_str(), Goal(row.peerGoal).c_str(), row.limit.c_str(),
                IsMissed(row) ? "  MISSED" : "");
  }
}

void Report::WriteJson(const std::string& path) const {
  nlohmann::ordered_json rows = nlohmann::ordered_json::array();
  for (const Row& row : rows_) {
    nlohmann::ordered_json entry = {{"work", row.work},
                                    {"entries", row.entries},
                                    {"unit", row.unit == Unit::kSeconds ? "s" : "bytes"},
                                    {"velta", row.velta}};
    if (row.most) entry["most"] = *row.most;
    if (row.beside > 0) {
      entry["limit"] = row.limit;
      entry["beside"] = row.beside;
      entry["ratio"] = row.velta / row.beside;
    }
    if (row.goal) entry["goal"] = *row.goal;
    if (row.peer > 0) {
      entry["sqlite"] = row.peer;
      entry["ratioToSqlite"] = row.velta / row.peer;
    }
    if (row.peerGoal) entry["goalToSqlite"] = *row.peerGoal;
    if (row.most || row.goal || row.peerGoal) entry["missed"] = IsMissed(row);
    rows.push_back(entry);
  }
  std::ofstream(path) << rows.dump(2) << "\n";
}

}  // namespace velta_bench
