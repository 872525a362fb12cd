#pragma once

#include <gtkmm/button.h>
#include <gtkmm/entry.h>
#include <gtkmm/label.h>
#include <gtkmm/listbox.h>
#include <gtkmm/listboxrow.h>
#include <gtkmm/searchentry.h>

#include "desktop/gtfs/feeds/KnownFeeds.h"
#include "host/window/FeedCheckView.h"

namespace nimbo {

/// A feed of the catalog, which sets up what it makes: asks for the key that it wants, reads it, and keeps what can be
/// used of it, or all when the user insists.
class KnownFeedRow final : public Gtk::ListBoxRow {
 public:
  /// Hears of the first feed that was kept, and what was found when it was read.
  using Kept = std::function<void(const Feed& feed, const protocol::FeedReport* report)>;

  KnownFeedRow(const PageContext& context, const KnownFeed& known, Kept kept);

  /// Asks for what is needed to set it up, or sets it up where nothing is.
  void open();

 private:
  void addKey(const WantedKey& key);
  void start();
  void checkNext();
  void finish(bool all);
  void showProblem(const ErrorRef& problem);

  const PageContext& _context;
  KnownFeed _known;
  Kept _kept;
  Gtk::Box _box{Gtk::Orientation::VERTICAL, 4};
  Gtk::Box _details{Gtk::Orientation::VERTICAL, 8};
  Gtk::Entry _key;
  Gtk::Label _problem;
  FeedCheckView _check;
  Gtk::Button _add, _addAnyway;
  std::vector<Feed> _feeds;                    // that are being set up
  std::vector<protocol::FeedReport> _reports;  // of the first of them
};

/// A search over the catalog of feeds. Where nothing is found it lists the countries.
class FeedFinder final : public Gtk::Box {
 public:
  FeedFinder(const PageContext& context, KnownFeedRow::Kept kept);

  void clear() { _query.set_text(""); }

 private:
  void search();
  void showCountries(const KnownFeeds& known, const std::string& locale);

  const PageContext& _context;
  KnownFeedRow::Kept _kept;
  std::optional<Outcome<KnownFeeds>> _known;  // once it is asked for
  Gtk::SearchEntry _query;
  Gtk::ListBox _list;
  Gtk::Label _notice;
};

}  // namespace nimbo
