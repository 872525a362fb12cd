#pragma once

#include <cstdint>
#include <memory>
#include <vector>

#include "host/layer/Compositor.h"
#include "host/layer/WaylandHandles.h"
#include "platform/foundation/Geometry.h"
#include "protocol/Messages.h"

namespace nimbo {

/// Where a surface stands on its output.
struct LayerPlacement {
  std::uint32_t layer = 1;   ///< 0 background, 1 bottom, 2 top, 3 overlay
  std::uint32_t anchor = 9;  ///< edges that it keeps to, added: 1 top, 2 bottom, 4 left, 8 right; 0: the middle
  struct Margins {
    std::int32_t top = 0, right = 0, bottom = 0, left = 0;
  } margins;  ///< points from those edges
};

/// A surface of the desktop's layers. Main thread only.
class LayerSurface {
 public:
  enum class Button { left, middle, right };

  /// Hears of the surface. Outlives it.
  class Delegate {
   public:
    virtual ~Delegate() = default;
    /// A picture can be shown now: the surface came up, or `askForFrame` is answered.
    virtual void surfaceMayBeDrawn() = 0;
    /// Whether the surface is seen: told with each answer to `askForFrame`, and when none comes.
    virtual void surfaceIsSeen(bool isSeen) = 0;
    /// Pictures are to have another scale.
    virtual void surfaceScaleChanged() = 0;
    /// The compositor has room for so many points; no more than were asked for.
    virtual void surfaceWidthGiven(std::int32_t width) = 0;
    /// The compositor has taken it off the screen: it is to be destroyed, in this call or later.
    virtual void surfaceClosed() = 0;

    // Pointer, finger and keyboard; places are points of the surface.
    virtual void pressed(Button button, Point place) = 0;
    virtual void released(Button button, Point place) = 0;
    virtual void handMoved(Point place) = 0;
    virtual void handLeft() = 0;
    /// `code` is the kernel's, as in linux/input-event-codes.h.
    virtual void keyPressed(std::uint32_t code, bool isShifted) = 0;
    virtual void keyboardLeft() = 0;
  };

  /// A surface of `width` by `height` points, on the output, or where the compositor chooses when that is null.
  LayerSurface(Compositor& compositor, const Compositor::Output* output, const LayerPlacement& placement,
               std::int32_t width, std::int32_t height, Delegate& delegate);
  ~LayerSurface();
  LayerSurface(const LayerSurface&) = delete;
  LayerSurface& operator=(const LayerSurface&) = delete;

  Delegate& delegate() { return _delegate; }
  /// Device pixels for each point.
  double scale() const { return _scale; }
  /// Looks at the scales of its outputs again.
  void updateScale();

  /// Has `surfaceMayBeDrawn` called when the compositor is about to show the surface anew: not while it is hidden or
  /// its output is off.
  void askForFrame();
  /// Shows a picture, in the height that it has.
  void show(wl_buffer* buffer, const protocol::Rendered& picture);
  /// Whether pictures are shown in parts of a pixel, so that their sizes are free.
  bool hasViewport() const { return _viewport != nullptr; }

  /// Seconds after which a surface that gets no frame is taken for hidden, and between two looks whether it is.
  static constexpr TimeInterval kUnseen = 5, kGlance = 30;

 private:
  struct Events;
  void configure(std::uint32_t serial, std::uint32_t width);
  double wantedScale() const;
  void requestFrame();
  void frameCame();
  void lookAgainLater();

  Compositor& _compositor;
  Delegate& _delegate;
  const std::int32_t _width;
  std::int32_t _height;
  WaylandHandle<wl_surface> _surface;
  WaylandHandle<zwlr_layer_surface_v1> _layerSurface;
  WaylandHandle<wp_viewport> _viewport;
  WaylandHandle<wp_fractional_scale_v1> _fractionalScale;
  WaylandHandle<wl_callback> _frame;  // while one is waited for
  std::shared_ptr<Timer> _unseen;     // as long
  std::shared_ptr<Timer> _glance;     // in between
  std::vector<wl_output*> _entered;
  double _scale = 1;
  double _toldScale = 0;  // by the compositor, in fractions; 0: never
  bool _isConfigured = false;
  bool _isMapped = false;
  bool _drawsNext = false;  // with the frame that is waited for
};

}  // namespace nimbo
