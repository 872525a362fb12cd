// The least that a program does which shows text on the desktop: a layer surface, filled with one text through Pango.
// nimbo-bare-layer; stays until the compositor ends.

#include <pango/pangocairo.h>
#include <sys/mman.h>
#include <unistd.h>
#include <wayland-client.h>
#include <wlr-layer-shell-unstable-v1-client-protocol.h>

#include <cstdint>
#include <cstdio>
#include <cstring>
#include <type_traits>

namespace {

constexpr int kWidth = 359, kHeight = 110, kTop = 1, kRight = 8;

wl_compositor* compositor;
wl_shm* shm;
zwlr_layer_shell_v1* layers;
wl_surface* surface;

void draw(void* pixels) {
  cairo_surface_t* image = cairo_image_surface_create_for_data(static_cast<unsigned char*>(pixels), CAIRO_FORMAT_ARGB32,
                                                               kWidth, kHeight, 4 * kWidth);
  cairo_t* cairo = cairo_create(image);
  cairo_set_source_rgb(cairo, 1, 1, 1);
  cairo_paint(cairo);
  cairo_set_source_rgb(cairo, 0, 0, 0);
  PangoLayout* layout = pango_cairo_create_layout(cairo);
  PangoFontDescription* font = pango_font_description_from_string("sans 12");
  pango_layout_set_font_description(layout, font);
  pango_layout_set_width(layout, kWidth * PANGO_SCALE);
  pango_layout_set_text(layout, "Delays of up to 15 minutes, after works between two stations on the lines M1 and M2",
                        -1);
  pango_cairo_show_layout(cairo, layout);
  pango_font_description_free(font);
  g_object_unref(layout);
  cairo_destroy(cairo);
  cairo_surface_destroy(image);
}

constexpr zwlr_layer_surface_v1_listener kLayerSurface{
    .configure =
        [](void*, zwlr_layer_surface_v1* layer, std::uint32_t serial, std::uint32_t, std::uint32_t) {
          zwlr_layer_surface_v1_ack_configure(layer, serial);
          constexpr int kBytes = 4 * kWidth * kHeight;
          const int memory = memfd_create("bare", MFD_CLOEXEC);
          if (ftruncate(memory, kBytes) != 0) return;
          void* pixels = mmap(nullptr, kBytes, PROT_READ | PROT_WRITE, MAP_SHARED, memory, 0);
          draw(pixels);
          wl_shm_pool* pool = wl_shm_create_pool(shm, memory, kBytes);
          wl_surface_attach(
              surface, wl_shm_pool_create_buffer(pool, 0, kWidth, kHeight, 4 * kWidth, WL_SHM_FORMAT_ARGB8888), 0, 0);
          wl_surface_damage(surface, 0, 0, kWidth, kHeight);
          wl_surface_commit(surface);
        },
    .closed = [](void*, zwlr_layer_surface_v1*) {}};

constexpr wl_registry_listener kRegistry{
    .global =
        [](void*, wl_registry* registry, std::uint32_t name, const char* interface, std::uint32_t) {
          const auto bind = [&](auto*& object, const wl_interface& wanted, std::uint32_t version) {
            if (std::strcmp(interface, wanted.name) == 0)
              object = static_cast<std::remove_reference_t<decltype(object)>>(
                  wl_registry_bind(registry, name, &wanted, version));
          };
          bind(compositor, wl_compositor_interface, 4);
          bind(shm, wl_shm_interface, 1);
          bind(layers, zwlr_layer_shell_v1_interface, 4);
        },
    .global_remove = [](void*, wl_registry*, std::uint32_t) {}};

}  // namespace

int main() {
  wl_display* display = wl_display_connect(nullptr);
  if (!display) return 1;
  wl_registry_add_listener(wl_display_get_registry(display), &kRegistry, nullptr);
  wl_display_roundtrip(display);
  if (!compositor || !shm || !layers) return 1;
  surface = wl_compositor_create_surface(compositor);
  zwlr_layer_surface_v1* layer = zwlr_layer_shell_v1_get_layer_surface(layers, surface, nullptr, 1, "bare");
  zwlr_layer_surface_v1_add_listener(layer, &kLayerSurface, nullptr);
  zwlr_layer_surface_v1_set_size(layer, kWidth, kHeight);
  zwlr_layer_surface_v1_set_anchor(layer, kTop | kRight);
  wl_surface_commit(surface);
  while (wl_display_dispatch(display) >= 0) {
  }
}
