#pragma once

#include "desktop/raii/SQLite.h"

namespace nimbo {

// Each favourite carries a checksum, and a row of its own, the seal, the number of all and a digest of them and of what
// it says itself, so that no byte that rots takes a favourite without a word. All throw SQLiteFailure.

/// The columns of `favorites` with which `favoriteFits` begins.
inline constexpr const char* kSealedFavoriteColumns = "id, position, kind, muid, content, checksum";

/// Whether the favourite in this row, of which `kSealedFavoriteColumns` were asked for, is what was sealed.
bool favoriteFits(const SQLiteStatement& row);

/// Whether all favourites, and the seal, are what was sealed last.
bool favoritesFit(SQLiteConnection& connection);

/// Throws a failure that means damage unless the favourites fit.
void requireFittingFavorites(SQLiteConnection& connection);

/// Seals the favourites as they are now; the last step of a change.
void sealFavorites(SQLiteConnection& connection);

}  // namespace nimbo
