// A compositor of one output, as good or bad as its test wants it: TestCompositor [INTERFACE...]
//
// Offers all interfaces but those that are named. Says the name of its socket, then a line for each picture that a
// client shows, and "closed" when its surface goes. Takes lines: "configure W H" (0: as asked for), "scale 120THS",
// "frames 0|1" (whether surfaces are seen), "hold 0|1" (whether it keeps the buffers), "close", "unplug", "plug",
// "press BUTTON X Y", "move X Y", "release BUTTON X Y", "touch X Y", "lift", "key CODE".

#include <fractional-scale-v1-server-protocol.h>
#include <unistd.h>
#include <viewporter-server-protocol.h>
#include <wayland-server.h>
#include <wlr-layer-shell-unstable-v1-server-protocol.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <iostream>
#include <set>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

namespace {

wl_display* display;
wl_global* outputGlobal;
// What the client has: the last of each, null when it is gone.
wl_resource *surface, *layer, *fraction, *output, *pointer, *keyboard, *finger, *attached, *shown;
std::vector<wl_resource*> frames, held;  // that are waited for; buffers that were shown
std::uint32_t asked[2], given[2], destination[2], scale = 180, serial;
std::int32_t bufferScale = 1;
bool isSeen = true, holds = false, isConfigured = false;

void destroy(wl_client*, wl_resource* resource) { wl_resource_destroy(resource); }

/// What does nothing with any arguments.
template <class... Arguments>
void pass(wl_client*, wl_resource*, Arguments...) {}

wl_resource* make(wl_client* client, const wl_interface& interface, std::uint32_t version, std::uint32_t id,
                  const void* requests, wl_resource** kept = nullptr) {
  wl_resource* made = wl_resource_create(client, &interface, static_cast<int>(version), id);
  wl_resource_set_implementation(made, requests, kept, [](wl_resource* gone) {
    auto** place = static_cast<wl_resource**>(wl_resource_get_user_data(gone));
    if (place == &layer) std::puts("closed");
    if (place && *place == gone) *place = nullptr;
    std::erase(frames, gone);
  });
  if (kept) *kept = made;
  return made;
}

/// Makes what is asked for, of whatever else is told.
template <const wl_interface& interface, const auto& requests, auto kept, class... Arguments>
void give(wl_client* client, wl_resource*, std::uint32_t id, Arguments...) {
  make(client, interface, static_cast<std::uint32_t>(std::min(interface.version, 5)), id, &requests, kept);
}

void configure() {
  isConfigured = true;
  zwlr_layer_surface_v1_send_configure(layer, ++serial, given[0] ? given[0] : asked[0], given[1] ? given[1] : asked[1]);
}

void releaseBuffers() {
  if (holds) return;
  for (wl_resource* buffer : std::exchange(held, {})) wl_buffer_send_release(buffer);
}

void show(wl_resource* buffer) {
  wl_shm_buffer* picture = wl_shm_buffer_get(buffer);
  wl_shm_buffer_begin_access(picture);
  const int width = wl_shm_buffer_get_width(picture), height = wl_shm_buffer_get_height(picture);
  const auto* pixels = static_cast<const std::uint32_t*>(wl_shm_buffer_get_data(picture));
  const std::set<std::uint32_t> colors(pixels, pixels + width * height);
  std::printf("shown %dx%d as %ux%u of %ux%u, scale %d, row #%06x, %s\n", width, height, destination[0], destination[1],
              asked[0], asked[1], bufferScale, pixels[2 * width + width / 2] & 0xffffff,
              colors.size() > 1 ? "drawn" : "empty");
  wl_shm_buffer_end_access(picture);
  wl_resource* before = std::exchange(shown, buffer);
  if (before) held.push_back(before);
  releaseBuffers();
}

void sendFrames() {
  while (isSeen && !frames.empty()) {
    wl_callback_send_done(frames.back(), 0);
    wl_resource_destroy(frames.back());
  }
}

void commit(wl_client*, wl_resource* self) {
  if (self != surface) return;  // a cursor's
  if (layer && !isConfigured) {
    if (output) wl_surface_send_enter(surface, output);
    if (fraction) wp_fractional_scale_v1_send_preferred_scale(fraction, scale);
    configure();
  }
  if (wl_resource* buffer = std::exchange(attached, nullptr)) show(buffer);
  sendFrames();
}

void attach(wl_client*, wl_resource* self, wl_resource* buffer, int, int) {
  if (self != surface) return;
  attached = buffer;
  auto* listener = new wl_listener{{}, [](wl_listener* end, void* gone) {
                                     for (wl_resource** named : {&attached, &shown})
                                       if (*named == gone) *named = nullptr;
                                     std::erase(held, gone);
                                     delete end;
                                   }};
  wl_resource_add_destroy_listener(buffer, listener);
}

const struct wl_surface_interface kSurface {
  destroy, attach, pass,
      [](wl_client* client, wl_resource*, std::uint32_t id) {
        frames.push_back(make(client, wl_callback_interface, 1, id, nullptr));
      },
      pass, pass, commit, pass, [](wl_client*, wl_resource*, int to) { bufferScale = to; }, pass, pass
};

const struct wl_compositor_interface kCompositor {
  [](wl_client* client, wl_resource* self, std::uint32_t id) {
    make(client, wl_surface_interface, static_cast<std::uint32_t>(wl_resource_get_version(self)), id, &kSurface);
  },
      nullptr
};

const struct zwlr_layer_surface_v1_interface kLayerSurface {
  [](wl_client*, wl_resource*, std::uint32_t width, std::uint32_t height) {
    asked[0] = width;
    asked[1] = height;
    if (isConfigured) configure();
  },
      pass, pass, pass, pass, pass, pass, destroy, pass
};

const struct zwlr_layer_shell_v1_interface kLayerShell {
  [](wl_client* client, wl_resource*, std::uint32_t id, wl_resource* over, wl_resource*, std::uint32_t, const char*) {
    isConfigured = false;
    wl_resource_set_user_data(surface = over, &surface);
    make(client, zwlr_layer_surface_v1_interface, 4, id, &kLayerSurface, &layer);
  },
      destroy
};

const struct wp_viewport_interface kViewport {
  destroy, pass, [](wl_client*, wl_resource*, int width, int height) {
    destination[0] = static_cast<std::uint32_t>(width);
    destination[1] = static_cast<std::uint32_t>(height);
  }
};
const struct wp_viewporter_interface kViewporter { destroy, give<wp_viewport_interface, kViewport, nullptr> };

const struct wp_fractional_scale_v1_interface kFraction { destroy };
const struct wp_fractional_scale_manager_v1_interface kFractions {
  destroy, give<wp_fractional_scale_v1_interface, kFraction, &fraction>
};

const struct wl_output_interface kOutput { destroy };
const struct wl_pointer_interface kPointer { pass, destroy };
const struct wl_keyboard_interface kKeyboard { destroy };
const struct wl_touch_interface kTouch { destroy };
const struct wl_seat_interface kSeat {
  give<wl_pointer_interface, kPointer, &pointer>, give<wl_keyboard_interface, kKeyboard, &keyboard>,
      give<wl_touch_interface, kTouch, &finger>, destroy
};

template <const wl_interface& interface, const auto& requests>
void bind(wl_client* client, void*, std::uint32_t version, std::uint32_t id) {
  const std::string name = interface.name;
  wl_resource* bound = make(client, interface, version, id, &requests, name == "wl_output" ? &output : nullptr);
  if (name == "wl_output") {
    wl_output_send_name(bound, "TEST-1");
    wl_output_send_scale(bound, 2);
    wl_output_send_done(bound);
  } else if (name == "wl_seat") {
    wl_seat_send_capabilities(bound,
                              WL_SEAT_CAPABILITY_POINTER | WL_SEAT_CAPABILITY_KEYBOARD | WL_SEAT_CAPABILITY_TOUCH);
  }
}

/// Does what a line of the test says.
void obey(const std::string& line) {
  std::istringstream words(line);
  std::string word;
  std::uint32_t code = 0;
  double x = 0, y = 0;
  words >> word;
  if (word == "press" || word == "release" || word == "key") words >> code;
  words >> x >> y;
  const auto flag = x != 0;
  const wl_fixed_t place[] = {wl_fixed_from_double(x), wl_fixed_from_double(y)};
  if (word == "frames") {
    isSeen = flag;
    sendFrames();
  } else if (word == "hold") {
    holds = flag;
    releaseBuffers();
  } else if (word == "configure") {
    given[0] = static_cast<std::uint32_t>(x);
    given[1] = static_cast<std::uint32_t>(y);
    if (layer) configure();
  } else if (word == "scale") {
    scale = static_cast<std::uint32_t>(x);
    if (fraction) wp_fractional_scale_v1_send_preferred_scale(fraction, scale);
  } else if (word == "unplug") {
    wl_global_remove(outputGlobal);
    zwlr_layer_surface_v1_send_closed(layer);
  } else if (word == "plug") {
    outputGlobal = wl_global_create(display, &wl_output_interface, 4, nullptr, bind<wl_output_interface, kOutput>);
  } else if (word == "close") {
    zwlr_layer_surface_v1_send_closed(layer);
  } else if (word == "press" || word == "release") {
    wl_pointer_send_enter(pointer, ++serial, surface, place[0], place[1]);
    wl_pointer_send_button(pointer, ++serial, 0, code, word == "press");
  } else if (word == "move") {
    wl_pointer_send_motion(pointer, 0, place[0], place[1]);
  } else if (word == "touch") {
    wl_touch_send_down(finger, ++serial, 0, surface, 1, place[0], place[1]);
  } else if (word == "lift") {
    wl_touch_send_up(finger, ++serial, 0, 1);
  } else if (word == "key") {
    wl_array none{};
    wl_keyboard_send_enter(keyboard, ++serial, surface, &none);
    for (const bool isPressed : {true, false}) wl_keyboard_send_key(keyboard, ++serial, 0, code, isPressed);
  }
}

int readLines(int, std::uint32_t, void*) {
  static std::string text;
  char bytes[256];
  const ssize_t count = read(0, bytes, sizeof bytes);
  if (count <= 0) std::exit(0);
  text.append(bytes, static_cast<std::size_t>(count));
  for (std::size_t end; (end = text.find('\n')) != std::string::npos; text.erase(0, end + 1)) obey(text.substr(0, end));
  return 0;
}

}  // namespace

int main(int argc, char** argv) {
  setvbuf(stdout, nullptr, _IOLBF, 0);
  display = wl_display_create();
  const auto offer = [&](const wl_interface& interface, int version, wl_global_bind_func_t bound) {
    if (std::none_of(argv, argv + argc, [&](const char* named) { return std::string(named) == interface.name; }))
      wl_global_create(display, &interface, version, nullptr, bound);
  };
  offer(wl_compositor_interface, 4, bind<wl_compositor_interface, kCompositor>);
  obey("plug");
  offer(wl_seat_interface, 5, bind<wl_seat_interface, kSeat>);
  offer(zwlr_layer_shell_v1_interface, 4, bind<zwlr_layer_shell_v1_interface, kLayerShell>);
  offer(wp_viewporter_interface, 1, bind<wp_viewporter_interface, kViewporter>);
  offer(wp_fractional_scale_manager_v1_interface, 1, bind<wp_fractional_scale_manager_v1_interface, kFractions>);
  wl_display_init_shm(display);
  wl_event_loop_add_fd(wl_display_get_event_loop(display), 0, WL_EVENT_READABLE, readLines, nullptr);
  std::puts(wl_display_add_socket_auto(display));
  wl_display_run(display);
}
