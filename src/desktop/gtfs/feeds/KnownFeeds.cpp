#include "desktop/gtfs/feeds/KnownFeeds.h"

#include <algorithm>
#include <map>
#include <nlohmann/json.hpp>

#include "desktop/archive/Bzip2.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/net/FileReading.h"
#include "desktop/resources/Resources.h"
#include "desktop/strings/StringsPart.h"
#include "desktop/system/Paths.h"

namespace nimbo {

namespace {

using CatalogJSON = nlohmann::json;

constexpr std::uint64_t kLargestFile = 4 << 20;
constexpr std::size_t kLargestCatalog = 32 << 20;
constexpr int kCatalogVersion = 1;

ErrorRef unusable(const std::string& place, const std::string& what) {
  return transitLineServiceError(TransitLineServiceError::badCatalog,
                                 "The catalog of feeds " + place + " cannot be used: " + what +
                                     ". Move it away to use the one that came with the program.",
                                 place);
}

/// A text of the catalog that may be missing. Throws CatalogJSON::exception for what is no text.
std::string textIn(const CatalogJSON& entry, const char* key) { return entry.value(key, std::string()); }

FeedAddress addressIn(const CatalogJSON& entry, const char* key) {
  auto address = FeedAddress::parse(entry.at(key).get<std::string>());
  if (!address || !address->isRemote()) throw std::invalid_argument(std::string("a \"") + key + "\" is no address");
  return std::move(*address);
}

KnownFile readFileEntry(const CatalogJSON& entry) {
  KnownFile file{.address = addressIn(entry, "url"), .mirror = {}, .name = textIn(entry, "name"), .key = {}};
  if (entry.contains("mirror")) file.mirror = addressIn(entry, "mirror");
  if (const auto key = entry.find("key"); key != entry.end()) {
    const std::string place = textIn(*key, "in");
    if (place != "query" && place != "header") throw std::invalid_argument("a key goes neither in query nor header");
    file.key = {place == "query" ? WantedKey::Place::query : WantedKey::Place::header,
                key->at("name").get<std::string>(), textIn(*key, "page")};
  }
  return file;
}

KnownFeed readFeedEntry(const CatalogJSON& entry) {
  KnownFeed feed{.id = entry.at("id").get<std::string>(),
                 .provider = entry.at("provider").get<std::string>(),
                 .name = textIn(entry, "name"),
                 .country = textIn(entry, "country"),
                 .subdivision = textIn(entry, "subdivision"),
                 .municipality = textIn(entry, "municipality"),
                 .alerts = readFileEntry(entry.at("alerts")),
                 .staticFeeds = {}};
  for (const CatalogJSON& file : entry.at("static")) feed.staticFeeds.push_back(readFileEntry(file));
  if (feed.staticFeeds.empty()) throw std::invalid_argument("feed \"" + feed.id + "\" has no static feed");
  return feed;
}

/// The words of a text as searches compare them.
std::vector<std::string> wordsOf(std::string_view text) {
  std::vector<std::string> words;
  bool isInside = false;
  for (const char c : stringsPart().searchKey(text)) {
    const bool isPart = static_cast<unsigned char>(c) >= 0x80 || std::isalnum(static_cast<unsigned char>(c));
    if (isPart && !isInside) words.emplace_back();
    if (isPart) words.back() += c;
    isInside = isPart;
  }
  return words;
}

/// What is searched of a feed, what tells it best first.
std::vector<std::vector<std::string>> fieldsOf(const KnownFeed& feed, const std::string& countryNames) {
  std::string files;
  for (const KnownFile& file : feed.staticFeeds) files += " " + file.name;
  return {wordsOf(feed.provider + " " + feed.name), wordsOf(feed.municipality), wordsOf(feed.subdivision),
          wordsOf(feed.country + " " + countryNames), wordsOf(feed.id + files)};
}

/// The lower the better; absent where the word does not occur. The beginning of a word counts before its middle.
std::optional<std::size_t> rankOf(const std::string& word, const std::vector<std::vector<std::string>>& fields) {
  std::optional<std::size_t> best;
  for (std::size_t i = 0; i < fields.size(); ++i)
    for (const std::string& other : fields[i])
      if (const std::size_t at = other.find(word); at != std::string::npos)
        best = std::min(best.value_or(2 * fields.size()), at == 0 ? i : i + fields.size());
  return best;
}

/// An address without scheme and query: a key is the same for both schemes and each query.
std::string_view serverAndPath(const FeedAddress& address) {
  std::string_view text = address.text();
  text = text.substr(0, text.find_first_of("?#"));
  return text.substr(text.find("://") + 3);
}

}  // namespace

std::string KnownFeed::title() const { return name.empty() ? provider : provider + " (" + name + ")"; }

const WantedKey* KnownFeed::firstKey() const {
  if (alerts.key) return &*alerts.key;
  for (const KnownFile& file : staticFeeds)
    if (file.key) return &*file.key;
  return nullptr;
}

Outcome<KnownFeeds> KnownFeeds::read() {
  const std::filesystem::path own = Paths::data() / "feed-catalog.json.bz2";
  std::error_code ignored;
  std::string bytes, place = "inside the program";
  if (std::filesystem::exists(own, ignored)) {
    place = own.native();
    auto read = readFile(own, kLargestFile);
    if (!read) return read.error();
    bytes = std::move(*read);
  } else {
    bytes = resourceNamed("feeds/catalog.json.bz2").value_or("");
  }
  const auto* data = reinterpret_cast<const std::uint8_t*>(bytes.data());
  const auto unpacked = bzip2DecompressedData({data, bytes.size()}, kLargestCatalog);
  if (!unpacked) return unusable(place, unpacked.error()->reason());
  std::vector<KnownFeed> feeds;
  try {
    const CatalogJSON document = CatalogJSON::parse(unpacked->begin(), unpacked->end());
    if (document.at("version") != kCatalogVersion) return unusable(place, "it is of another version");
    for (const CatalogJSON& entry : document.at("feeds")) feeds.push_back(readFeedEntry(entry));
  } catch (const std::exception& failure) {
    return unusable(place, failure.what());
  }
  return KnownFeeds(std::move(feeds));
}

std::vector<KnownFeed> KnownFeeds::matching(std::string_view text, const std::string& locale) const {
  const std::vector<std::string> words = wordsOf(text);
  if (words.empty()) return _feeds;
  std::map<std::string, std::string> countryNames;
  for (const KnownFeed& feed : _feeds)
    if (std::string& names = countryNames[feed.country]; names.empty())
      names = stringsPart().countryName(feed.country, "en") + " " + stringsPart().countryName(feed.country, locale);
  std::vector<std::pair<std::size_t, const KnownFeed*>> found;
  for (const KnownFeed& feed : _feeds) {
    const auto fields = fieldsOf(feed, countryNames[feed.country]);
    std::size_t sum = 0;
    const bool hasAll = std::all_of(words.begin(), words.end(), [&](const std::string& word) {
      const auto rank = rankOf(word, fields);
      sum += rank.value_or(0);
      return rank.has_value();
    });
    if (hasAll) found.emplace_back(sum, &feed);
  }
  std::stable_sort(found.begin(), found.end(), [](const auto& a, const auto& b) { return a.first < b.first; });
  std::vector<KnownFeed> feeds;
  feeds.reserve(found.size());
  for (const auto& [rank, feed] : found) feeds.push_back(*feed);
  return feeds;
}

std::vector<KnownFeeds::Country> KnownFeeds::countries(const std::string& locale) const {
  std::map<std::string, std::size_t> feedsOfCountry;
  for (const KnownFeed& feed : _feeds) ++feedsOfCountry[feed.country];
  std::map<std::string, Country> sorted;
  for (const auto& [code, feeds] : feedsOfCountry) {
    std::string name = stringsPart().countryName(code, locale);
    std::string key = stringsPart().sortKey(name, locale);
    sorted.emplace(std::move(key), Country{std::move(name), feeds});
  }
  std::vector<Country> countries;
  countries.reserve(sorted.size());
  for (auto& [key, country] : sorted) countries.push_back(std::move(country));
  return countries;
}

Outcome<KnownFeed> KnownFeeds::withID(std::string_view id) const {
  for (const KnownFeed& feed : _feeds)
    if (feed.id == id) return feed;
  return transitLineServiceError(TransitLineServiceError::unknownCatalogFeed,
                                 "The catalog has no feed \"" + std::string(id) +
                                     "\". \"feed find\" tells the identifiers of feeds by agency and place.",
                                 std::string(id));
}

std::optional<WantedKey> KnownFeeds::keyFor(const FeedAddress& address) const {
  const auto isThere = [server = serverAndPath(address)](const KnownFile& file) {
    return file.key && serverAndPath(file.address) == server;
  };
  for (const KnownFeed& feed : _feeds) {
    if (isThere(feed.alerts)) return feed.alerts.key;
    for (const KnownFile& file : feed.staticFeeds)
      if (isThere(file)) return file.key;
  }
  return std::nullopt;
}

}  // namespace nimbo
