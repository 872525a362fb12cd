#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>

#include "platform/foundation/Object.h"
#include "platform/transit/ServerFormattedString.h"

namespace nimbo {

/// Means of transport, as the symbol of a system or of a line without a name. The values are stored in archives.
enum class TransitMode : std::int64_t {
  unknown = 0,
  tram = 1,
  subway = 2,
  rail = 3,
  bus = 4,
  ferry = 5,
  cableTram = 6,
  aerialLift = 7,
  funicular = 8,
  trolleybus = 9,
  monorail = 10,
};

/// What an artwork is drawn from.
enum class ArtworkSourceType : std::int64_t { none = 0, shield = 1, icon = 2, text = 3 };

/// What an artwork stands for.
enum class ArtworkUseType : std::int64_t { line = 0, system = 1, mode = 2 };

/// Shapes of shields.
enum class ShieldType : std::int64_t { roundedBox = 0, circle = 1, pill = 2 };

/// A line's shield: a short text in a coloured shape.
struct TransitShield {
  std::int64_t shieldType = 0;  ///< a ShieldType; others are drawn as a rounded box
  std::optional<std::string> shieldText;
  std::optional<std::string> shieldColorString;      ///< "#rrggbb"; absent: the appearance's neutral colour
  std::optional<std::string> shieldTextColorString;  ///< "#rrggbb"; absent: black or white, whichever contrasts more
};

/// A symbol.
struct TransitIcon {
  std::int64_t iconType = 0;  ///< 1: the symbol of `defaultTransitType`
  std::int64_t cartoID = 0;
  std::int64_t defaultTransitType = 0;  ///< a TransitMode
  std::int64_t iconAttributeKey = 0;
  std::int64_t iconAttributeValue = 0;
};

struct TransitArtworkText {
  std::optional<ServerFormattedString> text;
};

template <class Class>
struct WireObject;

/// A line's shield or a system's symbol, described and not drawn. Immutable.
class TransitArtwork final : public Object {
 public:
  struct Fields {
    std::int64_t artworkSourceType = 0;  ///< an ArtworkSourceType
    std::int64_t artworkUseType = 0;     ///< an ArtworkUseType
    std::optional<TransitShield> shieldDataSource;
    std::optional<TransitIcon> iconDataSource;
    std::optional<TransitShield> iconFallbackShieldDataSource;
    std::optional<TransitArtworkText> textDataSource;
    bool hasRoutingIncidentBadge = false;
    std::optional<std::string> accessibilityText;
  };

  explicit TransitArtwork(Fields fields) : _fields(std::move(fields)) {}
  const Fields& fields() const { return _fields; }

  std::int64_t artworkSourceType() const { return _fields.artworkSourceType; }
  std::int64_t artworkUseType() const { return _fields.artworkUseType; }
  const std::optional<TransitShield>& shieldDataSource() const { return _fields.shieldDataSource; }
  const std::optional<TransitIcon>& iconDataSource() const { return _fields.iconDataSource; }
  const std::optional<TransitShield>& iconFallbackShieldDataSource() const {
    return _fields.iconFallbackShieldDataSource;
  }
  const std::optional<TransitArtworkText>& textDataSource() const { return _fields.textDataSource; }
  bool hasRoutingIncidentBadge() const { return _fields.hasRoutingIncidentBadge; }
  const std::optional<std::string>& accessibilityText() const { return _fields.accessibilityText; }

  std::string_view className() const override { return "TransitArtwork"; }
  /// Equivalence field by field; a shield's text colour, which follows from its colour, plays no part.
  bool isEqual(const Object* other) const override;
  std::uint64_t hash() const override;
  /// The class name and the accessibility text or shield text.
  std::string description() const override;

 private:
  template <class Class>
  friend struct WireObject;  // fills the fields of an artwork that is being read

  Fields _fields;
};

using TransitArtworkRef = std::shared_ptr<const TransitArtwork>;

/// Whether two artworks show the same: both absent, or alike in every field that tells artworks apart.
bool artworksAreEquivalent(const TransitArtwork* a, const TransitArtwork* b);

}  // namespace nimbo
