#include "host/layer/Seat.h"

#include <linux/input-event-codes.h>
#include <unistd.h>
#include <wayland-client.h>
#include <wayland-cursor.h>

#include <cmath>
#include <cstdlib>
#include <utility>

#include "host/layer/Compositor.h"
#include "host/layer/LayerSurface.h"

namespace nimbo {

namespace {

constexpr int kDefaultCursorSize = 24;  // points
constexpr int kLargestCursorSize = 256;

LayerSurface* surfaceOf(wl_surface* surface) {
  return surface ? static_cast<LayerSurface*>(wl_surface_get_user_data(surface)) : nullptr;
}

Point pointOf(wl_fixed_t x, wl_fixed_t y) { return {wl_fixed_to_double(x), wl_fixed_to_double(y)}; }

std::optional<LayerSurface::Button> buttonOf(std::uint32_t code) {
  switch (code) {
    case BTN_LEFT:
      return LayerSurface::Button::left;
    case BTN_MIDDLE:
      return LayerSurface::Button::middle;
    case BTN_RIGHT:
      return LayerSurface::Button::right;
    default:
      return std::nullopt;
  }
}

int cursorSize() {
  const char* named = std::getenv("XCURSOR_SIZE");
  const int size = named ? std::atoi(named) : 0;
  return size > 0 && size <= kLargestCursorSize ? size : kDefaultCursorSize;
}

}  // namespace

struct Seat::Events {
  static Seat& of(void* data) { return *static_cast<Seat*>(data); }

  static constexpr wl_seat_listener kSeat{
      .capabilities = [](void* data, wl_seat*, std::uint32_t capabilities) { of(data).takeCapabilities(capabilities); },
      .name = [](void*, wl_seat*, const char*) {}};

  static constexpr wl_pointer_listener kPointer{
      .enter =
          [](void* data, wl_pointer*, std::uint32_t serial, wl_surface* surface, wl_fixed_t x, wl_fixed_t y) {
            Seat& self = of(data);
            self._pointed = surfaceOf(surface);
            self._pointerPlace = pointOf(x, y);
            if (self._pointed) self.showCursor(serial);
          },
      .leave =
          [](void* data, wl_pointer*, std::uint32_t, wl_surface*) {
            if (LayerSurface* left = std::exchange(of(data)._pointed, nullptr)) left->delegate().handLeft();
          },
      .motion =
          [](void* data, wl_pointer*, std::uint32_t, wl_fixed_t x, wl_fixed_t y) {
            Seat& self = of(data);
            self._pointerPlace = pointOf(x, y);
            if (self._pointed) self._pointed->delegate().handMoved(self._pointerPlace);
          },
      .button =
          [](void* data, wl_pointer*, std::uint32_t, std::uint32_t, std::uint32_t code, std::uint32_t state) {
            Seat& self = of(data);
            const auto button = buttonOf(code);
            if (!self._pointed || !button) return;
            if (state == WL_POINTER_BUTTON_STATE_PRESSED)
              self._pointed->delegate().pressed(*button, self._pointerPlace);
            else
              self._pointed->delegate().released(*button, self._pointerPlace);
          },
      .axis = [](void*, wl_pointer*, std::uint32_t, std::uint32_t, wl_fixed_t) {},
      .frame = [](void*, wl_pointer*) {},
      .axis_source = [](void*, wl_pointer*, std::uint32_t) {},
      .axis_stop = [](void*, wl_pointer*, std::uint32_t, std::uint32_t) {},
      .axis_discrete = [](void*, wl_pointer*, std::uint32_t, std::int32_t) {}};

  static constexpr wl_touch_listener kTouch{
      .down =
          [](void* data, wl_touch*, std::uint32_t, std::uint32_t, wl_surface* surface, std::int32_t finger,
             wl_fixed_t x, wl_fixed_t y) {
            Seat& self = of(data);
            if (self._touched) return;
            self._touched = surfaceOf(surface);
            self._finger = finger;
            self._touchPlace = pointOf(x, y);
            if (self._touched) self._touched->delegate().pressed(LayerSurface::Button::left, self._touchPlace);
          },
      .up =
          [](void* data, wl_touch*, std::uint32_t, std::uint32_t, std::int32_t finger) {
            Seat& self = of(data);
            if (finger != self._finger) return;
            if (LayerSurface* left = std::exchange(self._touched, nullptr))
              left->delegate().released(LayerSurface::Button::left, self._touchPlace);
          },
      .motion =
          [](void* data, wl_touch*, std::uint32_t, std::int32_t finger, wl_fixed_t x, wl_fixed_t y) {
            Seat& self = of(data);
            if (!self._touched || finger != self._finger) return;
            self._touchPlace = pointOf(x, y);
            self._touched->delegate().handMoved(self._touchPlace);
          },
      .frame = [](void*, wl_touch*) {},
      .cancel =
          [](void* data, wl_touch*) {
            if (LayerSurface* left = std::exchange(of(data)._touched, nullptr)) left->delegate().handLeft();
          },
      .shape = [](void*, wl_touch*, std::int32_t, wl_fixed_t, wl_fixed_t) {},
      .orientation = [](void*, wl_touch*, std::int32_t, wl_fixed_t) {}};

