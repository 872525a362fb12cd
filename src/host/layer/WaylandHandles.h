#pragma once

#include <memory>

struct wl_buffer;
struct wl_callback;
struct wl_compositor;
struct wl_cursor_theme;
struct wl_display;
struct wl_keyboard;
struct wl_output;
struct wl_pointer;
struct wl_registry;
struct wl_seat;
struct wl_shm;
struct wl_shm_pool;
struct wl_surface;
struct wl_touch;
struct wp_fractional_scale_manager_v1;
struct wp_fractional_scale_v1;
struct wp_viewport;
struct wp_viewporter;
struct zwlr_layer_shell_v1;
struct zwlr_layer_surface_v1;

namespace nimbo {

/// Gives an object of the connection back, by the request that the compositor knows for it.
struct WaylandReleaser {
  void operator()(wl_buffer* object) const;
  void operator()(wl_callback* object) const;
  void operator()(wl_compositor* object) const;
  void operator()(wl_cursor_theme* object) const;
  void operator()(wl_display* object) const;
  void operator()(wl_keyboard* object) const;
  void operator()(wl_output* object) const;
  void operator()(wl_pointer* object) const;
  void operator()(wl_registry* object) const;
  void operator()(wl_seat* object) const;
  void operator()(wl_shm* object) const;
  void operator()(wl_shm_pool* object) const;
  void operator()(wl_surface* object) const;
  void operator()(wl_touch* object) const;
  void operator()(wp_fractional_scale_manager_v1* object) const;
  void operator()(wp_fractional_scale_v1* object) const;
  void operator()(wp_viewport* object) const;
  void operator()(wp_viewporter* object) const;
  void operator()(zwlr_layer_shell_v1* object) const;
  void operator()(zwlr_layer_surface_v1* object) const;
};

/// Owns an object of the connection; the connection itself outlives all others.
template <class Object>
using WaylandHandle = std::unique_ptr<Object, WaylandReleaser>;

}  // namespace nimbo
