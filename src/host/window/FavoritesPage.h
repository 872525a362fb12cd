#pragma once

#include <gtkmm/button.h>
#include <gtkmm/label.h>
#include <gtkmm/listbox.h>
#include <gtkmm/searchentry.h>
#include <gtkmm/spinner.h>

#include <map>
#include <vector>

#include "host/window/LineRow.h"
#include "host/window/Page.h"

namespace nimbo {

/// The favourite lines in their order, and all lines of all feeds to choose from.
class FavoritesPage final : public Page {
 public:
  /// `query` is looked for among the lines; empty: nothing is.
  FavoritesPage(const PageContext& context, const std::string& query);

 private:
  void addSection(Gtk::Label& title, const char* key, Gtk::ListBox& list);
  void readFavorites();
  void showFavorites();
  /// Looks up which favourites' feeds are gone, or do not know them any more.
  void lookForGone();
  void search();
  /// Looks for the lines from this one on.
  void askForLines(std::size_t offset);
  void showFound(const protocol::FoundLines& found, std::size_t offset);
  void toggle(TransitLineRef line);
  void move(TransitLineRef line, std::size_t position);
  /// Shows the state after a change, or why there was none.
  void finish(const ErrorRef& failure);
  bool isFavorite(const TransitLine& line) const;

  const PageContext& _context;
  std::vector<TransitLineRef> _favorites;
  std::map<std::uint64_t, const char*> _gone;  // why, as a text's key, by the favourites' numbers
  std::size_t _shown = 0;                      // lines that were found
  Gtk::SearchEntry _query;
  Gtk::Label _favoritesTitle, _noFavorites, _linesTitle, _notice;
  Gtk::ListBox _favoritesList, _linesList;
  Gtk::Spinner _searching;
  Gtk::Button _more;
  std::shared_ptr<WidgetHostProcess::Question> _search, _goneLookup;
};

}  // namespace nimbo
