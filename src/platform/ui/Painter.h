#pragma once

#include <optional>

#include "platform/artwork/ArtworkImageSource.h"
#include "platform/foundation/Geometry.h"
#include "platform/ui/Color.h"
#include "platform/ui/Environment.h"
#include "platform/ui/TextSystem.h"

namespace nimbo {

/// Paints onto a surface, in points. Main thread only.
class Painter {
 public:
  virtual ~Painter() = default;
  virtual void fillRect(const Rect& rect, const Color& color) = 0;
  /// Paints a layout that this platform's text system made, its top left at `origin`, its lines within `width`.
  virtual void drawText(const TextLayout& layout, Point origin, double width, const Color& color) = 0;
  /// Paints an image that this platform made, fitted into `rect` without distortion. `tint`, where its alpha is above
  /// 0, replaces the colours of the image and keeps its shape.
  virtual void drawImage(const Image& image, const Rect& rect, double alpha, const Color& tint) = 0;
  /// Until the matching `restore`, everything is moved by `offset` and cut off outside `clip` (after the move).
  virtual void save(Point offset, const Rect& clip) = 0;
  virtual void restore() = 0;
};

/// What a view that draws itself inherits from those it is in.
struct DrawingContext {
  Appearance appearance = Appearance::light;
  double screenScale = 1;
  std::optional<Color> vibrantColor;  ///< in place of the colours of texts and images, inside a visual effect
};

}  // namespace nimbo
