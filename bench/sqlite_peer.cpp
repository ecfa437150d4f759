#include "sqlite_peer.h"

#include <cstring>
#include <string>
#include <vector>

#include "orxutils/orx_string.h"

namespace velta_bench {
namespace {

/// The doubles of an entry, in the columns behind the name: area, parameters, ellipsoids, grid.
struct Row {
  double area[4];
  double parameters[13];
  double ellipsoids[4];
  double boundaries[6];
  double means[3];
  double residuals[48];
};

struct WholeRow {
  std::string name;
  std::string source;
  int numbers[8];
  Row row;
};

template <std::size_t count>
void Bind(sqlite3_stmt* statement, int column, const double (&values)[count]) {
  sqlite3_bind_blob(statement, column, values, sizeof values, SQLITE_TRANSIENT);
}

Row RowOf(const MessageSet& set) {
  constexpr double kUnit = 9.69627362219072e-06;  // radians
  Row row = {};
  row.area[0] = (set.datum.phiV - set.datum.dPhiV * 0.5) * kUnit;
  row.area[1] = set.datum.dPhiV * kUnit;
  row.area[2] = (set.datum.lambdaV - set.datum.dLambdaV * 0.5) * kUnit;
  row.area[3] = set.datum.dLambdaV * kUnit;
  for (int i = 0; i < 16; ++i) {
    row.residuals[i] = set.grid.residualPhi[i];
    row.residuals[16 + i] = set.grid.residualLambda[i];
    row.residuals[32 + i] = set.grid.residualH[i];
  }
  return row;
}

}  // namespace

SqlitePeer::SqlitePeer(const std::filesystem::path& path) {
  sqlite3* database = nullptr;
  Require(sqlite3_open(path.string().c_str(), &database) == SQLITE_OK, "opening the peer's file");
  database_.reset(database);
}

void SqlitePeer::MakeTables() {
  Run("PRAGMA journal_mode=WAL");
  Run("CREATE TABLE entry (name TEXT PRIMARY KEY, method INT, height INT, "
      "source TEXT, area BLOB, parameters BLOB, ellipsoids BLOB, rows INT, columns INT, "
      "boundaries BLOB, horShift INT, vertShift INT, horMethod INT, vertMethod INT, means BLOB, "
      "residuals BLOB)");
  Run("CREATE VIRTUAL TABLE area USING rtree (id, south, north, west, east)");
}

void SqlitePeer::Run(const char* sql) {
  Require(sqlite3_exec(database_.get(), sql, nullptr, nullptr, nullptr) == SQLITE_OK, sql);
}

SqlitePeer::Statement SqlitePeer::Prepare(const char* sql) {
  sqlite3_stmt* statement = nullptr;
  Require(sqlite3_prepare_v2(database_.get(), sql, -1, &statement, nullptr) == SQLITE_OK, sql);
  return Statement(statement);
}

void SqlitePeer::Ingest(const MessageSet& set) {
  if (!insert_) {
    insert_ = Prepare("INSERT OR IGNORE INTO entry VALUES (?,?,?,?,?,?,?,4,4,?,?,?,?,?,?,?)");
    insertArea_ = Prepare("INSERT INTO area VALUES (?,?,?,?,?)");
  }
  const Row row = RowOf(set);
  sqlite3_stmt* const insert = insert_.get();
  sqlite3_bind_text(insert, 1, orx::Narrow(set.EntryName()).c_str(), -1, SQLITE_TRANSIENT);
  sqlite3_bind_int64(insert, 2, set.datum.computationIndicator);
  sqlite3_bind_int64(insert, 3, set.datum.heightIndicator);
  sqlite3_bind_text(insert, 4, set.datum.sourceName.c_str(), -1, SQLITE_TRANSIENT);
  Bind(insert, 5, row.area);
  Bind(insert, 6, row.parameters);
  Bind(insert, 7, row.ellipsoids);
  Bind(insert, 8, row.boundaries);
  sqlite3_bind_int(insert, 9, set.grid.horShiftIndicator);
  sqlite3_bind_int(insert, 10, set.grid.vertShiftIndicator);
  sqlite3_bind_int64(insert, 11, set.grid.horInterpolationMethod);
  sqlite3_bind_int64(insert, 12, set.grid.vertInterpolationMethod);
  Bind(insert, 13, row.means);
  Bind(insert, 14, row.residuals);
  Require(sqlite3_step(insert) == SQLITE_DONE, "inserting a row");
  sqlite3_reset(insert);
  if (sqlite3_changes(database_.get()) == 0) return;
  sqlite3_stmt* const area = insertArea_.get();
  sqlite3_bind_int64(area, 1, sqlite3_last_insert_rowid(database_.get()));
  sqlite3_bind_double(area, 2, row.area[0]);
  sqlite3_bind_double(area, 3, row.area[0] + row.area[1]);
  sqlite3_bind_double(area, 4, row.area[2]);
  sqlite3_bind_double(area, 5, row.area[2] + row.area[3]);
  Require(sqlite3_step(area) == SQLITE_DONE, "inserting an area");
  sqlite3_reset(area);
}

bool SqlitePeer::FindArea(const Position& position) {
  const Statement walk = Prepare(
      "SELECT entry.area FROM area JOIN entry ON entry.rowid = id "
      "WHERE south <= ?1 AND north >= ?1 AND west <= ?2 AND east >= ?2 ORDER BY id");
  sqlite3_bind_double(walk.get(), 1, position.latitude);
  sqlite3_bind_double(walk.get(), 2, position.longitude);
  while (sqlite3_step(walk.get()) == SQLITE_ROW) {
    // The tree's own bounds are floats, rounded outwards.
    double area[4];
    std::memcpy(area, sqlite3_column_blob(walk.get(), 0), sizeof area);
    const bool inside = position.latitude >= area[0] && position.latitude <= area[0] + area[1] &&
                        position.longitude >= area[2] && position.longitude <= area[2] + area[3];
    if (inside) return true;
  }
  return false;
}

std::size_t SqlitePeer::ReadAll() {
  const Statement walk = Prepare("SELECT * FROM entry ORDER BY rowid");
  std::vector<WholeRow> rows;
  while (sqlite3_step(walk.get()) == SQLITE_ROW) {
    sqlite3_stmt* const at = walk.get();
    WholeRow& whole = rows.emplace_back();
    Row& row = whole.row;
    const auto take = [at](int column, auto& to) {
      std::memcpy(to, sqlite3_column_blob(at, column), sizeof to);
    };
    take(4, row.area);
    take(5, row.parameters);
    take(6, row.ellipsoids);
    take(9, row.boundaries);
    take(14, row.means);
    take(15, row.residuals);
    whole.name = reinterpret_cast<const char*>(sqlite3_column_text(at, 0));
    whole.source = reinterpret_cast<const char*>(sqlite3_column_text(at, 3));
    int* to = whole.numbers;
    for (const int column : {1, 2, 7, 8, 10, 11, 12, 13}) *to++ = sqlite3_column_int(at, column);
  }
  return rows.size();
}

void SqlitePeer::Merge(const std::filesystem::path& source) {
  Run(("ATTACH '" + source.string() + "' AS source").c_str());
  Run("BEGIN");
  // Behind the rows that are there, whose numbers are the same.
  Run("INSERT INTO area SELECT id + (SELECT max(rowid) FROM main.entry), south, north, west, east "
      "FROM source.area");
  Run("INSERT INTO main.entry SELECT * FROM source.entry ORDER BY rowid");
  Run("COMMIT");
  Run("DETACH source");
}

}  // namespace velta_bench
