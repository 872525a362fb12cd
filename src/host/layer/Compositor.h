#pragma once

#include <cstdint>
#include <list>
#include <memory>
#include <stdexcept>
#include <string>

#include "desktop/system/GLibRunLoop.h"
#include "host/layer/WaylandHandles.h"

namespace nimbo {

class LayerSurface;
class Seat;

/// Why there is no connection to a compositor.
struct CompositorFailure : std::runtime_error {
  using std::runtime_error::runtime_error;
};

/// A connection to the Wayland compositor, and what it offers. Everything is told from the run loop; what is asked for
/// goes out before the loop sleeps. Main thread only.
class Compositor {
 public:
  struct Output {
    std::uint32_t global;
    WaylandHandle<wl_output> handle;
    std::string name;  ///< such as "DP-1"; empty where the compositor tells none
    int scale = 1;     ///< device pixels for each point
  };

  /// Hears of the connection. Outlives it.
  class Delegate {
   public:
    virtual ~Delegate() = default;
    /// What the compositor offers is known from now on.
    virtual void compositorIsReady() = 0;
    /// An output came, went, or has another name or scale.
    virtual void outputsChanged() = 0;
    /// The connection is no more, or cannot be used; told once, in a call of its own, in which it may be destroyed.
    virtual void compositorFailed(const std::string& reason) = 0;
  };

  /// Throws CompositorFailure when nobody listens where WAYLAND_DISPLAY says.
  Compositor(GLibRunLoop& runLoop, Delegate& delegate);
  ~Compositor();
  Compositor(const Compositor&) = delete;
  Compositor& operator=(const Compositor&) = delete;

  GLibRunLoop& runLoop() { return _runLoop; }
  bool isReady() const { return _isReady; }
  const std::list<Output>& outputs() const { return _outputs; }
  /// Null for an output that is gone.
  const Output* outputOf(const wl_output* handle) const;
  /// The output of that name, null without one.
  const Output* outputNamed(const std::string& name) const;

  // What it offers: null where it does not.
  wl_compositor* surfaces() { return _surfaces.get(); }
  wl_shm* memory() { return _memory.get(); }
  zwlr_layer_shell_v1* layers() { return _layers.get(); }
  wp_viewporter* viewports() { return _viewports.get(); }
  wp_fractional_scale_manager_v1* fractionalScales() { return _fractionalScales.get(); }

  /// A surface is about to go: nothing that hands do is told of it any more.
  void forget(const LayerSurface& surface);

  /// Seconds in which a compositor says what it offers.
  static constexpr TimeInterval kPatience = 10;

 private:
  struct EventSource;
  struct Events;
  void offer(std::uint32_t global, const std::string& interface, std::uint32_t version);
  void withdraw(std::uint32_t global);
  void askForAnswer();
  void fail(const std::string& reason);
  void failForError();

  GLibRunLoop& _runLoop;
  Delegate& _delegate;
  WaylandHandle<wl_display> _display;
  GSourceHandle _events;
  WaylandHandle<wl_registry> _registry;
  WaylandHandle<wl_callback> _answer;
  int _answers = 0;
  std::shared_ptr<Timer> _patience;
  bool _isReady = false;
  std::shared_ptr<bool> _hasFailed = std::make_shared<bool>(false);

  WaylandHandle<wl_compositor> _surfaces;
  WaylandHandle<wl_shm> _memory;
  WaylandHandle<zwlr_layer_shell_v1> _layers;
  WaylandHandle<wp_viewporter> _viewports;
  WaylandHandle<wp_fractional_scale_manager_v1> _fractionalScales;
  std::list<Output> _outputs;
  std::unique_ptr<Seat> _seat;
  std::uint32_t _seatGlobal = 0;
};

}  // namespace nimbo
