#pragma once

#include <gtkmm/listbox.h>

#include "host/window/IncidentCard.h"

namespace nimbo {

/// A card for each of some incidents, those that are in force first. What they affect is looked up in the feeds by and
/// by.
class IncidentCards final : public Gtk::ListBox {
 public:
  /// `line` is the line whose incidents they are; absent for a list over lines.
  IncidentCards(const PageContext& context, const TransitIncidents& incidents, std::optional<std::uint64_t> line);

 private:
  void lookUpLines(const PageContext& context, const TransitIncidents& incidents);

  std::vector<IncidentCard*> _cards;
  std::shared_ptr<Workers::Job> _lookup;
};

}  // namespace nimbo
