#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "desktop/gtfs/feeds/Feed.h"
#include "platform/foundation/Outcome.h"

namespace nimbo {

/// A key without which a server lets nobody in.
struct WantedKey {
  enum class Place { query, header };
  Place place;
  std::string name;  ///< of the parameter or header
  std::string page;  ///< where to get one; empty where that is not known
};

/// A file of a feed that agencies publish.
struct KnownFile {
  FeedAddress address;
  std::optional<FeedAddress> mirror;  ///< a copy, kept elsewhere, that wants no key
  std::string name;                   ///< who publishes it, where that is somebody else; may be empty
  std::optional<WantedKey> key;
};

/// An alerts feed that some agency publishes, with the static feeds that its alerts are about: one at least.
struct KnownFeed {
  std::string id;
  std::string provider;
  std::string name;                                ///< of the feed; may be empty
  std::string country, subdivision, municipality;  ///< ISO 3166-1 alpha-2, and names; empty where not known
  KnownFile alerts;
  std::vector<KnownFile> staticFeeds;

  /// The provider, with the feed's own name where it has one.
  std::string title() const;
  /// The first key that one of its files wants; absent where none does.
  const WantedKey* firstKey() const;
};

/// The open feeds of the world that the program ships a catalog of. Another one stands in for it where the user has it
/// as `nimbo-transit/feed-catalog.json.bz2` below $XDG_DATA_HOME. Any thread.
class KnownFeeds {
 public:
  /// An error when the catalog cannot be used.
  static Outcome<KnownFeeds> read();

  const std::vector<KnownFeed>& all() const { return _feeds; }

  /// The feeds in whose agency, name, identifier or place all words of `text` occur, in any order and without regard to
  /// case and accents, the best first; all for an empty text. Countries are known by their code, their English name,
  /// and that in the language of `locale`.
  std::vector<KnownFeed> matching(std::string_view text, const std::string& locale) const;

  /// The countries that there are feeds in, by their names in the language of `locale` and in its order.
  struct Country {
    std::string name;
    std::size_t feeds = 0;
  };
  std::vector<Country> countries(const std::string& locale) const;

  /// The feed of this identifier, or an error that says what to do.
  Outcome<KnownFeed> withID(std::string_view id) const;

  /// The key that the server of an address wants, whatever its query; absent where none is known.
  std::optional<WantedKey> keyFor(const FeedAddress& address) const;

 private:
  explicit KnownFeeds(std::vector<KnownFeed> feeds) : _feeds(std::move(feeds)) {}
  std::vector<KnownFeed> _feeds;
};

}  // namespace nimbo
