#pragma once

#include <string>
#include <vector>

#include "desktop/gtfs/feeds/KnownFeeds.h"

namespace nimbo {

/// A short name for what a feed of the catalog makes, none of which is among those present then.
std::string nameForFeed(const KnownFeed& known, const std::vector<Feed>& present);

/// The feeds that a feed of the catalog makes: one for each of its static feeds, named `name`, then "`name`-2" and so
/// on, and all with its alerts. The key goes where one is wanted; empty for none. The key is one that `checkKey`
/// passes.
std::vector<Feed> feedsOf(const KnownFeed& known, const std::string& name, const std::string& key);

/// Null for a key that a feed of the catalog has a use for, and that can be sent.
ErrorRef checkKey(const KnownFeed& known, const std::string& key);

/// An address with a key, sent as its server wants it.
FeedAddress withKey(const FeedAddress& address, const WantedKey& wanted, const std::string& key);

}  // namespace nimbo
