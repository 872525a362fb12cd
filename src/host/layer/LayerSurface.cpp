#include "host/layer/LayerSurface.h"

#include <fractional-scale-v1-client-protocol.h>
#include <viewporter-client-protocol.h>
#include <wayland-client.h>
#include <wlr-layer-shell-unstable-v1-client-protocol.h>

#include <algorithm>
#include <cmath>
#include <limits>

namespace nimbo {

namespace {

constexpr const char* kPurpose = "nimbo-transit";
constexpr double kFractions = 120;  // of a scale that is told in parts

// What the widget draws at.
constexpr double kSmallestScale = 0.25, kLargestScale = 8;

}  // namespace

struct LayerSurface::Events {
  static LayerSurface& of(void* data) { return *static_cast<LayerSurface*>(data); }

  static constexpr wl_surface_listener kSurface{.enter =
                                                    [](void* data, wl_surface*, wl_output* output) {
                                                      of(data)._entered.push_back(output);
                                                      of(data).updateScale();
                                                    },
                                                .leave =
                                                    [](void* data, wl_surface*, wl_output* output) {
                                                      std::erase(of(data)._entered, output);
                                                      of(data).updateScale();
                                                    }};

  static constexpr zwlr_layer_surface_v1_listener kLayerSurface{
      .configure = [](void* data, zwlr_layer_surface_v1*, std::uint32_t serial, std::uint32_t width,
                      std::uint32_t) { of(data).configure(serial, width); },
      .closed = [](void* data, zwlr_layer_surface_v1*) { of(data)._delegate.surfaceClosed(); }};

  static constexpr wp_fractional_scale_v1_listener kFractionalScale{
      .preferred_scale = [](void* data, wp_fractional_scale_v1*, std::uint32_t scale) {
        of(data)._toldScale = scale / kFractions;
        of(data).updateScale();
      }};

