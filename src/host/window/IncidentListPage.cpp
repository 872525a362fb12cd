#include "host/window/IncidentListPage.h"

#include <gtkmm/label.h>

#include "host/window/IncidentCards.h"
#include "platform/Localization.h"

namespace nimbo {

IncidentListPage::IncidentListPage(const PageContext& context, const TransitIncidents& incidents)
    : Page(LocalizedString("Window_Incidents_Title")) {
  if (incidents.empty()) content().append(*Gtk::make_managed<Gtk::Label>(LocalizedString("Window_Incidents_None")));
  content().append(*Gtk::make_managed<IncidentCards>(context, incidents, std::nullopt));
}

}  // namespace nimbo
