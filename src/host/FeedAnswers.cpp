#include "host/FeedAnswers.h"

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

protocol::FeedDefinition definitionOf(const Feed& feed) {
  protocol::FeedDefinition definition{.name = feed.name,
                                      .staticFeed = feed.staticFeed.text(),
                                      .alerts = feed.alerts.text(),
                                      .minorAlerts = feed.minorAlerts,
                                      .isCombined = feed.isCombined};
  if (feed.maximumAlertsAge) definition.maximumAlertsAgeMinutes = feed.maximumAlertsAge->count();
  return definition;
}

}  // namespace nimbo
