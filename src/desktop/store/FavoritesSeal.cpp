#include "desktop/store/FavoritesSeal.h"

#include <sqlite3.h>

#include "desktop/raii/SQLite.h"
#include "platform/foundation/Hash.h"

namespace nimbo {

namespace {

constexpr int kCheckedColumns = 5;  // all but the checksum

/// The sum of a row's columns from `first` up to `end`, their types included.
std::int64_t sumOfColumns(const SQLiteStatement& row, int first, int end) {
  std::uint64_t sum = hashOfBytes("favorite");
  for (int i = first; i < end; ++i) {
    const auto type = static_cast<int>(row.type(i));  // before the value is asked for as bytes, which may change it
    const Bytes value = row.bytes(i);
    sum = hashOfBytes(std::to_string(type) + " " + std::to_string(value.size()) + "\n", sum);
    sum = hashOfBytes({reinterpret_cast<const char*>(value.data()), value.size()}, sum);
  }
  return static_cast<std::int64_t>(sum);
}

std::string statement(const char* rest) { return std::string("SELECT ") + kSealedFavoriteColumns + rest; }

struct Seal {
  std::int64_t count = 0;
  std::int64_t digest = 0;
};

/// The seal that fits the checksums of the rows, and what the stored one says besides.
Seal fittingSeal(SQLiteConnection& connection) {
  Seal seal;
  SQLiteStatement said = connection.prepare("SELECT wereSet, lostWith FROM favorites_seal WHERE id = 1");
  auto digest = static_cast<std::uint64_t>(said.step() ? sumOfColumns(said, 0, 2) : 0);
  SQLiteStatement rows = connection.prepare("SELECT checksum FROM favorites ORDER BY position, id");
  for (; rows.step(); ++seal.count) digest = hashOfBytes(std::to_string(rows.integer(0)) + "\n", digest);
  seal.digest = static_cast<std::int64_t>(digest);
  return seal;
}

}  // namespace

bool favoriteFits(const SQLiteStatement& row) {
  return row.type(kCheckedColumns) == SQLiteStatement::ColumnType::integer &&
         row.integer(kCheckedColumns) == sumOfColumns(row, 0, kCheckedColumns);
}

bool favoritesFit(SQLiteConnection& connection) {
  SQLiteStatement stored = connection.prepare("SELECT count, digest FROM favorites_seal WHERE id = 1");
  if (!stored.step()) return false;
  SQLiteStatement rows = connection.prepare(statement(" FROM favorites"));
  while (rows.step())
    if (!favoriteFits(rows)) return false;
  const Seal fitting = fittingSeal(connection);
  return stored.integer(0) == fitting.count && stored.integer(1) == fitting.digest;
}

void requireFittingFavorites(SQLiteConnection& connection) {
  if (!favoritesFit(connection)) throw SQLiteFailure(SQLITE_CORRUPT, "the favorites do not fit their checksums");
}

void sealFavorites(SQLiteConnection& connection) {
  SQLiteStatement set = connection.prepare("UPDATE favorites SET checksum = ? WHERE id = ?");
  SQLiteStatement rows = connection.prepare(statement(" FROM favorites"));
  std::vector<std::pair<std::int64_t, std::int64_t>> sums;  // not written while the rows are read
  while (rows.step())
    if (!favoriteFits(rows)) sums.emplace_back(rows.integer(0), sumOfColumns(rows, 0, kCheckedColumns));
  for (const auto& [id, sum] : sums) {
    set.bind(1, sum);
    set.bind(2, id);
    set.step();
    set.reset();
  }
  const Seal seal = fittingSeal(connection);
  SQLiteStatement keep = connection.prepare("UPDATE favorites_seal SET count = ?, digest = ? WHERE id = 1");
  keep.bind(1, seal.count);
  keep.bind(2, seal.digest);
  keep.step();
}

}  // namespace nimbo
