#pragma once

#include "platform/transit/MapItemIdentifier.h"
#include "platform/transit/TransitLine.h"
#include "platform/wire/FieldTable.h"
#include "platform/wire/StoredTransitIncident.h"

// Incidents and transit values as messages. The numbers are part of the hand-off and of saved states: they never
// change.

namespace nimbo {

struct AffectedEntityFields {
  std::uint64_t muid = 0;
  std::optional<std::vector<std::uint64_t>> nextStopIDs;
};

template <>
struct RecordTable<AffectedEntityFields> {
  static constexpr std::tuple fields{Field{1, "muid", &AffectedEntityFields::muid},
                                     Field{2, "nextStopIDs", &AffectedEntityFields::nextStopIDs}};
};

/// What an incident of a record affects.
class StoredAffectedEntity final : public TransitIncidentAffectedEntity {
 public:
  std::uint64_t muid() const override { return fields.muid; }
  bool hasNextStopIDs() const override { return fields.nextStopIDs.has_value(); }
  std::optional<std::vector<std::uint64_t>> nextStopIDs() const override { return fields.nextStopIDs; }
  std::string_view className() const override { return "StoredAffectedEntity"; }

  AffectedEntityFields fields;
};

template <>
struct WireObject<TransitIncidentAffectedEntity> {
  static AffectedEntityFields fields(const TransitIncidentAffectedEntity& entity) {
    return {entity.muid(), entity.nextStopIDs()};
  }
  template <class Fill>
  static std::shared_ptr<const TransitIncidentAffectedEntity> make(Fill fill) {
    const auto entity = std::make_shared<StoredAffectedEntity>();
    return fill(entity->fields) ? entity : nullptr;
  }
};

template <>
struct RecordTable<TransitIncidentFields> {
  using Fields = TransitIncidentFields;
  static constexpr std::tuple fields{Field{1, "muid", &Fields::muid},
                                     Field{2, "title", &Fields::title},
                                     Field{3, "summary", &Fields::summary},
                                     Field{4, "fullDescription", &Fields::fullDescription},
                                     Field{5, "messageForRoutePlanning", &Fields::messageForRoutePlanning},
                                     Field{6, "messageForRouteStepping", &Fields::messageForRouteStepping},
                                     Field{7, "messageForNonRoutable", &Fields::messageForNonRoutable},
                                     Field{8, "startDate", &Fields::startDate},
                                     Field{9, "endDate", &Fields::endDate},
                                     Field{10, "creationDate", &Fields::creationDate},
                                     Field{11, "lastUpdated", &Fields::lastUpdated},
                                     Field{12, "iconType", &Fields::iconType},
                                     Field{13, "isBlockingIncident", &Fields::isBlockingIncident},
                                     Field{14, "affectedEntities", &Fields::affectedEntities},
                                     Field{15, "linkURL", &Fields::linkURL}};
};

/// Only for incidents that are `StoredTransitIncident`s.
template <>
struct WireObject<TransitIncident> {
  static const TransitIncidentFields& fields(const TransitIncident& incident) {
    return static_cast<const StoredTransitIncident&>(incident).fields();
  }
  template <class Fill>
  static TransitIncidentRef make(Fill fill) {
    const auto incident = std::make_shared<StoredTransitIncident>();
    return fill(incident->_fields) ? incident : nullptr;
  }
};

template <>
struct RecordTable<TransitShield> {
  static constexpr std::tuple fields{Field{1, "shieldType", &TransitShield::shieldType},
                                     Field{2, "shieldText", &TransitShield::shieldText},
                                     Field{3, "shieldColorString", &TransitShield::shieldColorString},
                                     Field{4, "shieldTextColorString", &TransitShield::shieldTextColorString}};
};

template <>
struct RecordTable<TransitIcon> {
  static constexpr std::tuple fields{Field{1, "iconType", &TransitIcon::iconType},
                                     Field{2, "cartoID", &TransitIcon::cartoID},
                                     Field{3, "defaultTransitType", &TransitIcon::defaultTransitType},
                                     Field{4, "iconAttributeKey", &TransitIcon::iconAttributeKey},
                                     Field{5, "iconAttributeValue", &TransitIcon::iconAttributeValue}};
};

template <>
struct RecordTable<ServerFormatToken> {
  static constexpr std::tuple fields{Field{1, "name", &ServerFormatToken::name},
                                     Field{2, "value", &ServerFormatToken::value}};
};

template <>
struct RecordTable<ServerFormattedString> {
  static constexpr std::tuple fields{Field{1, "formatStrings", &ServerFormattedString::formatStrings},
                                     Field{2, "separators", &ServerFormattedString::separators},
                                     Field{3, "formatTokens", &ServerFormattedString::formatTokens},
                                     Field{4, "alternativeString", &ServerFormattedString::alternativeString}};
};

template <>
struct RecordTable<TransitArtworkText> {
  static constexpr std::tuple fields{Field{1, "text", &TransitArtworkText::text}};
};

template <>
struct RecordTable<TransitArtwork::Fields> {
  using Fields = TransitArtwork::Fields;
  static constexpr std::tuple fields{Field{1, "artworkSourceType", &Fields::artworkSourceType},
                                     Field{2, "artworkUseType", &Fields::artworkUseType},
                                     Field{3, "shieldDataSource", &Fields::shieldDataSource},
                                     Field{4, "iconDataSource", &Fields::iconDataSource},
                                     Field{5, "iconFallbackShieldDataSource", &Fields::iconFallbackShieldDataSource},
                                     Field{6, "textDataSource", &Fields::textDataSource},
                                     Field{7, "hasRoutingIncidentBadge", &Fields::hasRoutingIncidentBadge},
                                     Field{8, "accessibilityText", &Fields::accessibilityText}};
};

template <>
struct WireObject<TransitArtwork> {
  static const TransitArtwork::Fields& fields(const TransitArtwork& artwork) { return artwork.fields(); }
  /// Filled in place: the fields are too large to be moved for nothing.
  template <class Fill>
  static TransitArtworkRef make(Fill fill) {
    const auto artwork = std::make_shared<TransitArtwork>(TransitArtwork::Fields());
    return fill(artwork->_fields) ? artwork : nullptr;
  }
};

struct TransitSystemFields {
  std::uint64_t muid = 0;
  std::optional<std::string> name;
  TransitArtworkRef artwork;
};

template <>
struct RecordTable<TransitSystemFields> {
  static constexpr std::tuple fields{Field{1, "muid", &TransitSystemFields::muid},
                                     Field{2, "name", &TransitSystemFields::name},
                                     Field{3, "artwork", &TransitSystemFields::artwork}};
};

template <>
struct WireObject<TransitSystem> {
  static TransitSystemFields fields(const TransitSystem& system) {
    return {system.muid(), system.name(), system.artwork()};
  }
  template <class Fill>
  static TransitSystemRef make(Fill fill) {
    TransitSystemFields fields;
    if (!fill(fields)) return nullptr;
    return std::make_shared<const TransitSystem>(fields.muid, std::move(fields.name), std::move(fields.artwork));
  }
};

template <>
struct RecordTable<TransitLineLocator> {
  static constexpr std::tuple fields{
      Field{1, "feed", &TransitLineLocator::feed}, Field{2, "agencyID", &TransitLineLocator::agencyID},
      Field{3, "routeID", &TransitLineLocator::routeID}, Field{4, "shortName", &TransitLineLocator::shortName},
      Field{5, "mode", &TransitLineLocator::mode}};
};

struct MapItemIdentifierFields {
  std::uint64_t muid = 0;
  std::optional<TransitLineLocator> locator;
};

template <>
struct RecordTable<MapItemIdentifierFields> {
  static constexpr std::tuple fields{Field{1, "muid", &MapItemIdentifierFields::muid},
                                     Field{2, "locator", &MapItemIdentifierFields::locator}};
};

template <>
struct WireObject<MapItemIdentifier> {
  static MapItemIdentifierFields fields(const MapItemIdentifier& identifier) {
    return {identifier.muid(), identifier.locator()};
  }
  template <class Fill>
  static MapItemIdentifierRef make(Fill fill) {
    MapItemIdentifierFields fields;
    if (!fill(fields)) return nullptr;
    return std::make_shared<const MapItemIdentifier>(fields.muid, std::move(fields.locator));
  }
};

}  // namespace nimbo
