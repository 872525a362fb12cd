#pragma once

#include <gtkmm/button.h>
#include <gtkmm/widget.h>

#include <memory>
#include <vector>

#include "host/window/WidgetContent.h"

namespace nimbo {

/// The picture's own memory as a texture.
Glib::RefPtr<Gdk::Texture> textureOf(const std::shared_ptr<const WidgetPicture>& picture);

/// The widget on the screen: its picture, and over each row a button that draws only the focus, so that keyboard and
/// screen reader reach the rows. Takes another height in an animation, where the desktop wants any.
class WidgetView final : public Gtk::Widget {
 public:
  WidgetView();
  ~WidgetView() override;

  /// Null: nothing is known yet.
  void setContent(const WidgetContentRef& content);

  /// A row was chosen, by its index.
  sigc::signal<void(std::size_t)>& signalSelected() { return _selected; }
  /// The view has another width, in points, to which the widget may be drawn.
  sigc::signal<void(double)>& signalWidthChanged() { return _widthChanged; }
  /// A row is pressed, or no longer.
  sigc::signal<void(std::size_t, bool)>& signalPressed() { return _pressed; }

 protected:
  Gtk::SizeRequestMode get_request_mode_vfunc() const override { return Gtk::SizeRequestMode::CONSTANT_SIZE; }
  void measure_vfunc(Gtk::Orientation orientation, int forSize, int& minimum, int& natural, int& minimumBaseline,
                     int& naturalBaseline) const override;
  void size_allocate_vfunc(int width, int height, int baseline) override;
  void snapshot_vfunc(const Glib::RefPtr<Gtk::Snapshot>& snapshot) override;

 private:
  void makeRows(std::size_t count);
  void animateHeightTo(double height);
  bool animate(gint64 frameTime);

  WidgetContentRef _content;
  Glib::RefPtr<Gdk::Texture> _picture;
  std::vector<std::unique_ptr<Gtk::Button>> _rows;
  int _width = 0;      // as allocated
  double _height = 0;  // on the way from _fromHeight to _toHeight
  double _fromHeight = 0;
  double _toHeight = 0;
  gint64 _animationStart = 0;  // microseconds of the frame clock; 0: with the next frame
  guint _tick = 0;
  sigc::connection _widthReport;
  sigc::signal<void(double)> _widthChanged;
  sigc::signal<void(std::size_t)> _selected;
  sigc::signal<void(std::size_t, bool)> _pressed;
};

}  // namespace nimbo
