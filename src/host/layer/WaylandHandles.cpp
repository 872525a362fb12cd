#include "host/layer/WaylandHandles.h"

#include <fractional-scale-v1-client-protocol.h>
#include <viewporter-client-protocol.h>
#include <wayland-client.h>
#include <wayland-cursor.h>
#include <wlr-layer-shell-unstable-v1-client-protocol.h>

namespace nimbo {

void WaylandReleaser::operator()(wl_buffer* object) const { wl_buffer_destroy(object); }
void WaylandReleaser::operator()(wl_callback* object) const { wl_callback_destroy(object); }
void WaylandReleaser::operator()(wl_compositor* object) const { wl_compositor_destroy(object); }
void WaylandReleaser::operator()(wl_cursor_theme* object) const { wl_cursor_theme_destroy(object); }
void WaylandReleaser::operator()(wl_display* object) const { wl_display_disconnect(object); }
void WaylandReleaser::operator()(wl_registry* object) const { wl_registry_destroy(object); }
void WaylandReleaser::operator()(wl_shm* object) const { wl_shm_destroy(object); }
void WaylandReleaser::operator()(wl_shm_pool* object) const { wl_shm_pool_destroy(object); }
void WaylandReleaser::operator()(wl_surface* object) const { wl_surface_destroy(object); }
void WaylandReleaser::operator()(wp_fractional_scale_manager_v1* object) const {
  wp_fractional_scale_manager_v1_destroy(object);
}
void WaylandReleaser::operator()(wp_fractional_scale_v1* object) const { wp_fractional_scale_v1_destroy(object); }
void WaylandReleaser::operator()(wp_viewport* object) const { wp_viewport_destroy(object); }
void WaylandReleaser::operator()(wp_viewporter* object) const { wp_viewporter_destroy(object); }
void WaylandReleaser::operator()(zwlr_layer_surface_v1* object) const { zwlr_layer_surface_v1_destroy(object); }

// Earlier versions of these cannot be given back: they only end here.

void WaylandReleaser::operator()(wl_keyboard* object) const {
  const bool isKnown = wl_keyboard_get_version(object) >= WL_KEYBOARD_RELEASE_SINCE_VERSION;
  isKnown ? wl_keyboard_release(object) : wl_keyboard_destroy(object);
}
void WaylandReleaser::operator()(wl_output* object) const {
  const bool isKnown = wl_output_get_version(object) >= WL_OUTPUT_RELEASE_SINCE_VERSION;
  isKnown ? wl_output_release(object) : wl_output_destroy(object);
}
void WaylandReleaser::operator()(wl_pointer* object) const {
  const bool isKnown = wl_pointer_get_version(object) >= WL_POINTER_RELEASE_SINCE_VERSION;
  isKnown ? wl_pointer_release(object) : wl_pointer_destroy(object);
}
void WaylandReleaser::operator()(wl_seat* object) const {
  const bool isKnown = wl_seat_get_version(object) >= WL_SEAT_RELEASE_SINCE_VERSION;
  isKnown ? wl_seat_release(object) : wl_seat_destroy(object);
}
void WaylandReleaser::operator()(wl_touch* object) const {
  const bool isKnown = wl_touch_get_version(object) >= WL_TOUCH_RELEASE_SINCE_VERSION;
  isKnown ? wl_touch_release(object) : wl_touch_destroy(object);
}
void WaylandReleaser::operator()(zwlr_layer_shell_v1* object) const {
  if (zwlr_layer_shell_v1_get_version(object) >= ZWLR_LAYER_SHELL_V1_DESTROY_SINCE_VERSION)
    zwlr_layer_shell_v1_destroy(object);
  else
    wl_proxy_destroy(reinterpret_cast<wl_proxy*>(object));
}

}  // namespace nimbo
