#include "host/window/Column.h"

#include <algorithm>

namespace nimbo {

namespace {

constexpr int kLargestWidth = 600;

}  // namespace

Column::Column(Gtk::Widget& child) : _child(child) { _child.set_parent(*this); }

Column::~Column() { _child.unparent(); }

void Column::measure_vfunc(Gtk::Orientation orientation, int forSize, int& minimum, int& natural, int& minimumBaseline,
                           int& naturalBaseline) const {
  const bool isHeight = orientation == Gtk::Orientation::VERTICAL;
  _child.measure(orientation, isHeight && forSize > 0 ? std::min(forSize, kLargestWidth) : -1, minimum, natural,
                 minimumBaseline, naturalBaseline);
}

void Column::size_allocate_vfunc(int width, int height, int baseline) {
  const int column = std::min(width, kLargestWidth);
  _child.size_allocate({(width - column) / 2, 0, column, height}, baseline);
}

}  // namespace nimbo
