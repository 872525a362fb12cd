#pragma once

#include <gtkmm/box.h>
#include <gtkmm/button.h>
#include <gtkmm/listboxrow.h>

#include <functional>
#include <string>
#include <vector>

#include "host/window/PageContext.h"
#include "platform/transit/TransitLine.h"

namespace nimbo {

/// A line in a list, with a star that tells and changes whether it is a favourite.
class LineRow final : public Gtk::ListBoxRow {
 public:
  /// `toggle` hears a click on the star.
  LineRow(const PageContext& context, TransitLineRef line, bool isFavorite, std::function<void()> toggle);

  void setFavorite(bool isFavorite);
  /// Says why the line cannot be looked up any more; `key` is the text's.
  void showGone(const char* key);

  /// Adds buttons (and, while the row has the focus, Alt with an arrow key) that move the line up (-1) or down (1) in
  /// its list, where there is room that way.
  void addMoving(bool up, bool down, std::function<void(int)> move);

  /// Lets the row, the one at `place` of its list, be dragged to the place of another; `move` hears from where to
  /// where.
  void addDragging(int place, std::function<void(int from, int to)> move);

  const TransitLineRef& line() const { return _line; }
  Gtk::Button& star() { return _star; }

 private:
  static void setUpButton(Gtk::Button& button, const char* icon, const std::string& name);
  void addText(const std::string& text, const char* style);

  TransitLineRef _line;
  std::vector<std::string> _said;
  Gtk::Box _box{Gtk::Orientation::HORIZONTAL, 8};
  Gtk::Box _texts{Gtk::Orientation::VERTICAL, 2};
  Gtk::Button _star;
};

}  // namespace nimbo