  static constexpr wl_callback_listener kFrame{
      .done = [](void* data, wl_callback*, std::uint32_t) { of(data).frameCame(); }};
};

LayerSurface::LayerSurface(Compositor& compositor, const Compositor::Output* output, const LayerPlacement& placement,
                           std::int32_t width, std::int32_t height, Delegate& delegate)
    : _compositor(compositor), _delegate(delegate), _width(width), _height(height) {
  _surface.reset(wl_compositor_create_surface(compositor.surfaces()));
  wl_surface_add_listener(_surface.get(), &Events::kSurface, this);
  wl_output* handle = output ? output->handle.get() : nullptr;
  _layerSurface.reset(
      zwlr_layer_shell_v1_get_layer_surface(compositor.layers(), _surface.get(), handle, placement.layer, kPurpose));
  zwlr_layer_surface_v1* layerSurface = _layerSurface.get();
  zwlr_layer_surface_v1_add_listener(layerSurface, &Events::kLayerSurface, this);
  if (compositor.viewports()) {
    _viewport.reset(wp_viewporter_get_viewport(compositor.viewports(), _surface.get()));
    if (compositor.fractionalScales()) {
      _fractionalScale.reset(
          wp_fractional_scale_manager_v1_get_fractional_scale(compositor.fractionalScales(), _surface.get()));
      wp_fractional_scale_v1_add_listener(_fractionalScale.get(), &Events::kFractionalScale, this);
    }
  }
  if (output) _entered.push_back(handle);  // where it will be
  _scale = wantedScale();

  zwlr_layer_surface_v1_set_size(layerSurface, static_cast<std::uint32_t>(_width), static_cast<std::uint32_t>(_height));
  zwlr_layer_surface_v1_set_anchor(layerSurface, placement.anchor);
  const auto& margins = placement.margins;
  zwlr_layer_surface_v1_set_margin(layerSurface, margins.top, margins.right, margins.bottom, margins.left);
  if (zwlr_layer_surface_v1_get_version(layerSurface) >=
      ZWLR_LAYER_SURFACE_V1_KEYBOARD_INTERACTIVITY_ON_DEMAND_SINCE_VERSION)
    zwlr_layer_surface_v1_set_keyboard_interactivity(layerSurface,
                                                     ZWLR_LAYER_SURFACE_V1_KEYBOARD_INTERACTIVITY_ON_DEMAND);
  wl_surface_commit(_surface.get());
}

LayerSurface::~LayerSurface() {
  for (const auto& timer : {_unseen, _glance})
    if (timer) timer->invalidate();
  _compositor.forget(*this);
}

double LayerSurface::wantedScale() const {
  double scale = _toldScale;
  const bool hasScale =
      _viewport || wl_surface_get_version(_surface.get()) >= WL_SURFACE_SET_BUFFER_SCALE_SINCE_VERSION;
  if (scale == 0 && hasScale)
    for (const Compositor::Output& output : _compositor.outputs())
      // Where it will be is not known before it was there.
      if (_entered.empty() || std::ranges::count(_entered, output.handle.get()) != 0)
        scale = std::max<double>(scale, output.scale);
  return scale == 0 ? 1 : std::clamp(scale, kSmallestScale, kLargestScale);
}

void LayerSurface::updateScale() {
  const double scale = wantedScale();
  if (std::exchange(_scale, scale) != scale) _delegate.surfaceScaleChanged();
}

void LayerSurface::configure(std::uint32_t serial, std::uint32_t width) {
  zwlr_layer_surface_v1_ack_configure(_layerSurface.get(), serial);
  const bool isFirst = !std::exchange(_isConfigured, true);
  const bool isLess = width > 0 && width < static_cast<std::uint32_t>(_width);
  _delegate.surfaceWidthGiven(isLess ? static_cast<std::int32_t>(width) : _width);
  if (isFirst)
    _delegate.surfaceMayBeDrawn();
  else if (_isMapped)
    wl_surface_commit(_surface.get());
}

void LayerSurface::askForFrame() {
  if (!_isConfigured) return;
  // What is not there yet gets no frames.
  if (!_isMapped) return _delegate.surfaceMayBeDrawn();
  _drawsNext = true;
  if (_frame) return;
  requestFrame();
  wl_surface_commit(_surface.get());
}

void LayerSurface::requestFrame() {
  if (_glance) std::exchange(_glance, nullptr)->invalidate();
  if (_frame) return;
  _frame.reset(wl_surface_frame(_surface.get()));
  wl_callback_add_listener(_frame.get(), &Events::kFrame, this);
  _unseen = _compositor.runLoop().scheduleTimer(kUnseen, false, [this](Timer&) { _delegate.surfaceIsSeen(false); });
}

void LayerSurface::frameCame() {
  _frame.reset();
  _unseen->invalidate();
  _glance = _compositor.runLoop().scheduleTimer(kGlance, false, [this](Timer&) {
    requestFrame();
    wl_surface_commit(_surface.get());
  });
  const bool draws = std::exchange(_drawsNext, false);
  _delegate.surfaceIsSeen(true);
  if (draws) _delegate.surfaceMayBeDrawn();
}

void LayerSurface::show(wl_buffer* buffer, const protocol::Rendered& picture) {
  const auto points = [&](std::int32_t pixels) {
    return std::max(1, static_cast<std::int32_t>(std::lround(pixels / picture.scale)));
  };
  if (const std::int32_t height = points(picture.height); std::exchange(_height, height) != height)
    zwlr_layer_surface_v1_set_size(_layerSurface.get(), static_cast<std::uint32_t>(_width),
                                   static_cast<std::uint32_t>(height));
  wl_surface* surface = _surface.get();
  if (_viewport)
    wp_viewport_set_destination(_viewport.get(), points(picture.width), _height);
  else if (wl_surface_get_version(surface) >= WL_SURFACE_SET_BUFFER_SCALE_SINCE_VERSION)
    wl_surface_set_buffer_scale(surface, static_cast<std::int32_t>(std::lround(picture.scale)));
  wl_surface_attach(surface, buffer, 0, 0);
  constexpr std::int32_t kAll = std::numeric_limits<std::int32_t>::max();
  if (wl_surface_get_version(surface) >= WL_SURFACE_DAMAGE_BUFFER_SINCE_VERSION)
    wl_surface_damage_buffer(surface, 0, 0, kAll, kAll);
  else
    wl_surface_damage(surface, 0, 0, kAll, kAll);
  requestFrame();
  wl_surface_commit(surface);
  _isMapped = true;
}

}  // namespace nimbo
