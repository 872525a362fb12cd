#pragma once

#include <gtkmm/box.h>
#include <gtkmm/scrolledwindow.h>

#include <string>

namespace nimbo {

/// A place in the window: content that scrolls, one column not wider than is good to read.
class Page : public Gtk::ScrolledWindow {
 public:
  explicit Page(std::string title);

  const std::string& title() const { return _title; }

 protected:
  Gtk::Box& content() { return _content; }

 private:
  std::string _title;
  Gtk::Box _content{Gtk::Orientation::VERTICAL, 12};
};

}  // namespace nimbo
