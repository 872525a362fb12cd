#pragma once

#include <gtkmm/box.h>
#include <gtkmm/button.h>
#include <gtkmm/listboxrow.h>

#include <functional>

#include "host/window/PageContext.h"
#include "platform/transit/TransitLine.h"

namespace nimbo {

/// A line in a list, with a star that tells and changes whether it is a favourite.
class LineRow final : public Gtk::ListBoxRow {
 public:
  /// `toggle` hears a click on the star.
  LineRow(const PageContext& context, TransitLineRef line, bool isFavorite, std::function<void()> toggle);

  /// Adds buttons (and, while the row has the focus, Alt with an arrow key) that move the line up (-1) or down (1) in
  /// its list, where there is room that way.
  void addMoving(bool up, bool down, std::function<void(int)> move);

  const TransitLineRef& line() const { return _line; }

 private:
  static Gtk::Button& addButton(Gtk::Box& box, const char* icon, const std::string& name, std::function<void()> act);

  TransitLineRef _line;
  Gtk::Box* _box;
};

}  // namespace nimbo
