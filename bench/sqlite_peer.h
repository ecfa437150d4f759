#pragma once

#include <sqlite3.h>

#include <cstdint>
#include <filesystem>
#include <memory>

#include "workload.h"

/// The same records in an SQLite file: a row an entry, its area in an R*Tree, a transaction a set,
/// synchronous FULL, which is the default.
namespace velta_bench {

class SqlitePeer {
 public:
  explicit SqlitePeer(const std::filesystem::path& path);

  /// Makes the tables in a new file.
  void MakeTables();

  void Begin() { Run("BEGIN"); }
  void Commit() { Run("COMMIT"); }
  /// Adds the set's entry unless one of its name is there.
  void Ingest(const MessageSet& set);
  /// Looks for the first entry whose area holds the position.
  /// \return false when there is none
  bool FindArea(const Position& position);
  /// Walks the entries and reads all of each.
  /// \return number of entries
  std::size_t ReadAll();
  /// Copies the rows of another file, all new, in one transaction.
  void Merge(const std::filesystem::path& source);

 private:
  struct Close {
    void operator()(sqlite3* database) const { sqlite3_close(database); }
  };
  struct Finalize {
    void operator()(sqlite3_stmt* statement) const { sqlite3_finalize(statement); }
  };
  using Statement = std::unique_ptr<sqlite3_stmt, Finalize>;

  void Run(const char* sql);
  Statement Prepare(const char* sql);

  std::unique_ptr<sqlite3, Close> database_;
  Statement insert_;
  Statement insertArea_;
};

}  // namespace velta_bench
