#include "host/window/IncidentCards.h"

#include <algorithm>

#include "desktop/gtfs/FeedCatalog.h"
#include "platform/Platform.h"

namespace nimbo {

namespace {

bool isInForce(const TransitIncident& incident, Date now) {
  return (!incident.startDate() || *incident.startDate() <= now) && (!incident.endDate() || *incident.endDate() >= now);
}

/// The incidents in their order, each with all its periods.
std::vector<TransitIncidents> groupedByNumber(const TransitIncidents& incidents) {
  std::vector<TransitIncidents> groups;
  for (const TransitIncidentRef& incident : incidents) {
    const auto group = std::find_if(groups.begin(), groups.end(), [&](const TransitIncidents& periods) {
      return periods.front()->muid() == incident->muid();
    });
    if (group != groups.end())
      group->push_back(incident);
    else
      groups.push_back({incident});
  }
  const Date now = Platform::current().clock().now();
  std::stable_partition(groups.begin(), groups.end(), [now](const TransitIncidents& periods) {
    return std::any_of(periods.begin(), periods.end(), [now](const auto& period) { return isInForce(*period, now); });
  });
  return groups;
}

}  // namespace

IncidentCards::IncidentCards(const PageContext& context, const TransitIncidents& incidents,
                             std::optional<std::uint64_t> line) {
  // Cards are stops for the keyboard, which also brings one that is out of sight into view.
  add_css_class("cards");
  set_selection_mode(Gtk::SelectionMode::NONE);
  for (const TransitIncidents& periods : groupedByNumber(incidents)) {
    _cards.push_back(Gtk::make_managed<IncidentCard>(context, periods, line));
    append(*_cards.back());
  }
  lookUpLines(context, incidents);
}

void IncidentCards::lookUpLines(const PageContext& context, const TransitIncidents& incidents) {
  std::set<std::uint64_t> muids;
  for (const TransitIncidentRef& incident : incidents)
    for (const auto& entity : incident->affectedEntities()) muids.insert(entity->muid());
  if (muids.empty()) return;
  _lookup = context.workers.start([this, muids, &library = context.library](const std::stop_token& stop) {
    auto found = FeedCatalog(library).linesNumbered(muids, stop);
    return [this, found = std::move(found)] {
      if (!found) return;  // the cards go on counting what they cannot name
      LinesByNumber lines;
      for (const TransitLineRef& line : found->lines) lines.emplace(line->muid(), line);
      for (IncidentCard* card : _cards) {
        card->showAffectedLines(lines);
        card->showAsOf(lines);
      }
    };
  });
}

}  // namespace nimbo
