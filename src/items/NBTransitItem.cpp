#include "items/NBTransitItem.h"

#include <typeinfo>

#include "platform/foundation/Hash.h"

namespace nimbo {

namespace {
std::uint64_t hashOfText(const std::optional<std::string>& text) { return text ? hashOfBytes(*text) : 0; }
}  // namespace

NBTransitItemRef NBTransitItem::initWithPrimaryText_secondaryText_artwork_artworkHidden_openable(
    std::optional<std::string> primaryText, std::optional<std::string> secondaryText, NBConfiguredArtworkRef artwork,
    bool artworkHidden, NBOpenableRef openable) {
  return std::make_shared<const NBTransitItem>(std::move(primaryText), std::move(secondaryText), std::move(artwork),
                                               artworkHidden, std::move(openable));
}

NBTransitItemRef NBTransitItem::copyWithZone() const {
  return initWithPrimaryText_secondaryText_artwork_artworkHidden_openable(_primaryText, _secondaryText, _artwork,
                                                                          _artworkHidden, _openable);
}

NBTransitItemRef NBTransitItem::copyWithSecondaryText_artwork(std::optional<std::string> secondaryText,
                                                              NBConfiguredArtworkRef artwork) const {
  return initWithPrimaryText_secondaryText_artwork_artworkHidden_openable(
      _primaryText, std::move(secondaryText), std::move(artwork), _artworkHidden, _openable);
}

bool NBTransitItem::isEqualToTransitItem(const NBTransitItem& other) const {
  return absentOrEqual(_artwork, other._artwork) && _artworkHidden == other._artworkHidden &&
         _primaryText == other._primaryText && _secondaryText == other._secondaryText &&
         absentOrEqual(_openable, other._openable);
}

bool NBTransitItem::isEqual(const Object* other) const {
  if (this == other) return true;
  if (!other || typeid(*other) != typeid(NBTransitItem)) return false;
  return isEqualToTransitItem(static_cast<const NBTransitItem&>(*other));
}

std::uint64_t NBTransitItem::hash() const {
  return hashOfText(_primaryText) ^ hashOfText(_secondaryText) ^ hashOf(_artwork) ^
         (_artworkHidden ? kHashMultiplier : 0) ^ hashOf(_openable);
}

std::string NBTransitItem::description() const {
  return "<" + std::string(className()) + ":" + addressText() + " | text: " + _primaryText.value_or("(null)") +
         " | subtext: " + _secondaryText.value_or("(null)") + " | artwork: " + descriptionOf(_artwork) +
         " | hideArtwork?: " + (_artworkHidden ? "YES" : "NO") + " | openable: " + descriptionOf(_openable) + ">";
}

}  // namespace nimbo
