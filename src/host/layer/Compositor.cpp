#include "host/layer/Compositor.h"

#include <fractional-scale-v1-client-protocol.h>
#include <glib.h>
#include <viewporter-client-protocol.h>
#include <wayland-client.h>
#include <wlr-layer-shell-unstable-v1-client-protocol.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <utility>

#include "host/layer/Seat.h"

namespace nimbo {

namespace {

// The newest versions that are understood.
constexpr std::uint32_t kSurfacesVersion = 4, kOutputVersion = 4, kSeatVersion = 5, kLayersVersion = 4;

}  // namespace

/// Reads and writes the connection around the run loop's sleep, as wl_display_prepare_read(3) has it.
struct Compositor::EventSource {
  GSource source;
  Compositor* compositor;
  gpointer watch;
  bool isReading;
  bool waitsToWrite;

  static EventSource& of(GSource* source) { return *reinterpret_cast<EventSource*>(source); }

  static gboolean prepare(GSource* source, gint* timeout) {
    EventSource& self = of(source);
    *timeout = -1;
    if (*self.compositor->_hasFailed || self.isReading) return FALSE;
    wl_display* display = self.compositor->_display.get();
    if (wl_display_prepare_read(display) != 0) return TRUE;
    self.isReading = true;
    // A compositor that does not read now is written to when it does; one that is gone is noticed in reading.
    const bool isFull = wl_display_flush(display) < 0 && errno == EAGAIN;
    // Each call wakes the run loop that is about to sleep.
    if (std::exchange(self.waitsToWrite, isFull) != isFull)
      g_source_modify_unix_fd(source, self.watch, static_cast<GIOCondition>(isFull ? G_IO_IN | G_IO_OUT : G_IO_IN));
    return FALSE;
  }

  static gboolean check(GSource* source) {
    EventSource& self = of(source);
    if (*self.compositor->_hasFailed) return FALSE;
    if (!self.isReading) return TRUE;
    self.isReading = false;
    wl_display* display = self.compositor->_display.get();
    const bool isReadable = (g_source_query_unix_fd(source, self.watch) & (G_IO_IN | G_IO_ERR | G_IO_HUP)) != 0;
    if (!isReadable)
      wl_display_cancel_read(display);
    else if (wl_display_read_events(display) < 0)
      self.compositor->failForError();
    return isReadable;
  }

  static gboolean dispatch(GSource* source, GSourceFunc, gpointer) {
    Compositor& compositor = *of(source).compositor;
    if (!*compositor._hasFailed && wl_display_dispatch_pending(compositor._display.get()) < 0)
      compositor.failForError();
    return G_SOURCE_CONTINUE;
  }

  static void finalize(GSource* source) {
    EventSource& self = of(source);
    if (self.isReading) wl_display_cancel_read(self.compositor->_display.get());
  }
};

struct Compositor::Events {
  static constexpr wl_registry_listener kRegistry{
      .global = [](void* self, wl_registry*, std::uint32_t global, const char* interface,
                   std::uint32_t version) { static_cast<Compositor*>(self)->offer(global, interface, version); },
      .global_remove = [](void* self, wl_registry*,
                          std::uint32_t global) { static_cast<Compositor*>(self)->withdraw(global); }};

  static constexpr wl_callback_listener kAnswer{.done = [](void* data, wl_callback*, std::uint32_t) {
    auto& self = *static_cast<Compositor*>(data);
    // The second answer comes after what the first one's offers say of themselves.
    if (++self._answers == 1) return self.askForAnswer();
    self._answer.reset();
    self._patience->invalidate();
    self._isReady = true;
    self._delegate.compositorIsReady();
  }};

