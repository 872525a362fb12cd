#include "host/window/IncidentCard.h"

#include <gtkmm/linkbutton.h>

#include <algorithm>

#include "host/window/Accessible.h"
#include "host/window/DateText.h"
#include "host/window/LineTexts.h"
#include "host/window/ShieldImage.h"
#include "platform/Localization.h"
#include "platform/Platform.h"
#include "platform/transit/IncidentStringProvider.h"

namespace nimbo {

namespace {

/// More shields than that are a wall.
constexpr std::size_t kShieldLimit = 5;
constexpr std::int64_t kShieldSize = 4;

/// The publisher's host of a web address; empty for any other address, which is not offered.
std::string hostOfLink(const std::string& url) {
  char *scheme = nullptr, *host = nullptr;
  const bool valid = g_uri_split(url.c_str(), G_URI_FLAGS_PARSE_RELAXED, &scheme, nullptr, &host, nullptr, nullptr,
                                 nullptr, nullptr, nullptr);
  const std::string protocol = scheme ? scheme : "", name = host ? host : "";
  g_free(scheme);
  g_free(host);
  return valid && (protocol == "http" || protocol == "https") ? name : std::string();
}

}  // namespace

IncidentCard::IncidentCard(const PageContext& context, const TransitIncidents& periods,
                           std::optional<std::uint64_t> line)
    : Gtk::Box(Gtk::Orientation::VERTICAL, 6), _context(context) {
  add_css_class("card");
  add_css_class("notice");
  // Stops for the keyboard, which also brings a card that is out of sight into view.
  set_focusable();
  const TransitIncident& incident = *periods.front();
  for (const auto& entity : incident.affectedEntities())
    if (entity->muid() != line && std::find(_affected.begin(), _affected.end(), entity->muid()) == _affected.end())
      _affected.push_back(entity->muid());

  const std::string title = IncidentStringProvider::cellTitleForIncident(&incident);
  addText(title, "heading");
  if (incident.isBlockingIncident()) addText(LocalizedString("Window_Incident_Blocking"), "failed");
  addDates(periods);
  addTexts(incident);
  append(_affectedShields);
  _affectedText.set_wrap();
  _affectedText.set_xalign(0);
  append(_affectedText);
  showAffectedLines({});
  if (incident.linkURL()) addLink(*incident.linkURL());
  if (incident.lastUpdated())
    addText(LocalizedFormat(LocalizedString("Window_Incident_Updated"),
                            {DateText(_context.preferences.locale()).textOf(*incident.lastUpdated())}),
            "caption");
  setAccessibleLabel(*this, title);
}

Gtk::Label& IncidentCard::addText(const std::string& text, const char* style) {
  auto* label = Gtk::make_managed<Gtk::Label>(text);
  label->set_wrap();
  label->set_wrap_mode(Pango::WrapMode::WORD_CHAR);
  label->set_xalign(0);
  label->add_css_class(style);
  label->set_visible(!text.empty());
  append(*label);
  return *label;
}

void IncidentCard::addTexts(const TransitIncident& incident) {
  const std::string title = IncidentStringProvider::cellTitleForIncident(&incident);
  std::string said = title;
  for (const auto* text : {&incident.summary(), &incident.fullDescription()}) {
    if (!*text || (*text)->empty() || **text == said) continue;
    said = **text;
    addText(said, "body");
  }
}

void IncidentCard::addDates(const TransitIncidents& periods) {
  const DateText dates(_context.preferences.locale());
  const Date now = Platform::current().clock().now();
  std::string text;
  for (const TransitIncidentRef& period : periods) {
    const std::string line = dates.textOfPeriod(period->startDate(), period->endDate(), now);
    if (!line.empty()) text += (text.empty() ? "" : "\n") + line;
  }
  addText(text, "caption");
}

void IncidentCard::addLink(const std::string& url) {
  const std::string host = hostOfLink(url);
  if (host.empty()) return;
  auto* link =
      Gtk::make_managed<Gtk::LinkButton>(url, LocalizedFormat(LocalizedString("Window_Incident_Link"), {host}));
  link->set_halign(Gtk::Align::START);
  append(*link);
}

void IncidentCard::showAffectedLines(const LinesByNumber& lines) {
  std::vector<std::string> names;
  while (Gtk::Widget* child = _affectedShields.get_first_child()) _affectedShields.remove(*child);
  std::size_t shields = 0;
  for (const std::uint64_t muid : _affected) {
    const auto line = lines.find(muid);
    if (line == lines.end()) continue;
    names.push_back(nameOfLine(*line->second));
    if (const TransitArtworkRef artwork = artworkOfLine(*line->second); artwork && ++shields <= kShieldLimit)
      _affectedShields.append(*Gtk::make_managed<ShieldImage>(_context.preferences, artwork, kShieldSize));
  }
  _affectedShields.set_visible(shields > 0);
  const std::size_t unknown = _affected.size() - names.size();
  if (!names.empty() && unknown > 0)
    names.push_back(LocalizedFormat(LocalizedString("Window_Incident_OtherLines"), {std::uint64_t{unknown}}));
  _affectedText.set_text(
      names.empty() ? LocalizedFormat(LocalizedString("Window_Incident_AffectsCount"), {std::uint64_t{unknown}})
                    : LocalizedFormat(LocalizedString("Window_Incident_Affects"), {CommaDelimitedList(names)}));
  _affectedText.set_visible(!_affected.empty());
}

}  // namespace nimbo
