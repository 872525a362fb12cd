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
constexpr int kLongestAlertsAgeMinutes = 60 * 24 * 366;

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

Outcome<JSON> readDocument(const std::filesystem::path& file) {
  const auto found = findDocument(file);
  if (!found) return found.error();
  if (!*found) return JSON{{"feeds", JSON::array()}};
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
  if (!document.is_object() || !document.contains("feeds") || !document["feeds"].is_array())
    return fault("it is not an object with a list \"feeds\". Correct it, or move it away to begin anew.");
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

Outcome<std::vector<Feed>> readFeeds(const JSON& document, const std::filesystem::path& file) {
  std::vector<Feed> feeds;
  for (std::size_t i = 0; i < document["feeds"].size(); ++i) {
    auto feed = readFeed(document["feeds"][i], i, file);
    if (!feed) return feed.error();
    if (std::any_of(feeds.begin(), feeds.end(), [&](const Feed& other) { return other.name == feed->name; }))
      return Fault{file}("two feeds in it are named \"" + feed->name + "\".");
    feeds.push_back(std::move(*feed));
  }
  return feeds;
}

ErrorRef unknownFeed(std::string_view name, const std::vector<Feed>& present) {
  std::string names = present.empty() ? "No feed is set up" : "Feeds set up:";
  for (const Feed& feed : present) names += " " + feed.name;
  return transitLineServiceError(TransitLineServiceError::unknownFeed,
                                 "No feed is named \"" + std::string(name) + "\". " + names + ".", std::string(name));
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

}  // namespace

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
  const auto document = readDocument(_file);
  if (!document) return document.error();
  return readFeeds(*document, _file);
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
  if (ErrorRef error = makeFolders(_folder)) return error;
  const FolderLock lock(_folder);
  auto document = readDocument(_file);
  if (!document) return document.error();
  const auto present = readFeeds(*document, _file);
  if (!present) return present.error();
  if (ErrorRef error = takenName(feed.name, *present)) return error;
  JSON entry{{"name", feed.name}, {"static", feed.staticFeed.text()}, {"alerts", feed.alerts.text()}};
  if (feed.minorAlerts) entry["minorAlerts"] = true;
  if (feed.isCombined) entry["combined"] = true;
  if (feed.maximumAlertsAge) entry["maximumAlertsAgeMinutes"] = feed.maximumAlertsAge->count();
  (*document)["feeds"].push_back(std::move(entry));
  return writeDocument(_file, *document);
}

ErrorRef FeedConfiguration::remove(std::string_view name) {
  const FolderLock lock(_folder);
  auto document = readDocument(_file);
  if (!document) return document.error();
  const auto present = readFeeds(*document, _file);
  if (!present) return present.error();
  const auto found =
      std::find_if(present->begin(), present->end(), [&](const Feed& feed) { return feed.name == name; });
  if (found == present->end()) return unknownFeed(name, *present);
  (*document)["feeds"].erase(static_cast<std::size_t>(found - present->begin()));
  return writeDocument(_file, *document);
}

}  // namespace nimbo
