#pragma once

#include <gtkmm/label.h>
#include <gtkmm/listbox.h>
#include <gtkmm/messagedialog.h>

#include <memory>

#include "host/window/FeedForm.h"
#include "host/window/Page.h"

namespace nimbo {

/// The feeds that the user set up, and a form for another one.
class FeedsPage final : public Page {
 public:
  explicit FeedsPage(const PageContext& context);

 private:
  void showFeeds();
  void confirmRemoval(const Feed& feed);
  void remove(const std::string& name);

  const PageContext& _context;
  Gtk::Label _none;
  Gtk::ListBox _list;
  FeedForm _form;
  std::unique_ptr<Gtk::MessageDialog> _confirmation;
};

}  // namespace nimbo
