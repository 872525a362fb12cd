#pragma once

#include <gtkmm/listbox.h>

#include <functional>

#include "host/window/PageContext.h"
#include "host/window/Texts.h"
#include "protocol/Lines.h"

namespace nimbo {

/// Incidents of `all` as cards show them, with those of its lines that they affect.
TransitIncidents incidentsOf(const std::vector<protocol::LineIncident>& incidents, const protocol::Lines& all);

/// The incident of this number in force or planned on a line; null where none has it. Lives as long as `lines`.
const protocol::LineIncident* incidentNumbered(const protocol::Lines& lines, std::uint64_t muid);

/// The numbers of the incidents, in force and planned, that the user has not seen yet; each once.
std::vector<std::string> newIncidents(const protocol::Lines& lines);

/// The CSS class that colours such a text.
const char* styleOfState(protocol::LineState state);

/// The name beside the line's shield, which says the short name already.
std::string nameBesideShield(const protocol::LineReport& line);

/// How many different incidents begin within seven days.
std::size_t countOfPlanned(const protocol::Lines& lines);

/// The favourite lines, each with its state, leading to its page.
class LineStates final : public Gtk::ListBox {
 public:
  explicit LineStates(const PageContext& context);
  void show(const protocol::Lines& lines);

 private:
  Gtk::Widget* makeRow(const protocol::LineReport& line, const DateText& dates) const;

  const PageContext& _context;
  std::vector<std::string> _identifiers;  // of the rows
  std::string _texts;                     // in them
};

}  // namespace nimbo
