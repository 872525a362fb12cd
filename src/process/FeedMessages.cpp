#include "process/FeedMessages.h"

#include "desktop/gtfs/static/LineItems.h"
#include "desktop/gtfs/text/Utf8.h"
#include "process/Snapshot.h"

namespace nimbo {

namespace {

std::optional<std::string> shortenedIn(const std::optional<std::string>& name) {
  return name ? std::optional(shortened(*name)) : std::nullopt;
}

std::optional<protocol::Shield> shieldIn(const TransitArtworkRef& artwork) {
  if (!artwork) return std::nullopt;
  protocol::Shield shield = shieldOf(*artwork);
  shield.accessibilityText = shortenedIn(shield.accessibilityText);
  return shield;
}

std::optional<protocol::FetchError> fetchErrorIn(const ErrorRef& error) {
  return error ? std::optional(fetchErrorOf(*error)) : std::nullopt;
}

std::vector<protocol::Skipped> skippedIn(const SkipReport& report) {
  std::vector<protocol::Skipped> skipped;
  for (const SkipReport::Entry& entry : report.entries()) skipped.push_back({entry.reason, entry.count, entry.example});
  return skipped;
}

}  // namespace

std::string shortened(const std::string& name) {
  constexpr std::size_t kLongestName = 500;
  return std::string(firstCharacters(name, kLongestName));
}

protocol::FeedLine writtenLine(const FeedCatalog::Line& described) {
  const TransitLine& line = *described.line;
  const TransitLineLocator& locator = line.identifier()->locator().value();
  const TransitSystem& system = *line.system();
  return {.id = writtenNameOfLine(*line.identifier()),
          .muid = line.muid(),
          .feed = locator.feed,
          .routeID = locator.routeID,
          .shortName = locator.shortName,
          .longName = shortened(described.longName),
          .name = shortenedIn(line.name()),
          .agency = {locator.agencyID, system.muid(), shortenedIn(system.name()), shieldIn(system.artwork())},
          .mode = static_cast<std::int64_t>(locator.mode),
          .color = line.lineColorString(),
          .artwork = shieldIn(line.artwork())};
}

protocol::FeedReport writtenReport(const FeedCheckReport& report) {
  protocol::FeedReport written{.name = report.name,
                               .staticError = fetchErrorIn(report.staticError),
                               .alertsError = fetchErrorIn(report.alertsError),
                               .isOtherFeed = report.isOtherFeed()};
  if (const auto& feed = report.staticFeed)
    written.staticFeed = {feed->agencies, feed->lines, feed->trips, feed->language, skippedIn(feed->skipped)};
  if (const auto& alerts = report.alerts)
    written.alerts = {.version = alerts->version,
                      .timestamp = alerts->timestamp,
                      .staleness = fetchErrorIn(alerts->staleness),
                      .gap = fetchErrorIn(alerts->gap),
                      .alerts = alerts->alerts,
                      .skipped = skippedIn(alerts->skipped),
                      .hasOthers = alerts->hasOthers,
                      .periods = alerts->periods,
                      .selectors = alerts->selectors,
                      .incidents = alerts->incidents,
                      .affectedLines = alerts->affectedLines,
                      .unfit = skippedIn(alerts->unfit)};
  return written;
}

namespace {

Outcome<FeedAddress> addressOf(const std::string& text, const std::optional<protocol::FeedKey>& key) {
  const auto address = FeedAddress::parse(text);
  if (!address || !key) return address;
  for (const std::string& header : key->headers)
    if (ErrorRef error = FeedKey::checkHeader(header)) return error;
  return address->withKey({key->headers, key->query});
}

}  // namespace

Outcome<Feed> feedOf(const protocol::FeedDefinition& definition) {
  if (ErrorRef error = FeedConfiguration::checkName(definition.name)) return error;
  const auto staticFeed = addressOf(definition.staticFeed, definition.staticKey),
             alerts = addressOf(definition.alerts, definition.alertsKey);
  for (const auto* address : {&staticFeed, &alerts})
    if (!*address) return address->error();
  std::optional<FeedAddress> mirror;
  if (definition.staticMirror) {
    const auto address = FeedAddress::parse(*definition.staticMirror);
    if (!address) return address.error();
    mirror = *address;
  }
  Feed feed{.name = definition.name,
            .staticFeed = *staticFeed,
            .alerts = *alerts,
            .staticMirror = mirror,
            .minorAlerts = definition.minorAlerts,
            .isCombined = definition.isCombined,
            .sharesAlerts = definition.sharesAlerts};
  if (definition.maximumAlertsAgeMinutes)
    feed.maximumAlertsAge = std::chrono::minutes(*definition.maximumAlertsAgeMinutes);
  return feed;
}

}  // namespace nimbo
