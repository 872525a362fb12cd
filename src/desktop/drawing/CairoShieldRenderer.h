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
  /// A text on one line.
  struct FittedText {
    TextLayoutRef layout;
    double pointSize;
    double condensed = 1;  ///< horizontal scale, 1 where it stays as it is
    double width() const { return layout->size().width * condensed; }
  };

  /// An image as high as the size says and `width` points wide, wider for the badge where there is one.
  ImageRef drawFramed(double width, const Look& look, const std::function<void(cairo_t*)>& draw) const;
  /// How wide a shape may be that leaves room for the badge, if it has one.
  static double widestWithin(const Look& look);
  TextLayoutRef layOut(const std::string& text, double pointSize, double width) const;
  /// The text in its full size; absent where that takes more than `width` points.
  std::optional<FittedText> whole(const std::string& text, const ShieldMetrics& metrics, double width) const;
  /// The text in `width` points: shrunk first, then condensed down to `mostCondensed`, then without its end.
  FittedText squeezed(const std::string& text, const ShieldMetrics& metrics, double width, double mostCondensed) const;
  /// How wide a text may be for its corners to stay inside a circle, with a hair of room.
  double circleTextWidth(const ShieldMetrics& metrics) const;
  /// Centres the capital letters in a box at the origin.
  void drawCentered(cairo_t* context, const FittedText& text, Size box, const Color& color) const;

  TextSystem& _text;
};

}  // namespace nimbo
