#pragma once

#include <cstdint>
#include <optional>

#include "host/layer/WaylandHandles.h"
#include "platform/foundation/Geometry.h"

namespace nimbo {

class Compositor;
class LayerSurface;

/// The user's pointer, touch screen and keyboard: tells the surface that they are at what they do. Main thread only.
class Seat {
 public:
  Seat(Compositor& compositor, WaylandHandle<wl_seat> seat);
  ~Seat();

  /// As `Compositor::forget`.
  void forget(const LayerSurface& surface);

 private:
  struct Events;
  void takeCapabilities(std::uint32_t capabilities);
  /// The hand that rows deserve, at the scale of the surface.
  void showCursor(std::uint32_t serial);

  Compositor& _compositor;
  WaylandHandle<wl_seat> _seat;
  WaylandHandle<wl_pointer> _pointer;
  WaylandHandle<wl_keyboard> _keyboard;
  WaylandHandle<wl_touch> _touch;

  // The surfaces that each is at; null: none of ours.
  LayerSurface* _pointed = nullptr;
  LayerSurface* _typed = nullptr;
  LayerSurface* _touched = nullptr;
  Point _pointerPlace, _touchPlace;
  std::int32_t _finger = 0;  // the one that touches
  bool _isShifted = false;

  // From the first time on that the pointer is over a surface.
  WaylandHandle<wl_cursor_theme> _cursors;
  WaylandHandle<wl_surface> _cursorSurface;
  int _cursorScale = 0;
};

}  // namespace nimbo
