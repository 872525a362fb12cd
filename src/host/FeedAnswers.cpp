#include "host/FeedAnswers.h"

#include <algorithm>

#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/static/LineItems.h"
#include "platform/transit/BasicTransitLineItem.h"

namespace nimbo {

TransitArtworkRef artworkOf(const std::optional<protocol::Shield>& shield, ArtworkUseType use) {
  if (!shield) return nullptr;
  TransitArtwork::Fields fields;
  const bool isIcon = shield->icon && !shield->text;
  fields.artworkSourceType = static_cast<std::int64_t>(isIcon ? ArtworkSourceType::icon : ArtworkSourceType::shield);
  fields.artworkUseType = static_cast<std::int64_t>(use);
  if (!isIcon) fields.shieldDataSource = TransitShield{shield->type, shield->text, shield->color, shield->textColor};
  if (const auto& icon = shield->icon)
    fields.iconDataSource = TransitIcon{icon->iconType, icon->cartoID, icon->defaultTransitType, icon->iconAttributeKey,
                                        icon->iconAttributeValue};
  fields.accessibilityText = shield->accessibilityText;
  return std::make_shared<const TransitArtwork>(std::move(fields));
}

TransitLineRef lineOf(const protocol::FeedLine& line) {
  const auto mode = static_cast<TransitMode>(line.mode);
  BasicTransitLineItem::Fields fields;
  fields.identifier = std::make_shared<const MapItemIdentifier>(
      line.muid, TransitLineLocator{line.feed, line.agency.id, line.routeID, line.shortName, mode});
  fields.name = line.name;
  fields.system = std::make_shared<const TransitSystem>(line.agency.muid, line.agency.name,
                                                        artworkOf(line.agency.artwork, ArtworkUseType::system));
  fields.artwork = fields.alternateArtwork = artworkOf(line.artwork);
  if (mode != TransitMode::unknown)
    fields.modeArtwork = artworkOf(
        protocol::Shield{.icon = protocol::Icon{.iconType = 1, .defaultTransitType = line.mode}}, ArtworkUseType::mode);
  fields.lineColorString = line.color;
  fields.isBus = mode == TransitMode::bus || mode == TransitMode::trolleybus;
  return std::make_shared<const BasicTransitLineItem>(std::move(fields));
}

ErrorRef errorOf(const protocol::FetchError& error) {
  const ErrorRef written =
      Error::errorWithDomain_code_reason(error.domain, error.code, error.reason, error.subject.value_or(""));
  return error.feed ? written->ofFeed(*error.feed) : written;
}

protocol::LineKey keyOf(const MapItemIdentifier& identifier) {
  const TransitLineLocator& locator = identifier.locator().value();
  return {.id = writtenNameOfLine(identifier),
          .agencyID = locator.agencyID,
          .shortName = locator.shortName,
          .mode = static_cast<std::int64_t>(locator.mode)};
}

namespace {

/// Whether a fault tells only that no alert is about this one of several feeds that go with the same alerts.
bool isOfForeignAlerts(const std::optional<protocol::FetchError>& fault) {
  return fault && fault->domain == kTransitLineServiceErrorDomain &&
         fault->code == static_cast<std::int64_t>(TransitLineServiceError::foreignAlerts);
}

}  // namespace

void forgiveForeignAlerts(std::vector<protocol::FeedReport>& reports) {
  const bool belongs = std::any_of(reports.begin(), reports.end(), [](const protocol::FeedReport& report) {
    return report.alerts && report.staticFeed && !isOfForeignAlerts(report.alerts->gap);
  });
  for (protocol::FeedReport& report : reports)
    if (belongs && report.alerts && isOfForeignAlerts(report.alerts->gap)) report.alerts->gap.reset();
}

protocol::FeedDefinition definitionOf(const Feed& feed) {
  protocol::FeedDefinition definition{.name = feed.name,
                                      .staticFeed = feed.staticFeed.text(),
                                      .alerts = feed.alerts.text(),
                                      .minorAlerts = feed.minorAlerts,
                                      .isCombined = feed.isCombined};
  if (feed.staticMirror) definition.staticMirror = feed.staticMirror->text();
  for (const auto& [address, key] :
       {std::pair(&feed.staticFeed, &definition.staticKey), {&feed.alerts, &definition.alertsKey}})
    if (!address->key().isEmpty()) *key = {address->key().headers, address->key().query};
  definition.sharesAlerts = feed.sharesAlerts;
  if (feed.maximumAlertsAge) definition.maximumAlertsAgeMinutes = feed.maximumAlertsAge->count();
  return definition;
}

}  // namespace nimbo
