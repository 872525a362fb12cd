#pragma once

#include <gtkmm/button.h>

#include "host/window/Page.h"
#include "host/window/PageContext.h"

namespace nimbo {

/// A star that tells and changes whether a line is a favourite.
class FavoriteStar final : public Gtk::Button {
 public:
  /// `line` may be null for a favourite, whose line is known to the favourites. `name` is for tooltips.
  FavoriteStar(const PageContext& context, std::uint64_t muid, TransitLineRef line, std::string name);

 private:
  void toggle();
  void show();

  const PageContext& _context;
  std::uint64_t _muid;
  TransitLineRef _line;
  std::string _name;
  bool _isFavorite = false;
};

/// A line: its shield, its agency, how it runs, and what happens on it.
class LinePage final : public Page {
 public:
  /// A line as handed over, which says nothing about how it runs.
  LinePage(const PageContext& context, const TransitLineItemRef& line);
  /// A favourite of `lines`, with its state.
  LinePage(const PageContext& context, const protocol::LineReport& line, const protocol::Lines& lines);
  /// A line that is no favourite, of which nothing is looked up.
  LinePage(const PageContext& context, const TransitLineRef& line);

 private:
  void addHeader(const PageContext& context, const TransitArtworkRef& artwork, const std::string& name,
                 const std::string& agency, Gtk::Widget* star);
  void addText(const std::string& text, const char* style = nullptr);
};

/// A list of incidents, over all lines.
class IncidentListPage final : public Page {
 public:
  IncidentListPage(const PageContext& context, const TransitIncidents& incidents);
};

/// What begins within seven days on the favourite lines, by line and day; and the lines of which that is not known.
class PlannedPage final : public Page {
 public:
  PlannedPage(const PageContext& context, const protocol::Lines& lines);
};

}  // namespace nimbo
