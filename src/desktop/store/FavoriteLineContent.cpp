#include "desktop/store/FavoriteLineContent.h"

#include <nlohmann/json.hpp>

#include "platform/transit/BasicTransitLineItem.h"

namespace nimbo {

namespace {

using nlohmann::json;

void put(json& object, const char* key, const std::optional<std::string>& text) {
  if (text) object[key] = *text;
}

std::optional<std::string> textOf(const json& object, const char* key) {
  const auto found = object.find(key);
  return found == object.end() ? std::nullopt : std::optional(found->get<std::string>());
}

json jsonOf(const TransitShield& shield) {
  json object{{"type", shield.shieldType}};
  put(object, "text", shield.shieldText);
  put(object, "color", shield.shieldColorString);
  put(object, "textColor", shield.shieldTextColorString);
  return object;
}

TransitShield shieldOf(const json& object) {
  return {object.at("type"), textOf(object, "text"), textOf(object, "color"), textOf(object, "textColor")};
}

json jsonOf(const TransitIcon& icon) {
  return {{"type", icon.iconType},
          {"carto", icon.cartoID},
          {"transitType", icon.defaultTransitType},
          {"attribute", {icon.iconAttributeKey, icon.iconAttributeValue}}};
}

TransitIcon iconOf(const json& object) {
  return {object.at("type"), object.at("carto"), object.at("transitType"), object.at("attribute").at(0),
          object.at("attribute").at(1)};
}

void put(json& object, const char* key, const TransitArtworkRef& artwork) {
  if (!artwork) return;
  json& fields = object[key] = {{"source", artwork->artworkSourceType()}, {"use", artwork->artworkUseType()}};
  if (const auto& shield = artwork->shieldDataSource()) fields["shield"] = jsonOf(*shield);
  if (const auto& icon = artwork->iconDataSource()) fields["icon"] = jsonOf(*icon);
  if (const auto& shield = artwork->iconFallbackShieldDataSource()) fields["fallbackShield"] = jsonOf(*shield);
  put(fields, "accessibilityText", artwork->accessibilityText());
}

TransitArtworkRef artworkOf(const json& object, const char* key) {
  const auto found = object.find(key);
  if (found == object.end()) return nullptr;
  TransitArtwork::Fields fields;
  fields.artworkSourceType = found->at("source");
  fields.artworkUseType = found->at("use");
  if (found->contains("shield")) fields.shieldDataSource = shieldOf(found->at("shield"));
  if (found->contains("icon")) fields.iconDataSource = iconOf(found->at("icon"));
  if (found->contains("fallbackShield")) fields.iconFallbackShieldDataSource = shieldOf(found->at("fallbackShield"));
  fields.accessibilityText = textOf(*found, "accessibilityText");
  return std::make_shared<const TransitArtwork>(std::move(fields));
}

MapItemIdentifierRef identifierOf(std::uint64_t muid, const json& content) {
  std::optional<TransitLineLocator> locator;
  if (const auto found = content.find("locator"); found != content.end())
    locator = TransitLineLocator{found->at("feed"), found->at("agency"), found->at("route"), found->at("shortName"),
                                 static_cast<TransitMode>(found->at("mode").get<std::int64_t>())};
  return std::make_shared<const MapItemIdentifier>(muid, std::move(locator));
}

TransitSystemRef systemOf(const json& content) {
  const auto found = content.find("system");
  if (found == content.end()) return nullptr;
  return std::make_shared<const TransitSystem>(found->at("muid").get<std::uint64_t>(), textOf(*found, "name"),
                                               artworkOf(*found, "artwork"));
}

}  // namespace

std::string contentOfFavoriteLine(const TransitLine& line) {
  json content{{"isBus", line.isBus()}};
  if (const auto& locator = line.identifier()->locator())
    content["locator"] = {{"feed", locator->feed},
                          {"agency", locator->agencyID},
                          {"route", locator->routeID},
                          {"shortName", locator->shortName},
                          {"mode", static_cast<std::int64_t>(locator->mode)}};
  put(content, "name", line.name());
  put(content, "color", line.lineColorString());
  put(content, "artwork", line.artwork());
  put(content, "modeArtwork", line.modeArtwork());
  put(content, "alternateArtwork", line.alternateArtwork());
  if (const auto& system = line.system()) {
    json& fields = content["system"] = {{"muid", system->muid()}};
    put(fields, "name", system->name());
    put(fields, "artwork", system->artwork());
  }
  return content.dump(-1, ' ', false, json::error_handler_t::replace);
}

TransitLineRef favoriteLineOfContent(std::uint64_t muid, std::string_view content) {
  try {
    const json object = json::parse(content);
    BasicTransitLineItem::Fields fields;
    fields.identifier = identifierOf(muid, object);
    fields.name = textOf(object, "name");
    fields.system = systemOf(object);
    fields.artwork = artworkOf(object, "artwork");
    fields.modeArtwork = artworkOf(object, "modeArtwork");
    fields.alternateArtwork = artworkOf(object, "alternateArtwork");
    fields.lineColorString = textOf(object, "color");
    fields.isBus = object.at("isBus");
    return std::make_shared<const BasicTransitLineItem>(std::move(fields));
  } catch (const json::exception&) {
    return nullptr;
  }
}

}  // namespace nimbo
