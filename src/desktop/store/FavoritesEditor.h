#pragma once

#include <string>
#include <string_view>

#include "desktop/store/StateDatabase.h"
#include "platform/FavoritesStore.h"
#include "platform/foundation/Outcome.h"
#include "platform/transit/TransitLine.h"

namespace nimbo {

/// What a favourite keeps of a line, but for its number: where it is found, name, colour, system and shields, as JSON
/// (see docs/state-database.md).
std::string contentOfFavoriteLine(const TransitLine& line);

/// The line again, a line item without incidents. Null when `content` is not what `contentOfFavoriteLine` makes;
/// members that it does not know are passed over.
TransitLineRef favoriteLineOfContent(std::uint64_t muid, std::string_view content);

/// Domain of the errors of favourites; the codes are FavoritesError.
inline constexpr std::string_view kFavoritesErrorDomain = "org.nimbo.Favorites";

enum class FavoritesError : std::int64_t { duplicate = 1, unknown = 2, position = 3, lost = 4 };

/// The favourites in the state database, as the host application changes them. Each change is one transaction: hosts
/// that change at once lose nothing, and a change that is refused changes nothing. Favourites of other kinds keep
/// their places in the order and their content. Any thread.
class FavoritesEditor final {
 public:
  /// The favourite lines of a user who never set any; none where the program knows of none. Called on the thread that
  /// reads or changes the favourites, with the database locked: must not use it.
  using FirstFavorites = std::function<std::vector<TransitLineRef>()>;

  /// Throws std::invalid_argument without a database; `firstFavorites` may be null.
  FavoritesEditor(std::shared_ptr<StateDatabase> database, FirstFavorites firstFavorites);

  /// All favourites in their order; while none were ever set, the first ones. A line whose content cannot be read is a
  /// favourite without a line. An error also after damage that took some of them, until the next change.
  Outcome<Favorites> list() const;
  /// The same, but after such damage those that are left.
  Outcome<Favorites> left() const;

  /// Tells one state of the favourites from another: 0 while none were ever set, or where they cannot be read.
  std::int64_t mark() const;

  // The first change begins from the first favourites. Each answers null on success.

  /// Appends lines (none of them null). Refused when one is a favourite already.
  ErrorRef add(const std::vector<TransitLineRef>& lines);
  /// Removes lines by their numbers. Refused when one is no favourite.
  ErrorRef remove(const std::vector<std::uint64_t>& muids);
  /// Moves a line to a position among the favourite lines, counted from 0. Refused when it is no favourite, or where
  /// there is no such position.
  ErrorRef move(std::uint64_t muid, std::size_t position);

 private:
  enum class Loss { isError, isPassedOver };
  /// What was read last: while the seal is the same, so are they, object for object. Used with the database locked.
  struct Memory {
    std::int64_t digest = 0;
    Favorites favorites;
  };
  Outcome<Favorites> read(Loss loss) const;
  ErrorRef change(const StateDatabase::Work& work);

  std::shared_ptr<StateDatabase> _database;
  FirstFavorites _firstFavorites;
  std::shared_ptr<std::optional<Memory>> _memory = std::make_shared<std::optional<Memory>>();
};

}  // namespace nimbo
