#include "desktop/gtfs/static/LineItems.h"

#include "desktop/gtfs/feeds/FeedMuid.h"
#include "desktop/gtfs/static/LineArtwork.h"

namespace nimbo {

TransitLineLocator LineItems::locatorOf(std::size_t index) const {
  const StaticLine line = _feed.line(index);
  return {_feedName, std::string(_feed.agency(line.agency).id), std::string(line.routeID), std::string(line.shortName),
          modeOfRouteType(line.type)};
}

TransitSystemRef LineItems::system(std::size_t index) {
  TransitSystemRef& system = _systems[index];
  if (!system) {
    const StaticAgency agency = _feed.agency(index);
    // The feed's name is the user's own word for an agency that the feed leaves unnamed.
    system = std::make_shared<const TransitSystem>(
        systemMuid(_feedName, agency.id), std::string(agency.name.empty() ? std::string_view(_feedName) : agency.name),
        modeArtwork(agency.sharedMode, ArtworkUseType::system));
  }
  return system;
}

TransitLineItemRef LineItems::item(std::size_t index, std::uint64_t muid, TransitIncidents incidents) {
  const StaticLine line = _feed.line(index);
  const TransitMode mode = modeOfRouteType(line.type);
  BasicTransitLineItem::Fields fields;
  fields.identifier = std::make_shared<const MapItemIdentifier>(muid, locatorOf(index));
  if (const std::string_view name = nameOfLine(line); !name.empty()) fields.name = name;
  fields.system = system(line.agency);
  fields.artwork = fields.alternateArtwork = lineArtwork(line);
  fields.modeArtwork = modeArtwork(mode, ArtworkUseType::mode);
  if (line.color) fields.lineColorString = colorString(*line.color);
  fields.isBus = mode == TransitMode::bus || mode == TransitMode::trolleybus;
  fields.incidents = std::move(incidents);
  return std::make_shared<const BasicTransitLineItem>(std::move(fields));
}

}  // namespace nimbo
