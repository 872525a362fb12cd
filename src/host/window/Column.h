#pragma once

#include <gtkmm/widget.h>

namespace nimbo {

/// One column in the middle of its room, not wider than is good to read.
class Column final : public Gtk::Widget {
 public:
  /// The child, which outlives the column, stays in it.
  explicit Column(Gtk::Widget& child);
  ~Column() override;

 protected:
  Gtk::SizeRequestMode get_request_mode_vfunc() const override { return Gtk::SizeRequestMode::HEIGHT_FOR_WIDTH; }
  void measure_vfunc(Gtk::Orientation orientation, int forSize, int& minimum, int& natural, int& minimumBaseline,
                     int& naturalBaseline) const override;
  void size_allocate_vfunc(int width, int height, int baseline) override;

 private:
  Gtk::Widget& _child;
};

}  // namespace nimbo
