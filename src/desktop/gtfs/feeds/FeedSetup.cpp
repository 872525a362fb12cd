#include "desktop/gtfs/feeds/FeedSetup.h"

#include <algorithm>

#include "desktop/gtfs/feeds/FeedConfiguration.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/strings/StringsPart.h"

namespace nimbo {

namespace {

/// Bytes of a name that is nice to type, where it ends at a word.
constexpr std::size_t kGoodLength = 20;

std::string nameOfPart(const std::string& name, std::size_t index) {
  return index == 0 ? name : name + "-" + std::to_string(index + 1);
}

/// The words of a text in lower case, with "-" between them, as many as are nice to type; one at least.
std::string shortNameOf(const std::string& text) {
  std::string name;
  bool isAfterWord = false;
  for (const char c : stringsPart().searchKey(text)) {
    const bool isPart = static_cast<unsigned char>(c) >= 0x80 || std::isalnum(static_cast<unsigned char>(c));
    if (isPart && isAfterWord && !name.empty()) {
      if (name.size() >= kGoodLength) break;
      name += '-';
    }
    if (isPart) name += c;
    isAfterWord = !isPart;
  }
  return name;
}

/// What a provider calls himself for short: "PTV" of "Public Transport Victoria (PTV)".
std::string shortTitleOf(const KnownFeed& known) {
  const std::size_t open = known.provider.find('('), close = known.provider.find(')', open);
  const bool hasShort = open != std::string::npos && close != std::string::npos && close > open + 1 && open > 0;
  if (hasShort) return known.provider.substr(open + 1, close - open - 1);
  return !known.name.empty() && known.name.size() < known.provider.size() ? known.name : known.provider;
}

}  // namespace

std::string nameForFeed(const KnownFeed& known, const std::vector<Feed>& present) {
  std::string base = shortNameOf(shortTitleOf(known));
  if (FeedConfiguration::checkName(base)) base = "feed";
  const auto isFree = [&](const std::string& name) {
    for (std::size_t i = 0; i < known.staticFeeds.size(); ++i)
      if (std::any_of(present.begin(), present.end(),
                      [&](const Feed& feed) { return feed.name == nameOfPart(name, i); }))
        return false;
    return true;
  };
  std::string name = base;
  for (std::size_t i = 1; !isFree(name); ++i) name = nameOfPart(base, i);
  return name;
}

std::vector<Feed> feedsOf(const KnownFeed& known, const std::string& name, const std::string& key) {
  const auto addressOf = [&](const KnownFile& file) {
    return file.key && !key.empty() ? withKey(file.address, *file.key, key) : file.address;
  };
  std::vector<Feed> feeds;
  for (const KnownFile& file : known.staticFeeds) {
    Feed feed{.name = nameOfPart(name, feeds.size()), .staticFeed = addressOf(file), .alerts = addressOf(known.alerts)};
    feed.staticMirror = file.mirror;
    feed.sharesAlerts = known.staticFeeds.size() > 1;
    feeds.push_back(std::move(feed));
  }
  return feeds;
}

ErrorRef checkKey(const KnownFeed& known, const std::string& key) {
  const WantedKey* const wanted = known.firstKey();
  if (!wanted)
    return transitLineServiceError(TransitLineServiceError::badKey, known.title() + " wants no key. Leave it out.");
  return FeedKey::checkHeader(wanted->name + ": " + key);
}

FeedAddress withKey(const FeedAddress& address, const WantedKey& wanted, const std::string& key) {
  FeedKey made;
  if (wanted.place == WantedKey::Place::header)
    made.headers = {wanted.name + ": " + key};
  else
    made.query = FeedKey::parameter(wanted.name, key);
  return address.withKey(std::move(made));
}

}  // namespace nimbo