  static constexpr wl_keyboard_listener kKeyboard{
      // Keys go by their codes: those that are used stand at the same place of every layout.
      .keymap = [](void*, wl_keyboard*, std::uint32_t, std::int32_t keymap, std::uint32_t) { close(keymap); },
      .enter = [](void* data, wl_keyboard*, std::uint32_t, wl_surface* surface,
                  wl_array*) { of(data)._typed = surfaceOf(surface); },
      .leave =
          [](void* data, wl_keyboard*, std::uint32_t, wl_surface*) {
            of(data)._isShifted = false;
            if (LayerSurface* left = std::exchange(of(data)._typed, nullptr)) left->delegate().keyboardLeft();
          },
      .key =
          [](void* data, wl_keyboard*, std::uint32_t, std::uint32_t, std::uint32_t code, std::uint32_t state) {
            Seat& self = of(data);
            const bool isPressed = state == WL_KEYBOARD_KEY_STATE_PRESSED;
            if (code == KEY_LEFTSHIFT || code == KEY_RIGHTSHIFT)
              self._isShifted = isPressed;
            else if (self._typed && isPressed)
              self._typed->delegate().keyPressed(code, self._isShifted);
          },
      .modifiers = [](void*, wl_keyboard*, std::uint32_t, std::uint32_t, std::uint32_t, std::uint32_t,
                      std::uint32_t) {},
      .repeat_info = [](void*, wl_keyboard*, std::int32_t, std::int32_t) {}};
};

Seat::Seat(Compositor& compositor, WaylandHandle<wl_seat> seat) : _compositor(compositor), _seat(std::move(seat)) {
  wl_seat_add_listener(_seat.get(), &Events::kSeat, this);
}

Seat::~Seat() {
  for (LayerSurface* surface : {_pointed, _touched})
    if (surface) surface->delegate().handLeft();
  if (_typed) _typed->delegate().keyboardLeft();
}

void Seat::takeCapabilities(std::uint32_t capabilities) {
  const auto take = [&](auto& device, std::uint32_t capability, auto get, const auto& listener, auto add) {
    if ((capabilities & capability) == 0) return device.reset();
    if (device) return;
    device.reset(get(_seat.get()));
    add(device.get(), &listener, this);
  };
  take(_pointer, WL_SEAT_CAPABILITY_POINTER, wl_seat_get_pointer, Events::kPointer, wl_pointer_add_listener);
  take(_keyboard, WL_SEAT_CAPABILITY_KEYBOARD, wl_seat_get_keyboard, Events::kKeyboard, wl_keyboard_add_listener);
  take(_touch, WL_SEAT_CAPABILITY_TOUCH, wl_seat_get_touch, Events::kTouch, wl_touch_add_listener);
}

void Seat::forget(const LayerSurface& surface) {
  for (LayerSurface** held : {&_pointed, &_typed, &_touched})
    if (*held == &surface) *held = nullptr;
}

void Seat::showCursor(std::uint32_t serial) {
  const int scale = static_cast<int>(std::ceil(_pointed->scale()));
  if (!_cursors || scale != _cursorScale) {
    _cursors.reset(wl_cursor_theme_load(std::getenv("XCURSOR_THEME"), cursorSize() * scale, _compositor.memory()));
    _cursorScale = scale;
  }
  wl_cursor* cursor = nullptr;
  for (const char* name : {"pointer", "hand2", "hand1", "left_ptr"})
    if (_cursors && !cursor) cursor = wl_cursor_theme_get_cursor(_cursors.get(), name);
  wl_buffer* buffer = cursor ? wl_cursor_image_get_buffer(cursor->images[0]) : nullptr;
  if (!buffer) return;
  const wl_cursor_image& image = *cursor->images[0];
  const auto unit = static_cast<std::uint32_t>(scale);
  const bool isWhole = image.width % unit == 0 && image.height % unit == 0;
  _cursorSurface.reset(wl_compositor_create_surface(_compositor.surfaces()));
  const bool hasScale = wl_surface_get_version(_cursorSurface.get()) >= WL_SURFACE_SET_BUFFER_SCALE_SINCE_VERSION;
  const std::int32_t used = isWhole && hasScale ? scale : 1;
  wl_surface* surface = _cursorSurface.get();
  if (used > 1) wl_surface_set_buffer_scale(surface, used);
  wl_surface_attach(surface, buffer, 0, 0);
  wl_surface_damage(surface, 0, 0, static_cast<std::int32_t>(image.width), static_cast<std::int32_t>(image.height));
  wl_surface_commit(surface);
  wl_pointer_set_cursor(_pointer.get(), serial, surface, static_cast<std::int32_t>(image.hotspot_x) / used,
                        static_cast<std::int32_t>(image.hotspot_y) / used);
}

}  // namespace nimbo
