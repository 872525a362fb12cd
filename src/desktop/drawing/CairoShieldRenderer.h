#pragma once

#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "desktop/drawing/ShieldStyle.h"
#include "desktop/raii/CairoHandles.h"
#include "platform/artwork/ArtworkCache.h"
#include "platform/ui/TextSystem.h"

namespace nimbo {

/// Draws shields as rounded boxes, circles and pills with their text fitted, and modes of transport as symbols; as
/// CairoImages. No icons are kept: they are parts of the program.
class CairoShieldRenderer final : public ShieldIconRenderer {
 public:
  /// `text` is the platform's, outlives the renderer, and lays out for the same painters.
  explicit CairoShieldRenderer(TextSystem& text) : _text(text) {}

  ImageRef render(const TransitArtwork& artwork, std::int64_t shieldSize, double screenScale, bool nightMode) override;
  void setCachesIconAtlases(bool) override {}

 private:
  /// How one artwork is to be drawn.
  struct Look {
    const ShieldMetrics& metrics;
    double screenScale;
    bool nightMode;
    bool hasBadge;
  };

  ImageRef renderShield(const TransitShield& shield, const Look& look);
  ImageRef renderSymbol(std::string_view name, const Look& look);
  ImageRef renderText(const std::string& text, const Look& look);
  /// An image as high as the size says and `width` points wide, wider for the badge where there is one.
  ImageRef drawFramed(double width, const Look& look, const std::function<void(cairo_t*)>& draw) const;
  /// The text on one line of at most `width` points: shrunk first, then without its end.
  TextLayoutRef fit(const std::string& text, const ShieldMetrics& metrics, double width, double& pointSize) const;
  /// How wide a text may be for its corners to stay inside a circle, with a hair of room.
  double circleTextWidth(const ShieldMetrics& metrics) const;
  /// Centres the capital letters in a box at the origin.
  void drawCentered(cairo_t* context, const TextLayout& text, double pointSize, Size box, const Color& color) const;

  TextSystem& _text;
};

}  // namespace nimbo
