#include "host/window/IncidentPages.h"

#include <gtkmm/label.h>

#include "host/window/IncidentCard.h"
#include "host/window/ShieldImage.h"
#include "host/window/Texts.h"
#include "platform/Localization.h"

namespace nimbo {

LinePage::LinePage(const PageContext& context, const TransitLineItemRef& line) : Page(nameOfLine(*line)) {
  constexpr std::int64_t kShieldSize = 7;
  auto* header = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::HORIZONTAL, 12);
  header->append(*Gtk::make_managed<ShieldImage>(context.preferences, artworkOfLine(*line), kShieldSize));
  auto* texts = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::VERTICAL, 2);
  for (const auto& [text, style] :
       {std::pair(nameBesideShield(*line), "line-title"), std::pair(systemNameOfLine(*line), "item-caption")}) {
    auto* label = Gtk::make_managed<Gtk::Label>(text);
    label->add_css_class(style);
    label->set_xalign(0);
    label->set_visible(!text.empty());
    texts->append(*label);
  }
  header->append(*texts);
  content().append(*header);
  if (line->incidents().empty()) {
    auto* good = Gtk::make_managed<Gtk::Label>(LocalizedString("TransitWidget_GoodService_Title"));
    good->set_xalign(0);
    content().append(*good);
  }
  content().append(*Gtk::make_managed<IncidentCards>(context, line->incidents(), line->muid()));
}

IncidentListPage::IncidentListPage(const PageContext& context, const TransitIncidents& incidents)
    : Page(LocalizedString("Window_Incidents_Title")) {
  if (incidents.empty()) content().append(*Gtk::make_managed<Gtk::Label>(LocalizedString("Window_Incidents_None")));
  content().append(*Gtk::make_managed<IncidentCards>(context, incidents, std::nullopt));
}

}  // namespace nimbo
