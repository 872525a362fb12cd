#pragma once

#include <gtkmm/button.h>
#include <gtkmm/label.h>
#include <gtkmm/listbox.h>
#include <gtkmm/listboxrow.h>
#include <gtkmm/messagedialog.h>

#include <memory>
#include <vector>

#include "host/window/FeedCheckView.h"
#include "host/window/FeedForm.h"
#include "host/window/Page.h"

namespace nimbo {

/// A feed that is set up: what it is made of, how it fares, and what can be done with it.
class FeedRow final : public Gtk::ListBoxRow {
 public:
  /// `remove` hears that the user wants it gone.
  FeedRow(const PageContext& context, const Feed& feed, std::function<void()> remove);

  /// Shows what was found when the feed was read.
  void show(const protocol::FeedReport& report) { _check.show(report); }

 private:
  void check();

  Feed _feed;
  FeedCheckView _check;
  Gtk::Button _checkButton;
};

/// The feeds that the user set up, and a form for another one.
class FeedsPage final : public Page {
 public:
  explicit FeedsPage(const PageContext& context);

 private:
  void showFeeds();
  void confirmRemoval(const Feed& feed);
  /// The numbers of the favourite lines of a feed.
  std::vector<std::uint64_t> favoritesOf(const std::string& feed) const;
  void remove(const std::string& name, const std::vector<std::uint64_t>& favorites);

  const PageContext& _context;
  Gtk::Label _none;
  Gtk::ListBox _list;
  FeedForm _form;
  std::unique_ptr<Gtk::MessageDialog> _confirmation;
};

}  // namespace nimbo