  static Output* output(void* self, const wl_output* handle) {
    return const_cast<Output*>(static_cast<Compositor*>(self)->outputOf(handle));
  }
  static constexpr wl_output_listener kOutput{
      .geometry = [](void*, wl_output*, std::int32_t, std::int32_t, std::int32_t, std::int32_t, std::int32_t,
                     const char*, const char*, std::int32_t) {},
      .mode = [](void*, wl_output*, std::uint32_t, std::int32_t, std::int32_t, std::int32_t) {},
      .done =
          [](void* self, wl_output*) {
            auto& compositor = *static_cast<Compositor*>(self);
            if (compositor._isReady) compositor._delegate.outputsChanged();
          },
      .scale = [](void* self, wl_output* handle,
                  std::int32_t scale) { output(self, handle)->scale = std::max(scale, 1); },
      .name = [](void* self, wl_output* handle, const char* name) { output(self, handle)->name = name; },
      .description = [](void*, wl_output*, const char*) {}};
};

Compositor::Compositor(GLibRunLoop& runLoop, Delegate& delegate)
    : _runLoop(runLoop), _delegate(delegate), _display(wl_display_connect(nullptr)) {
  if (!_display) {
    const char* name = std::getenv("WAYLAND_DISPLAY");
    throw CompositorFailure("cannot reach a Wayland compositor at \"" + std::string(name ? name : "wayland-0") +
                            "\" (WAYLAND_DISPLAY): " + std::strerror(errno));
  }
  static GSourceFuncs functions{
      EventSource::prepare, EventSource::check, EventSource::dispatch, EventSource::finalize, nullptr, nullptr};
  _events.reset(g_source_new(&functions, sizeof(EventSource)));
  EventSource& source = EventSource::of(_events.get());
  source.compositor = this;
  source.watch = g_source_add_unix_fd(_events.get(), wl_display_get_fd(_display.get()), G_IO_IN);
  g_source_attach(_events.get(), nullptr);

  _registry.reset(wl_display_get_registry(_display.get()));
  wl_registry_add_listener(_registry.get(), &Events::kRegistry, this);
  askForAnswer();
  // It answers while the program goes on to start.
  wl_display_flush(_display.get());
  _patience = _runLoop.scheduleTimer(kPatience, false, [this](Timer&) { fail("the compositor does not answer"); });
}

Compositor::~Compositor() { _patience->invalidate(); }

void Compositor::askForAnswer() {
  _answer.reset(wl_display_sync(_display.get()));
  wl_callback_add_listener(_answer.get(), &Events::kAnswer, this);
}

void Compositor::offer(std::uint32_t global, const std::string& interface, std::uint32_t version) {
  const auto bind = [&]<class Object>(WaylandHandle<Object>& handle, const wl_interface& wanted, std::uint32_t newest) {
    if (handle || interface != wanted.name) return false;
    handle.reset(static_cast<Object*>(wl_registry_bind(_registry.get(), global, &wanted, std::min(version, newest))));
    return true;
  };
  bind(_surfaces, wl_compositor_interface, kSurfacesVersion);
  bind(_memory, wl_shm_interface, 1);
  bind(_layers, zwlr_layer_shell_v1_interface, kLayersVersion);
  bind(_viewports, wp_viewporter_interface, 1);
  bind(_fractionalScales, wp_fractional_scale_manager_v1_interface, 1);
  if (WaylandHandle<wl_output> output; bind(output, wl_output_interface, kOutputVersion)) {
    wl_output_add_listener(output.get(), &Events::kOutput, this);
    _outputs.push_back({.global = global, .handle = std::move(output)});
  }
  if (WaylandHandle<wl_seat> seat; !_seat && bind(seat, wl_seat_interface, kSeatVersion)) {
    _seat = std::make_unique<Seat>(*this, std::move(seat));
    _seatGlobal = global;
  }
}

void Compositor::withdraw(std::uint32_t global) {
  if (_seat && global == _seatGlobal) _seat.reset();
  const auto gone = std::ranges::find(_outputs, global, &Output::global);
  if (gone == _outputs.end()) return;
  // What stands on it is taken off before it goes.
  std::list<Output> taken;
  taken.splice(taken.begin(), _outputs, gone);
  if (_isReady) _delegate.outputsChanged();
}

const Compositor::Output* Compositor::outputOf(const wl_output* handle) const {
  const auto found = std::ranges::find(_outputs, handle, [](const Output& output) { return output.handle.get(); });
  return found == _outputs.end() ? nullptr : &*found;
}

const Compositor::Output* Compositor::outputNamed(const std::string& name) const {
  const auto found = std::ranges::find(_outputs, name, &Output::name);
  return found == _outputs.end() ? nullptr : &*found;
}

void Compositor::forget(const LayerSurface& surface) {
  if (_seat) _seat->forget(surface);
}

void Compositor::failForError() {
  const int error = wl_display_get_error(_display.get());
  if (error != EPROTO) return fail("the compositor is gone");
  const wl_interface* interface = nullptr;
  std::uint32_t object = 0;
  const std::uint32_t code = wl_display_get_protocol_error(_display.get(), &interface, &object);
  fail("the compositor refuses a request: error " + std::to_string(code) + " of " +
       (interface ? interface->name : "an object that is gone"));
}

void Compositor::fail(const std::string& reason) {
  if (std::exchange(*_hasFailed, true)) return;
  _runLoop.dispatchAsync([this, reason, alive = std::weak_ptr(_hasFailed)] {
    if (!alive.expired()) _delegate.compositorFailed(reason);
  });
}

}  // namespace nimbo
