#include "report.h"

#include <algorithm>
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

std::string Milliseconds(double seconds) {
  char text[32];
  std::snprintf(text, sizeof text, seconds > 0 ? "%.3f ms" : "", seconds * 1e3);
  return text;
}

std::string Times(double of, double by) {
  char text[32];
  std::snprintf(text, sizeof text, by > 0 && of > 0 ? "%.2f" : "", of / by);
  return text;
}

bool IsTime(const Row& row) { return row.limit != kFileSize; }

}  // namespace

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
  std::nth_element(seconds.begin(),
                   seconds.begin() + static_cast<std::ptrdiff_t>(seconds.size() / 2),
                   seconds.end());
  const double median = seconds[seconds.size() / 2];
  const std::string& name = runs.front().run_name.function_name;
  for (Row& row : rows_) {
    for (const Side side : {Side::kVelta, Side::kLimit, Side::kPeer}) {
      if (name == NameOf(row.work, row.entries, side)) *FieldOf(row, side) = median;
    }
  }
}

void Report::Print() const {
  std::printf("%-26s %8s  %12s  %12s  %7s %6s  %12s %6s  %s\n", "work", "entries", "velta", "limit",
              "ratio", "goal", "SQLite", "ratio", "limit is to");
  for (const Row& row : rows_) {
    char goal[16] = "";
    if (row.goal) std::snprintf(goal, sizeof goal, "%.2f", *row.goal);
    const std::string velta = IsTime(row) ? Milliseconds(row.velta) : "";
    const std::string limit = IsTime(row) ? Milliseconds(row.beside) : "";
    const std::string ratio = Times(row.velta, row.beside);
    const bool missed = row.goal && row.beside > 0 && row.velta / row.beside > *row.goal;
    std::printf("%-26s %8lld  %12s  %12s  %7s %6s  %12s %6s  %s%s\n", row.work.c_str(),
                static_cast<long long>(row.entries), velta.c_str(), limit.c_str(), ratio.c_str(),
                goal, Milliseconds(row.peer).c_str(), Times(row.velta, row.peer).c_str(),
                row.limit.c_str(), missed ? "  MISSED" : "");
  }
}

void Report::WriteJson(const std::string& path) const {
  nlohmann::ordered_json rows = nlohmann::ordered_json::array();
  for (const Row& row : rows_) {
    nlohmann::ordered_json entry = {{"work", row.work},   {"entries", row.entries},
                                    {"limit", row.limit}, {"unit", IsTime(row) ? "s" : "bytes"},
                                    {"velta", row.velta}, {"beside", row.beside}};
    if (row.goal) entry["goal"] = *row.goal;
    if (row.beside > 0) entry["ratio"] = row.velta / row.beside;
    if (row.goal && row.beside > 0) entry["missed"] = row.velta / row.beside > *row.goal;
    if (row.peer > 0) {
      entry["sqlite"] = row.peer;
      entry["ratioToSqlite"] = row.velta / row.peer;
    }
    rows.push_back(entry);
  }
  std::ofstream(path) << rows.dump(2) << "\n";
}

}  // namespace velta_bench
