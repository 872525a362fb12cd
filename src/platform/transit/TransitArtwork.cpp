#include "platform/transit/TransitArtwork.h"

#include "platform/foundation/Hash.h"

namespace nimbo {

namespace {

/// Both absent, or both present and `match`.
template <class T, class Match>
bool absentOrMatching(const std::optional<T>& a, const std::optional<T>& b, Match match) {
  return a.has_value() == b.has_value() && (!a || match(*a, *b));
}

bool shieldsMatch(const TransitShield& a, const TransitShield& b) {
  return a.shieldType == b.shieldType && a.shieldText == b.shieldText && a.shieldColorString == b.shieldColorString;
}

bool iconsMatch(const TransitIcon& a, const TransitIcon& b) {
  return a.iconType == b.iconType && a.cartoID == b.cartoID && a.defaultTransitType == b.defaultTransitType &&
         a.iconAttributeKey == b.iconAttributeKey && a.iconAttributeValue == b.iconAttributeValue;
}

bool tokensMatch(const std::vector<ServerFormatToken>& a, const std::vector<ServerFormatToken>& b) {
  if (a.size() != b.size()) return false;
  for (std::size_t i = 0; i < a.size(); ++i)
    if (!ServerFormatTokenEqual(a[i], b[i])) return false;
  return true;
}

bool formattedStringsMatch(const ServerFormattedString& a, const ServerFormattedString& b) {
  return a.formatStrings == b.formatStrings && a.separators == b.separators &&
         absentOrMatching(a.formatTokens, b.formatTokens, tokensMatch) && a.alternativeString == b.alternativeString;
}

bool textsMatch(const TransitArtworkText& a, const TransitArtworkText& b) {
  return absentOrMatching(a.text, b.text, formattedStringsMatch);
}

}  // namespace

bool artworksAreEquivalent(const TransitArtwork* a, const TransitArtwork* b) {
  if (!a || !b) return a == b;
  return a == b ||
         (a->artworkSourceType() == b->artworkSourceType() && a->artworkUseType() == b->artworkUseType() &&
          absentOrMatching(a->shieldDataSource(), b->shieldDataSource(), shieldsMatch) &&
          absentOrMatching(a->iconDataSource(), b->iconDataSource(), iconsMatch) &&
          absentOrMatching(a->iconFallbackShieldDataSource(), b->iconFallbackShieldDataSource(), shieldsMatch) &&
          absentOrMatching(a->textDataSource(), b->textDataSource(), textsMatch) &&
          a->hasRoutingIncidentBadge() == b->hasRoutingIncidentBadge() &&
          a->accessibilityText() == b->accessibilityText());
}

bool TransitArtwork::isEqual(const Object* other) const {
  const auto* artwork = instanceOf<TransitArtwork>(other);
  return artwork && artworksAreEquivalent(this, artwork);
}

std::uint64_t TransitArtwork::hash() const {
  std::uint64_t hash = hashOfBytes(_fields.accessibilityText.value_or(""));
  if (const auto& shield = _fields.shieldDataSource) {
    hash = hashOfBytes(shield->shieldText.value_or(""), hash);
    hash = hashOfBytes(shield->shieldColorString.value_or(""), hash);
  }
  return hash;
}

std::string TransitArtwork::description() const {
  std::string text;
  if (_fields.accessibilityText)
    text = *_fields.accessibilityText;
  else if (_fields.shieldDataSource)
    text = _fields.shieldDataSource->shieldText.value_or("");
  return "<TransitArtwork: " + text + ">";
}

}  // namespace nimbo
