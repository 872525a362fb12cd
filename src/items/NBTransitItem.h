#pragma once

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "handoff/NBOpenable.h"
#include "items/NBConfiguredArtwork.h"

namespace nimbo {

/// One row of the widget. Immutable. Equal when every field is, however deep.
class NBTransitItem : public Object {
 public:
  /// Everything but `artworkHidden` may be absent.
  static std::shared_ptr<const NBTransitItem> initWithPrimaryText_secondaryText_artwork_artworkHidden_openable(
      std::optional<std::string> primaryText, std::optional<std::string> secondaryText, NBConfiguredArtworkRef artwork,
      bool artworkHidden, NBOpenableRef openable);
  NBTransitItem(std::optional<std::string> primaryText, std::optional<std::string> secondaryText,
                NBConfiguredArtworkRef artwork, bool artworkHidden, NBOpenableRef openable)
      : _primaryText(std::move(primaryText)),
        _secondaryText(std::move(secondaryText)),
        _artwork(std::move(artwork)),
        _artworkHidden(artworkHidden),
        _openable(std::move(openable)) {}

  /// The title.
  const std::optional<std::string>& primaryText() const { return _primaryText; }
  /// The second line.
  const std::optional<std::string>& secondaryText() const { return _secondaryText; }
  /// The shield or symbol, or null.
  const NBConfiguredArtworkRef& artwork() const { return _artwork; }
  /// Whether the row has no place for an artwork at all.
  bool isArtworkHidden() const { return _artworkHidden; }
  /// What a tap opens, or null.
  const NBOpenableRef& openable() const { return _openable; }

  /// An equal item that is another object. A derived class answers one of its own class.
  virtual std::shared_ptr<const NBTransitItem> copyWithZone() const;
  /// The same row with another second line and another artwork.
  std::shared_ptr<const NBTransitItem> copyWithSecondaryText_artwork(std::optional<std::string> secondaryText,
                                                                     NBConfiguredArtworkRef artwork) const;

  bool isEqualToTransitItem(const NBTransitItem& other) const;

  std::string_view className() const override { return "NBTransitItem"; }
  /// An object of a derived class, which may mean more than is compared here, is never equal.
  bool isEqual(const Object* other) const override;
  std::uint64_t hash() const override;
  std::string description() const override;

 private:
  std::optional<std::string> _primaryText;
  std::optional<std::string> _secondaryText;
  NBConfiguredArtworkRef _artwork;
  bool _artworkHidden;
  NBOpenableRef _openable;
};

using NBTransitItemRef = std::shared_ptr<const NBTransitItem>;
using NBTransitItems = std::vector<NBTransitItemRef>;

}  // namespace nimbo
