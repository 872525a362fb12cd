#include "host/window/Page.h"

namespace nimbo {

Page::Page(std::string title) : _title(std::move(title)) {
  set_policy(Gtk::PolicyType::NEVER, Gtk::PolicyType::AUTOMATIC);
  set_vexpand();
  _content.add_css_class("page");
  set_child(_column);
}

}  // namespace nimbo
