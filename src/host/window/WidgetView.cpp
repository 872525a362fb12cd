#include "host/window/WidgetView.h"

#include <gdkmm/frameclock.h>
#include <gdkmm/memorytexture.h>
#include <glibmm/main.h>
#include <gtkmm/settings.h>
#include <gtkmm/snapshot.h>

#include <algorithm>
#include <cmath>

#include "host/window/WidgetTexts.h"

namespace nimbo {

namespace {

constexpr double kAnimationSeconds = 0.25;

}  // namespace

Glib::RefPtr<Gdk::Texture> textureOf(const std::shared_ptr<const WidgetPicture>& picture) {
  const auto keep = new std::shared_ptr<const WidgetPicture>(picture);
  GBytes* bytes = g_bytes_new_with_free_func(
      picture->pixels.data(), picture->pixels.size(),
      [](gpointer kept) { delete static_cast<std::shared_ptr<const WidgetPicture>*>(kept); }, keep);
  const protocol::Rendered& layout = picture->layout;
  const auto format = G_BYTE_ORDER == G_LITTLE_ENDIAN ? Gdk::MemoryTexture::Format::B8G8R8A8_PREMULTIPLIED
                                                      : Gdk::MemoryTexture::Format::A8R8G8B8_PREMULTIPLIED;
  return Gdk::MemoryTexture::create(layout.width, layout.height, format, Glib::wrap(bytes),
                                    static_cast<gsize>(layout.stride));
}

WidgetView::WidgetView() {
  add_css_class("widget-view");
  set_overflow(Gtk::Overflow::HIDDEN);
  set_hexpand();
}

WidgetView::~WidgetView() {
  if (_tick != 0) remove_tick_callback(_tick);
  _widthReport.disconnect();
  makeRows(0);
}

void WidgetView::makeRows(std::size_t count) {
  for (; _rows.size() > count; _rows.pop_back()) _rows.back()->unparent();
  while (_rows.size() < count) {
    const std::size_t index = _rows.size();
    Gtk::Button& row = *_rows.emplace_back(std::make_unique<Gtk::Button>());
    row.add_css_class("widget-row");
    row.signal_clicked().connect([this, index] { _selected.emit(index); });
    row.signal_state_flags_changed().connect([this, index, &row](Gtk::StateFlags before) {
      const bool was = (before & Gtk::StateFlags::ACTIVE) != Gtk::StateFlags();
      const bool is = (row.get_state_flags() & Gtk::StateFlags::ACTIVE) != Gtk::StateFlags();
      if (was != is) _pressed.emit(index, is);
    });
    row.set_parent(*this);
  }
}

void WidgetView::setContent(const WidgetContentRef& content) {
  if (content == _content) return;
  _content = content;
  _picture = content ? textureOf(content->picture) : nullptr;
  makeRows(content ? content->rows.size() : 0);
  for (std::size_t i = 0; i < _rows.size(); ++i) setAccessibleLabel(*_rows[i], content->rows[i].name);
  if (content) {
    const protocol::Rendered& layout = content->picture->layout;
    animateHeightTo(layout.height / layout.scale);
  }
  queue_resize();
}

void WidgetView::animateHeightTo(double height) {
  _fromHeight = _height;
  _toHeight = height;
  _animationStart = 0;
  const bool animates = get_mapped() && _height > 0 && Gtk::Settings::get_default()->property_gtk_enable_animations();
  if (!animates) {
    _height = height;
  } else if (_tick == 0 && height != _height) {
    _tick = add_tick_callback(
        [this](const Glib::RefPtr<Gdk::FrameClock>& clock) { return animate(clock->get_frame_time()); });
  }
}

bool WidgetView::animate(gint64 frameTime) {
  if (_animationStart == 0) _animationStart = frameTime;
  const double progress =
      std::min(static_cast<double>(frameTime - _animationStart) / (kAnimationSeconds * G_USEC_PER_SEC), 1.0);
  const double eased = 1 - std::pow(1 - progress, 3);
  _height = _fromHeight + (_toHeight - _fromHeight) * eased;
  queue_resize();
  if (progress < 1) return true;
  _tick = 0;
  return false;
}

void WidgetView::measure_vfunc(Gtk::Orientation orientation, int, int& minimum, int& natural, int& minimumBaseline,
                               int& naturalBaseline) const {
  constexpr int kSmallestWidth = 280;
  minimum = natural =
      orientation == Gtk::Orientation::HORIZONTAL ? kSmallestWidth : static_cast<int>(std::ceil(_height));
  minimumBaseline = naturalBaseline = -1;
}

void WidgetView::size_allocate_vfunc(int width, int, int) {
  if (std::exchange(_width, width) != width) {
    // Not while sizes are being found.
    _widthReport.disconnect();
    _widthReport = Glib::signal_idle().connect([this] {
      _widthChanged.emit(_width);
      return false;
    });
  }
  for (std::size_t i = 0; i < _rows.size(); ++i) {
    const WidgetRow& row = _content->rows[i];
    int minimum, natural, ignored;
    // A widget must be measured before it is placed.
    _rows[i]->measure(Gtk::Orientation::HORIZONTAL, -1, minimum, natural, ignored, ignored);
    const auto at = [](double length) { return static_cast<int>(std::lround(length)); };
    _rows[i]->size_allocate({0, at(row.y), std::max(width, minimum), std::max(at(row.height), 1)}, -1);
  }
}

void WidgetView::snapshot_vfunc(const Glib::RefPtr<Gtk::Snapshot>& snapshot) {
  if (_picture) {
    const protocol::Rendered& layout = _content->picture->layout;
    const graphene_rect_t bounds = GRAPHENE_RECT_INIT(0, 0, static_cast<float>(layout.width / layout.scale),
                                                      static_cast<float>(layout.height / layout.scale));
    snapshot->append_texture(_picture, &bounds);
  }
  for (const auto& row : _rows) snapshot_child(*row, snapshot);
}

}  // namespace nimbo
