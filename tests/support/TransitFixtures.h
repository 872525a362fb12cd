#pragma once

#include "platform/transit/BasicTransitLineItem.h"
#include "platform/transit/TransitIncident.h"

namespace nimbo {

/// A shield with a text, as lines have.
inline TransitArtworkRef shieldArtwork(const std::string& text) {
  TransitArtwork::Fields fields;
  fields.artworkSourceType = static_cast<std::int64_t>(ArtworkSourceType::shield);
  fields.shieldDataSource = TransitShield{0, text, "#336699", {}};
  fields.accessibilityText = text;
  return std::make_shared<const TransitArtwork>(std::move(fields));
}

/// The symbol of a mode, as systems have.
inline TransitArtworkRef modeArtwork(TransitMode mode) {
  TransitArtwork::Fields fields;
  fields.artworkSourceType = static_cast<std::int64_t>(ArtworkSourceType::icon);
  fields.artworkUseType = static_cast<std::int64_t>(ArtworkUseType::system);
  fields.iconDataSource = TransitIcon{1, 0, static_cast<std::int64_t>(mode), 0, 0};
  return std::make_shared<const TransitArtwork>(std::move(fields));
}

/// An incident of title "Incident N" and summary "Summary N", in force since ever unless dates are given.
inline TransitIncidentRef incident(std::uint64_t muid, std::optional<Date> start = {}, std::optional<Date> end = {}) {
  TransitIncidentFields fields;
  fields.muid = muid;
  fields.title = "Incident " + std::to_string(muid);
  fields.summary = "Summary " + std::to_string(muid);
  fields.startDate = start;
  fields.endDate = end;
  return std::make_shared<const BasicTransitIncident>(std::move(fields));
}

/// A line, with shields that show its name.
inline TransitLineItemRef lineItem(std::uint64_t muid, const std::string& name, TransitIncidents incidents = {},
                                   TransitSystemRef system = nullptr, bool hasShield = true) {
  BasicTransitLineItem::Fields fields;
  fields.identifier = std::make_shared<const MapItemIdentifier>(muid);
  fields.name = name;
  fields.system = std::move(system);
  if (hasShield) fields.artwork = shieldArtwork(name);
  fields.alternateArtwork = fields.artwork;
  fields.incidents = std::move(incidents);
  return std::make_shared<const BasicTransitLineItem>(std::move(fields));
}

}  // namespace nimbo
