#pragma once

#include <functional>
#include <string>

#include "desktop/drawing/Picture.h"
#include "platform/artwork/ArtworkCache.h"
#include "platform/artwork/NamedImage.h"
#include "platform/foundation/Outcome.h"
#include "platform/ui/Painter.h"
#include "platform/ui/TextSystem.h"

namespace nimbo {

/// What draws a picture: called once, at once, with the origin at the top left.
using DrawOperation = std::function<void(Painter&)>;

/// What libnimbo-drawing does, the part with Pango and Cairo (system/LatePart.h). Main thread only.
class DrawingPart {
 public:
  virtual ~DrawingPart() = default;

  /// Begins to look for fonts, on a thread of Pango's: for a program that will show text soon, and has other things to
  /// do until then.
  virtual void lookForFonts() = 0;
  /// `language` is the user's, as a BCP 47 tag.
  virtual std::unique_ptr<TextSystem> makeTextSystem(const std::string& language) = 0;
  virtual std::unique_ptr<ImageResources> makeImages() = 0;
  /// `text` is of this part and outlives the renderer.
  virtual std::unique_ptr<ShieldIconRenderer> makeShieldRenderer(TextSystem& text) = 0;
  /// A picture of `size` points at `scale` device pixels a point, over `background`, which shows what the services of
  /// this part made.
  virtual Outcome<PictureRef> render(const DrawOperation& draw, Size size, double scale, const Color& background) = 0;
};

/// Opens the part with the first call. Throws LatePartMissing.
DrawingPart& drawingPart();

}  // namespace nimbo
