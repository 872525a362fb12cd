#pragma once

#include "desktop/raii/SQLiteConnection.h"

namespace nimbo {

/// Version of the tables, kept as the database's user_version.
inline constexpr std::int64_t kStateSchemaVersion = 1;

/// Puts the tables into an empty database, which from then on keeps a write-ahead log: all or nothing. Throws
/// SQLiteFailure.
void createStateSchema(SQLiteConnection& connection);

struct SalvagedCounts {
  std::size_t favorites = 0;
  std::size_t settings = 0;
};

/// Setting with the path of a damaged database whose favourites could not all be read; there until the user changes his
/// favourites.
inline constexpr std::string_view kFavoritesLostKey = "Nimbo.Favorites.lostWith";

/// Copies the favourites and settings that can still be read in a damaged file, which stays as it is, and whose tables
/// may be missing; `aside` is the name that it will have. Throws SQLiteFailure when the copies cannot be kept.
SalvagedCounts salvageState(const std::filesystem::path& damaged, const std::filesystem::path& aside,
                            SQLiteConnection& into);

}  // namespace nimbo
