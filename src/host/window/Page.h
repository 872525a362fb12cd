#pragma once

#include <gtkmm/box.h>
#include <gtkmm/scrolledwindow.h>

#include <string>

#include "host/window/Column.h"

namespace nimbo {

/// A place in the window: a column of content that scrolls.
class Page : public Gtk::ScrolledWindow {
 public:
  explicit Page(std::string title);

  const std::string& title() const { return _title; }

 protected:
  Gtk::Box& content() { return _content; }

 private:
  std::string _title;
  Gtk::Box _content{Gtk::Orientation::VERTICAL, 12};
  Column _column{_content};
};

}  // namespace nimbo
