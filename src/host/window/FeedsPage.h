#pragma once

#include <gtkmm/button.h>
#include <gtkmm/expander.h>
#include <gtkmm/label.h>
#include <gtkmm/listbox.h>
#include <gtkmm/listboxrow.h>
#include <gtkmm/messagedialog.h>

#include <memory>
#include <vector>

#include "host/window/FeedCheckView.h"
#include "host/window/FeedFinder.h"
#include "host/window/FeedForm.h"
#include "host/window/Page.h"

namespace nimbo {

/// A feed that is set up: what it is made of, how it fares, and what can be done with it.
class FeedRow final : public Gtk::ListBoxRow {
 public:
  /// `remove` hears that the user wants it gone, `changed` that it is another one now.
  FeedRow(const PageContext& context, const Feed& feed, std::function<void()> remove, FeedForm::Kept changed);
  ~FeedRow() override { _lookChanged.disconnect(); }

  const std::string& name() const { return _feed.name; }
  /// Shows what was found when the feed was read.
  void show(const protocol::FeedReport& report) { _check.show(report); }

 private:
  void check();
  void edit();

  const PageContext& _context;
  Feed _feed;
  FeedForm::Kept _changed;
  Gtk::Box _box{Gtk::Orientation::VERTICAL, 4};
  FeedForm* _form = nullptr;  // while it is edited
  FeedCheckView _check;
  Gtk::Button _checkButton;
  sigc::connection _lookChanged;
};

/// The feeds that the user set up, and a form for another one.
class FeedsPage final : public Page {
 public:
  explicit FeedsPage(const PageContext& context);

 private:
  void showFeeds();
  void confirmRemoval(const Feed& feed);
  /// The favourite lines of a feed.
  std::vector<TransitLineRef> favoritesOf(const std::string& feed) const;
  /// With favourites of its.
  void remove(const Feed& feed, const std::vector<TransitLineRef>& lines);
  /// Shows a feed that was set up or changed.
  void showKept(const Feed& feed, const protocol::FeedReport* report);
  /// The same for a new one: after the first one lines are chosen.
  void showAdded(const Feed& feed, const protocol::FeedReport* report);

  const PageContext& _context;
  Gtk::Label _none;
  Gtk::ListBox _list;
  FeedFinder _finder;
  Gtk::Expander _byAddress;
  FeedForm _form;
  std::unique_ptr<Gtk::MessageDialog> _confirmation;
};

}  // namespace nimbo
