#include "desktop/gtfs/feeds/FeedConfiguration.h"

#include <sys/stat.h>

#include <algorithm>
#include <cerrno>
#include <nlohmann/json.hpp>
#include <optional>
#include <system_error>

#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/net/FileReading.h"
#include "desktop/store/StateDatabaseFile.h"
#include "desktop/system/AtomicFile.h"

namespace nimbo {

namespace {

using JSON = nlohmann::ordered_json;

constexpr std::uint64_t kLargestConfiguration = 4 << 20;

/// What is wrong with the file, made into an error.
struct Fault {
  const std::filesystem::path& file;
  ErrorRef operator()(const std::string& what) const {
    return transitLineServiceError(TransitLineServiceError::configuration,
                                   "The feed configuration " + file.native() + " cannot be used: " + what,
                                   file.native());
  }
};

/// The file that holds the configuration: where managers of dotfiles made a link of it, what that leads to. A link
/// leads to nothing that somebody else made, but for the superuser. Absent when there is none.
Outcome<std::optional<std::filesystem::path>> findDocument(const std::filesystem::path& file) {
  const auto unreadable = [&](int errnoValue) {
    return Fault{file}(std::generic_category().message(errnoValue) + ". Check that you may read it and its folder.");
  };
  struct stat link {};
  if (::lstat(file.c_str(), &link) != 0) {
    if (errno == ENOENT) return std::optional<std::filesystem::path>();
    return unreadable(errno);
  }
  if (!S_ISLNK(link.st_mode)) return std::optional(file);
  std::error_code failure;
  auto target = std::filesystem::canonical(file, failure);
  if (failure) return unreadable(failure.value());
  struct stat status {};
  if (::lstat(target.c_str(), &status) != 0) return unreadable(errno);
  if (!S_ISREG(status.st_mode)) return Fault{file}("it is a link to " + target.native() + ", which is no file.");
  if (status.st_uid != link.st_uid && status.st_uid != 0)
    return Fault{file}("it is a link to " + target.native() + ", which belongs to somebody else than the link.");
  return std::optional(std::move(target));
}

/// The file's content, an object with `part` in it, which is as in `none` where there is no file.
Outcome<JSON> readDocument(const std::filesystem::path& file, const char* part, const JSON& none) {
  const auto found = findDocument(file);
  if (!found) return found.error();
  if (!*found) return JSON{{part, none}};
  const auto bytes = readOwnFile(**found, kLargestConfiguration);
  if (!bytes) return bytes.error();
  const Fault fault{file};
  const auto notJSON = [&](std::size_t byte) {
    return fault("it is not JSON at byte " + std::to_string(byte) + ". Correct it, or move it away to begin anew.");
  };
  // The end of the text to the parser.
  if (const std::size_t zero = bytes->find('\0'); zero != std::string::npos) return notJSON(zero + 1);
  JSON document;
  try {
    document = JSON::parse(*bytes);
  } catch (const JSON::parse_error& error) {
    return notJSON(error.byte);
  }
  if (!document.is_object() || !document.contains(part) || document[part].type() != none.type())
    return fault(std::string("it is not an object with ") + (none.is_array() ? "a list" : "an object") + " \"" + part +
                 "\". Correct it, or move it away to begin anew.");
  return document;
}

Outcome<Feed> readFeed(const JSON& entry, std::size_t index, const std::filesystem::path& file) {
  const Fault fault{file};
  const std::string place = "feed " + std::to_string(index + 1) + " in it";
  if (!entry.is_object()) return fault(place + " is not an object.");
  const auto text = [&](const char* key) -> Outcome<std::string> {
    const auto found = entry.find(key);
    if (found == entry.end() || !found->is_string()) return fault(place + " has no text \"" + key + "\".");
    return found->get<std::string>();
  };
  const auto name = text("name"), staticText = text("static"), alertsText = text("alerts");
  for (const auto* part : {&name, &staticText, &alertsText})
    if (!*part) return part->error();
  if (const ErrorRef error = FeedConfiguration::checkName(*name)) return fault(place + ": " + error->reason());
  const auto staticFeed = FeedAddress::parse(*staticText), alerts = FeedAddress::parse(*alertsText);
  for (const auto* address : {&staticFeed, &alerts})
    if (!*address) return fault(place + ": " + address->error()->reason());
  Feed feed{*name, *staticFeed, *alerts};
  if (entry.contains("staticMirror")) {
    const auto mirrorText = text("staticMirror");
    const auto mirror = mirrorText ? FeedAddress::parse(*mirrorText) : mirrorText.error();
    if (!mirror) return fault(place + ": " + mirror.error()->reason());
    if (!mirror->isRemote()) return fault(place + " has a \"staticMirror\" that is no http or https address.");
    feed.staticMirror = *mirror;
  }
  for (const auto& [key, flag] : {std::pair("minorAlerts", &feed.minorAlerts), {"combined", &feed.isCombined}}) {
    const auto value = entry.find(key);
    if (value == entry.end()) continue;
    if (!value->is_boolean()) return fault(place + " has a \"" + key + "\" that is neither true nor false.");
    *flag = value->get<bool>();
  }
  if (const auto age = entry.find("maximumAlertsAgeMinutes"); age != entry.end()) {
    const int least = feed.alerts.isRemote() ? 1 : 0;
    if (!age->is_number_integer() || *age < least || *age > kLongestAlertsAgeMinutes)
      return fault(place + " has a \"maximumAlertsAgeMinutes\" that is no number from " + std::to_string(least) +
                   " to " + std::to_string(kLongestAlertsAgeMinutes) + ".");
    feed.maximumAlertsAge = std::chrono::minutes(age->get<int>());
  }
  return feed;
}

/// The key of one half of a feed, by what `keys.json` has of the feed.
Outcome<FeedKey> readKey(const JSON& ofFeed, const char* part, const std::filesystem::path& file) {
  FeedKey key;
  if (!ofFeed.is_object() || !ofFeed.contains(part)) return key;
  try {
    const JSON& entry = ofFeed[part];
    key.query = entry.value("query", std::string());
    if (entry.contains("headers")) key.headers = entry["headers"].get<std::vector<std::string>>();
  } catch (const JSON::exception&) {
    return Fault{file}(std::string("a key for \"") + part + "\" in it is none.");
  }
  for (const std::string& header : key.headers)
    if (const ErrorRef error = FeedKey::checkHeader(header)) return Fault{file}(error->reason());
  if (std::any_of(key.query.begin(), key.query.end(), [](unsigned char c) { return c <= 0x20 || c == 0x7F; }))
    return Fault{file}("a query in it holds spaces or control characters.");
  return key;
}

/// The form that `readKey` reads; null for no key.
JSON entryOfKey(const FeedKey& key) {
  JSON entry;
  if (!key.headers.empty()) entry["headers"] = key.headers;
  if (!key.query.empty()) entry["query"] = key.query;
  return entry;
}

void writeKeys(JSON& keys, const Feed& feed) {
  JSON ofFeed;
  for (const auto& [part, address] : {std::pair("static", &feed.staticFeed), {"alerts", &feed.alerts}})
    if (JSON entry = entryOfKey(address->key()); !entry.is_null()) ofFeed[part] = std::move(entry);
  keys.erase(feed.name);
  if (!ofFeed.is_null()) keys[feed.name] = std::move(ofFeed);
}

/// What is not known here stays in the entry.
void writeEntry(JSON& entry, const Feed& feed) {
  const auto write = [&entry](const char* key, bool isThere, const JSON& value) {
    isThere ? void(entry[key] = value) : void(entry.erase(key));
  };
  write("name", true, feed.name);
  write("static", true, feed.staticFeed.text());
  write("alerts", true, feed.alerts.text());
  write("staticMirror", feed.staticMirror.has_value(), feed.staticMirror ? feed.staticMirror->text() : "");
  write("minorAlerts", feed.minorAlerts, true);
  write("combined", feed.isCombined, true);
  write("maximumAlertsAgeMinutes", feed.maximumAlertsAge.has_value(),
        feed.maximumAlertsAge.value_or(std::chrono::minutes(0)).count());
}

ErrorRef unknownFeed(std::string_view name, const std::vector<Feed>& present) {
  std::string names = present.empty() ? "No feed is set up" : "Feeds set up:";
  for (const Feed& feed : present) names += " " + feed.name;
  return transitLineServiceError(TransitLineServiceError::unknownFeed,
                                 "No feed is named \"" + std::string(name) + "\". " + names + ".", std::string(name));
}

std::optional<std::size_t> indexOf(std::string_view name, const std::vector<Feed>& feeds) {
  const auto found = std::find_if(feeds.begin(), feeds.end(), [&](const Feed& feed) { return feed.name == name; });
  if (found == feeds.end()) return std::nullopt;
  return static_cast<std::size_t>(found - feeds.begin());
}

ErrorRef takenName(std::string_view name, const std::vector<Feed>& present) {
  if (std::none_of(present.begin(), present.end(), [&](const Feed& other) { return other.name == name; }))
    return nullptr;
  return transitLineServiceError(
      TransitLineServiceError::feedNameTaken,
      "A feed named \"" + std::string(name) + "\" is set up already. Choose another name, or remove that one first.",
      std::string(name));
}

ErrorRef writeDocument(const std::filesystem::path& file, const JSON& document) {
  const auto found = findDocument(file);
  if (!found) return found.error();
  return writeFileAtomically(found->value_or(file),
                             document.dump(2, ' ', false, JSON::error_handler_t::replace) + "\n");
}

void findSiblings(std::vector<Feed>& feeds) {
  const std::vector<Feed> alone = feeds;
  for (Feed& feed : feeds)
    for (const Feed& other : alone)
      if (other.name != feed.name && other.alerts.isRemote() && other.alerts == feed.alerts &&
          other.isCombined == feed.isCombined && other.maximumAlertsAge == feed.maximumAlertsAge)
        feed.siblings.push_back(other);
  for (Feed& feed : feeds) feed.sharesAlerts = !feed.siblings.empty();
}

}  // namespace

/// Both files, and the feeds in them.
struct FeedConfiguration::Documents {
  JSON feeds, keys;
  std::vector<Feed> read;
};

Outcome<FeedConfiguration::Documents> FeedConfiguration::read() const {
  auto feeds = readDocument(_file, "feeds", JSON::array());
  if (!feeds) return feeds.error();
  auto keys = readDocument(_keysFile, "keys", JSON::object());
  if (!keys) return keys.error();
  Documents documents{std::move(*feeds), std::move(*keys), {}};
  const JSON& entries = documents.feeds["feeds"];
  for (std::size_t i = 0; i < entries.size(); ++i) {
    auto feed = readFeed(entries[i], i, _file);
    if (!feed) return feed.error();
    if (std::any_of(documents.read.begin(), documents.read.end(),
                    [&](const Feed& other) { return other.name == feed->name; }))
      return Fault{_file}("two feeds in it are named \"" + feed->name + "\".");
    const JSON ofFeed = documents.keys["keys"].value(feed->name, JSON());
    for (const auto& [part, address] : {std::pair("static", &feed->staticFeed), {"alerts", &feed->alerts}}) {
      auto key = readKey(ofFeed, part, _keysFile);
      if (!key) return key.error();
      *address = address->withKey(std::move(*key));
    }
    documents.read.push_back(std::move(*feed));
  }
  findSiblings(documents.read);
  return documents;
}

ErrorRef FeedConfiguration::change(const std::function<ErrorRef(Documents& documents)>& what) {
  if (ErrorRef error = makeFolders(_folder)) return error;
  const FolderLock lock(_folder);
  auto documents = read();
  if (!documents) return documents.error();
  const JSON keysBefore = documents->keys;
  if (ErrorRef error = what(*documents)) return error;
  // Keys without a feed do no harm, other than a feed without its keys.
  if (documents->keys != keysBefore)
    if (ErrorRef error = writeDocument(_keysFile, documents->keys)) return error;
  return writeDocument(_file, documents->feeds);
}

ErrorRef FeedConfiguration::checkName(std::string_view name) {
  constexpr std::size_t kLongestName = 64;
  const bool valid = !name.empty() && name.size() <= kLongestName && name.front() != '.' && name.front() != '-' &&
                     std::all_of(name.begin(), name.end(), [](unsigned char c) {
                       return std::isalnum(c) || c == '.' || c == '_' || c == '-' || c >= 0x80;
                     });
  if (!valid)
    return transitLineServiceError(TransitLineServiceError::badFeedName,
                                   "A feed cannot be named \"" + std::string(name) +
                                       "\". Use one to 64 letters, digits, \".\", \"_\" and \"-\", beginning with a "
                                       "letter or digit.");
  if (name == kSampleFeedName)
    return transitLineServiceError(TransitLineServiceError::feedNameTaken,
                                   "\"sample\" is the made-up city. Choose another name.", std::string(name));
  return nullptr;
}

Outcome<std::vector<Feed>> FeedConfiguration::feeds() const {
  auto documents = read();
  if (!documents) return documents.error();
  return std::move(documents->read);
}

Outcome<Feed> FeedConfiguration::feedNamed(std::string_view name) const {
  auto all = feeds();
  if (!all) return all.error();
  for (Feed& feed : *all)
    if (feed.name == name) return std::move(feed);
  return unknownFeed(name, *all);
}

ErrorRef FeedConfiguration::checkNewName(std::string_view name) const {
  if (ErrorRef error = checkName(name)) return error;
  const auto present = feeds();
  return present ? takenName(name, *present) : present.error();
}

ErrorRef FeedConfiguration::add(const Feed& feed) {
  if (ErrorRef error = checkName(feed.name)) return error;
  return change([&](Documents& documents) -> ErrorRef {
    if (ErrorRef error = takenName(feed.name, documents.read)) return error;
    JSON entry;
    writeEntry(entry, feed);
    documents.feeds["feeds"].push_back(std::move(entry));
    writeKeys(documents.keys["keys"], feed);
    return nullptr;
  });
}

ErrorRef FeedConfiguration::replace(const Feed& feed) {
  return change([&](Documents& documents) -> ErrorRef {
    const auto index = indexOf(feed.name, documents.read);
    if (!index) return unknownFeed(feed.name, documents.read);
    writeEntry(documents.feeds["feeds"][*index], feed);
    writeKeys(documents.keys["keys"], feed);
    return nullptr;
  });
}

ErrorRef FeedConfiguration::remove(std::string_view name) {
  return change([&](Documents& documents) -> ErrorRef {
    const auto index = indexOf(name, documents.read);
    if (!index) return unknownFeed(name, documents.read);
    documents.feeds["feeds"].erase(*index);
    documents.keys["keys"].erase(std::string(name));
    return nullptr;
  });
}

}  // namespace nimbo
