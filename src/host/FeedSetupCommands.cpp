#include <termios.h>
#include <unistd.h>

#include <algorithm>
#include <fstream>
#include <iostream>
#include <nlohmann/json.hpp>

#include "desktop/gtfs/feeds/FeedCache.h"
#include "desktop/gtfs/feeds/FeedConfiguration.h"
#include "desktop/gtfs/feeds/FeedSetup.h"
#include "host/Commands.h"
#include "host/FeedAnswers.h"
#include "host/HostPlatform.h"
#include "host/ProgressLine.h"
#include "host/TerminalText.h"

namespace nimbo {

namespace {

using JSON = nlohmann::ordered_json;

std::string placeOf(const KnownFeed& feed) {
  std::string place;
  for (const std::string& part : {feed.municipality, feed.subdivision, feed.country})
    if (!part.empty()) place += (place.empty() ? "" : ", ") + part;
  return place;
}

JSON writtenKey(const std::optional<WantedKey>& key) {
  if (!key) return nullptr;
  return {{"in", key->place == WantedKey::Place::header ? "header" : "query"},
          {"name", key->name},
          {"page", key->page.empty() ? JSON() : JSON(key->page)}};
}

JSON writtenFeed(const KnownFeed& feed) {
  const auto text = [](const std::string& value) { return value.empty() ? JSON() : JSON(value); };
  const auto keyed = std::find_if(feed.staticFeeds.begin(), feed.staticFeeds.end(),
                                  [](const KnownFile& file) { return file.key.has_value(); });
  return {{"id", feed.id},
          {"provider", feed.title()},
          {"country", text(feed.country)},
          {"subdivision", text(feed.subdivision)},
          {"municipality", text(feed.municipality)},
          {"key",
           {{"alerts", writtenKey(feed.alerts.key)},
            {"static", keyed == feed.staticFeeds.end() ? JSON() : writtenKey(keyed->key)}}}};
}

/// How many feeds there are in which country.
void printCountries(const KnownFeeds& known) {
  const auto countries = known.countries("en");
  std::vector<std::vector<std::string>> table;
  table.reserve(countries.size());
  for (const auto& [name, count] : countries) table.push_back({printableText(name), counted(count, "feed")});
  printTable(table);
}

/// A line that the user types unseen. Throws CommandFailure when there is none.
std::string askUnseen(const std::string& question) {
  std::cerr << printableText(question) << std::flush;
  termios before{};
  const bool isTerminal = ::tcgetattr(STDIN_FILENO, &before) == 0;
  termios silent = before;
  // Without signals too: whoever ends the program now must not be left with a terminal that shows nothing.
  silent.c_lflag &= ~static_cast<tcflag_t>(ECHO | ISIG);
  if (isTerminal) ::tcsetattr(STDIN_FILENO, TCSAFLUSH, &silent);
  std::string line;
  const bool isRead = static_cast<bool>(std::getline(std::cin, line));
  if (isTerminal) ::tcsetattr(STDIN_FILENO, TCSAFLUSH, &before);
  std::cerr << "\n";
  if (!isRead || line.empty()) throw CommandFailure("no key was entered");
  return line;
}

std::string keyIn(const std::string& file) {
  constexpr std::size_t kLongestKey = 16 << 10;
  std::ifstream opened;
  if (file != "-") opened.open(file);
  std::istream& input = file == "-" ? std::cin : opened;
  std::string key(kLongestKey, '\0');
  input.read(key.data(), static_cast<std::streamsize>(key.size()));
  key.resize(static_cast<std::size_t>(input.gcount()));
  while (key.ends_with('\n') || key.ends_with('\r')) key.pop_back();
  if (key.empty()) throw CommandFailure("no key can be read from " + (file == "-" ? "the standard input" : file));
  return key;
}

std::optional<std::string> givenKey(const FeedOptions& options) {
  return options.keyFile.empty() ? options.key : keyIn(options.keyFile);
}

std::string whereToGet(const WantedKey& key) {
  return key.page.empty() ? "Its publisher gives it out" : "You get one at " + key.page;
}

/// The key for a feed of the catalog, asked for on a terminal; empty where none is wanted.
std::string keyFor(const KnownFeed& known, const FeedOptions& options) {
  const WantedKey* const wanted = known.firstKey();
  std::optional<std::string> key = givenKey(options);
  if (!key && wanted) {
    if (::isatty(STDIN_FILENO) == 0)
      throw CommandFailure(known.title() + " wants a key. " + whereToGet(*wanted) +
                           "; give it with --key or --key-file");
    key = askUnseen(known.title() + " wants a key. " + whereToGet(*wanted) + ".\nKey (it is not shown): ");
  }
  if (key) require(checkKey(known, *key));
  return key.value_or("");
}

/// What was given of an address, instead of what there was of it.
FeedAddress changedAddress(const std::optional<FeedAddress>& before, const std::optional<std::string>& text,
                           const std::vector<std::string>& headers, bool withoutKeys) {
  FeedAddress address = text ? require(FeedAddress::parse(*text)).withQueryAsKey() : before.value();
  FeedKey key = withoutKeys && !text ? FeedKey() : address.key();
  if (text && before && !withoutKeys) key.headers = before->key().headers;
  if (!headers.empty()) key.headers = headers;
  for (const std::string& header : headers) require(FeedKey::checkHeader(header));
  if (!address.isRemote() && !key.isEmpty())
    throw CommandFailure(address.publicText() + " is a file of this machine, to which no header is sent");
  return address.withKey(std::move(key));
}

/// Changes what the options say of a feed beside its addresses.
void applySettings(Feed& feed, const FeedOptions& options) {
  feed.isCombined = options.isCombined.value_or(feed.isCombined);
  feed.minorAlerts = options.minorAlerts.value_or(feed.minorAlerts);
  if (!options.maximumAlertsAgeMinutes) return;
  if (feed.alerts.isRemote() && *options.maximumAlertsAgeMinutes == 0)
    throw CommandFailure("alerts of a server count for a minute at least");
  feed.maximumAlertsAge = std::chrono::minutes(*options.maximumAlertsAgeMinutes);
}

/// A feed by the options, which say what is not `before`.
Feed changedFeed(const std::optional<Feed>& before, const FeedOptions& options) {
  const auto headers = [&](const std::vector<std::string>& more) {
    std::vector<std::string> all = options.headers;
    all.insert(all.end(), more.begin(), more.end());
    return all;
  };
  const auto addressBefore = [&](auto part) { return before ? std::optional((*before).*part) : std::nullopt; };
  Feed feed{.name = options.name,
            .staticFeed = changedAddress(addressBefore(&Feed::staticFeed), options.staticFeed,
                                         headers(options.staticHeaders), options.withoutKeys),
            .alerts = changedAddress(addressBefore(&Feed::alerts), options.alerts, headers(options.alertsHeaders),
                                     options.withoutKeys)};
  if (before) {
    feed.staticMirror = options.staticFeed ? std::nullopt : before->staticMirror;
    feed.minorAlerts = before->minorAlerts;
    feed.maximumAlertsAge = before->maximumAlertsAge;
    feed.isCombined = before->isCombined;
    feed.sharesAlerts = before->sharesAlerts;
  }
  if (options.mirror) feed.staticMirror = require(FeedAddress::parse(*options.mirror));
  if (feed.staticMirror && !feed.staticMirror->isRemote())
    throw CommandFailure("a mirror has an http or https address");
  applySettings(feed, options);
  return feed;
}

/// Puts the key where the catalog knows that the servers of the feed want one.
void giveKey(Feed& feed, const std::string& key) {
  const KnownFeeds known = require(KnownFeeds::read());
  bool isWanted = false;
  for (FeedAddress* address : {&feed.staticFeed, &feed.alerts})
    if (const auto wanted = known.keyFor(*address)) {
      require(FeedKey::checkHeader(wanted->name + ": " + key));
      *address = withKey(*address, *wanted, key);
      isWanted = true;
    }
  if (!isWanted)
    throw CommandFailure("the catalog knows of no key for the addresses of \"" + feed.name +
                         "\". Give it as a --header, or in the address");
}

/// What was found when feeds that go together were read.
std::vector<protocol::FeedReport> check(const CommandContext& context, std::vector<Feed>& feeds, bool isKnown) {
  WidgetWithProgress widget(context);
  std::vector<protocol::FeedReport> reports;
  for (Feed& feed : feeds) {
    protocol::FeedReport report = widget.call(protocol::kCheckFeed, {.definition = definitionOf(feed)});
    // The catalog says that there are alerts at times.
    if (isKnown && report.isOtherFeed) {
      feed.isCombined = true;
      report = widget.call(protocol::kCheckFeed, {.definition = definitionOf(feed)});
    }
    if (report.alerts && report.alerts->hasOthers) feed.isCombined = true;
    reports.push_back(std::move(report));
  }
  forgiveForeignAlerts(reports);
  return reports;
}

void printFound(const protocol::FeedReport& report) {
  std::cout << printableText(report.name) << ": ";
  if (report.staticFeed)
    std::cout << counted(report.staticFeed->lines, "line") << " of "
              << counted(report.staticFeed->agencies, "agency", "agencies");
  else
    std::cout << "no lines";
  if (report.alerts)
    std::cout << "; " << counted(report.alerts->incidents, "incident") << " in force or to come, "
              << counted(report.alerts->affectedLines, "line") << " affected now";
  std::cout << "\n";
}

/// Tells what was found, and keeps what can be used; of a new feed that is not kept nothing stays.
template <class Keep>
int keepUsable(const CommandContext& context, std::vector<Feed> feeds, const FeedOptions& options, bool isNew,
               const Keep& keep) {
  const auto reports = check(context, feeds, !options.from.empty());
  std::size_t kept = 0;
  for (std::size_t i = 0; i < feeds.size(); ++i) {
    const auto faults = reports[i].faults();
    if (reports[i].staticFeed || reports[i].alerts) printFound(reports[i]);
    for (const protocol::FetchError& fault : faults)
      printMessage(fault.reason + (reports[i].isOtherFeed ? " \"--combined\" does so." : ""));
    if (!faults.empty() && !options.force) {
      if (isNew) FeedCache(context.paths.cache).remove(feeds[i]);
      continue;
    }
    require(keep(feeds[i]));
    ++kept;
  }
  if (kept == 0)
    throw CommandFailure("\"" + options.name + (isNew ? "\" is not set up" : "\" stays as it was") +
                         ". \"--force\" keeps it all the same");
  return kExitSuccess;
}

}  // namespace

int runFeedFind(const CommandContext& context, const std::string& text, bool json) {
  const HostPlatform platform(context);
  const KnownFeeds known = require(KnownFeeds::read());
  const std::vector<KnownFeed> found = known.matching(text, DesktopPlatform::localeOfEnvironment());
  if (json) {
    JSON array = JSON::array();
    for (const KnownFeed& feed : found) array.push_back(writtenFeed(feed));
    std::cout << printableJSON(array.dump(2, ' ', false, JSON::error_handler_t::replace)) << "\n";
    return kExitSuccess;
  }
  if (found.empty()) {
    printCountries(known);
    throw CommandFailure("no agency or place that the catalog knows has \"" + text +
                         "\" in its name. \"feed find COUNTRY\" lists the feeds of a country; \"feed add NAME --static "
                         "ADDRESS --alerts ADDRESS\" sets one up by its addresses");
  }
  std::vector<std::vector<std::string>> table;
  table.reserve(found.size());
  for (const KnownFeed& feed : found)
    table.push_back({printableText(feed.id), printableText(feed.title()), printableText(placeOf(feed)),
                     feed.firstKey() ? "wants a key" : ""});
  printTable(table);
  if (::isatty(STDOUT_FILENO) != 0) std::cout << "Set one up with \"nimbo-transit feed add --from ID\".\n";
  return kExitSuccess;
}

int runFeedAdd(const CommandContext& context, const FeedOptions& given) {
  const HostPlatform platform(context);
  FeedConfiguration configuration(context.paths.config);
  FeedOptions options = given;
  std::vector<Feed> feeds;
  if (options.from.empty()) {
    feeds = {changedFeed(std::nullopt, options)};
    if (const auto key = givenKey(options)) giveKey(feeds.front(), *key);
  } else {
    const KnownFeed known = require(require(KnownFeeds::read()).withID(options.from));
    if (options.name.empty()) options.name = nameForFeed(known, require(configuration.feeds()));
    feeds = feedsOf(known, options.name, keyFor(known, options));
    for (Feed& feed : feeds) applySettings(feed, options);
  }
  for (const Feed& feed : feeds) require(configuration.checkNewName(feed.name));
  std::string added;
  keepUsable(context, feeds, options, true, [&](const Feed& feed) {
    if (added.empty()) added = feed.name;
    return configuration.add(feed);
  });
  std::cout << "Next, choose your lines: \"nimbo-transit lines TEXT\" finds them, \"nimbo-transit favorite add "
            << printableText(added) << ":ROUTE_ID\" adds one.\n";
  return kExitSuccess;
}

int runFeedEdit(const CommandContext& context, const FeedOptions& options) {
  const HostPlatform platform(context);
  FeedConfiguration configuration(context.paths.config);
  Feed feed = changedFeed(require(configuration.feedNamed(options.name)), options);
  if (const auto key = givenKey(options)) giveKey(feed, *key);
  return keepUsable(context, {feed}, options, false,
                    [&](const Feed& changed) { return configuration.replace(changed); });
}

}  // namespace nimbo
