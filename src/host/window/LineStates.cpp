#include "host/window/LineStates.h"

#include <gtkmm/box.h>
#include <gtkmm/label.h>
#include <gtkmm/listboxrow.h>

#include <charconv>
#include <set>
#include <utility>

#include "host/FeedAnswers.h"
#include "host/window/ShieldImage.h"
#include "host/window/WidgetTexts.h"
#include "platform/Localization.h"

namespace nimbo {

namespace {

std::uint64_t numberOf(const protocol::LineIncident& incident) {
  std::uint64_t number = 0;
  std::from_chars(incident.id.data(), incident.id.data() + incident.id.size(), number);
  return number;
}

bool hasIncident(const protocol::LineReport& line, const std::string& id) {
  for (const auto* list : {&line.incidents, &line.planned})
    for (const protocol::LineIncident& incident : *list)
      if (incident.id == id) return true;
  return false;
}

}  // namespace

TransitIncidents incidentsOf(const std::vector<protocol::LineIncident>& incidents, const protocol::Lines& all) {
  TransitIncidents result;
  for (const protocol::LineIncident& incident : incidents) {
    TransitIncidentFields fields{.muid = numberOf(incident),
                                 .title = incident.title,
                                 .fullDescription = incident.text,
                                 .startDate = incident.from,
                                 .endDate = incident.until,
                                 .linkURL = incident.url};
    for (const protocol::LineReport& line : all.lines)
      if (hasIncident(line, incident.id))
        fields.affectedEntities.push_back(std::make_shared<const BasicAffectedEntity>(line.muid));
    result.push_back(std::make_shared<const BasicTransitIncident>(std::move(fields)));
  }
  return result;
}

const protocol::LineIncident* incidentNumbered(const protocol::Lines& lines, std::uint64_t muid) {
  const std::string id = std::to_string(muid);
  for (const protocol::LineReport& line : lines.lines)
    for (const auto* list : {&line.incidents, &line.planned})
      for (const protocol::LineIncident& incident : *list)
        if (incident.id == id) return &incident;
  return nullptr;
}

std::vector<std::string> newIncidents(const protocol::Lines& lines) {
  std::set<std::string> ids;
  for (const protocol::LineReport& line : lines.lines)
    for (const auto* list : {&line.incidents, &line.planned})
      for (const protocol::LineIncident& incident : *list)
        if (incident.isNew) ids.insert(incident.id);
  return {ids.begin(), ids.end()};
}

const char* styleOfState(protocol::LineState state) {
  return state == protocol::LineState::good ? "good" : state == protocol::LineState::affected ? "affected" : "failed";
}

std::string nameBesideShield(const protocol::LineReport& line) {
  const std::string shortName = line.shield ? line.shield->text.value_or("") + ", " : ", ";
  return line.name.starts_with(shortName) ? line.name.substr(shortName.size()) : line.name;
}

std::size_t countOfPlanned(const protocol::Lines& lines) {
  std::set<std::string> planned;
  for (const protocol::LineReport& line : lines.lines)
    for (const protocol::LineIncident& incident : line.planned) planned.insert(incident.id);
  return planned.size();
}

namespace {

/// What comes next on a line; empty without anything.
std::string textOfPlanned(const protocol::LineReport& line, const DateText& dates) {
  if (line.planned.empty()) return {};
  const protocol::LineIncident& next = line.planned.front();
  return LocalizedFormat(LocalizedString("Window_Line_Planned"), {dates.textOf(*next.from), next.title});
}

}  // namespace

LineStates::LineStates(const PageContext& context) : _context(context) {
  add_css_class("card");
  set_selection_mode(Gtk::SelectionMode::NONE);
  signal_row_activated().connect([this](Gtk::ListBoxRow* row) {
    _context.navigator.open(ShowFavoriteLine{_identifiers.at(static_cast<std::size_t>(row->get_index()))});
  });
  hide();
}

void LineStates::show(const protocol::Lines& lines) {
  const DateText dates(_context.preferences.locale());
  std::string texts;
  for (const protocol::LineReport& line : lines.lines)
    for (const std::string& text : {line.id, line.name, textOfState(line), textOfPlanned(line, dates)})
      texts += text + "\n";
  if (std::exchange(_texts, texts) == texts) return;  // rows stay, with the focus and whatever is over them
  int focused = -1;
  for (int i = 0; const Gtk::ListBoxRow* row = get_row_at_index(i); ++i)
    if (row->has_focus()) focused = i;
  while (Gtk::ListBoxRow* row = get_row_at_index(0)) remove(*row);
  _identifiers.clear();
  for (const protocol::LineReport& line : lines.lines) {
    _identifiers.push_back(line.id);
    append(*makeRow(line, dates));
  }
  set_visible(!lines.lines.empty());
  if (Gtk::ListBoxRow* row = focused < 0 ? nullptr : get_row_at_index(focused)) row->grab_focus();
}

Gtk::Widget* LineStates::makeRow(const protocol::LineReport& line, const DateText& dates) const {
  auto* row = Gtk::make_managed<Gtk::ListBoxRow>();
  auto* box = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::HORIZONTAL, 8);
  box->add_css_class("item");
  box->append(shieldOfRow(_context.preferences, artworkOf(line.shield)));
  auto* texts = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::VERTICAL, 2);
  texts->set_hexpand();
  std::vector<std::string> said{line.name};
  const auto add = [&](const std::string& text, const char* style) {
    if (text.empty()) return;
    auto* label = Gtk::make_managed<Gtk::Label>(text);
    label->add_css_class(style);
    label->set_xalign(0);
    texts->append(*label);
    if (said.size() > 1 || text != nameBesideShield(line)) said.push_back(text);
  };
  add(nameBesideShield(line), "item-text");
  add(textOfState(line), styleOfState(line.state));
  add(textOfPlanned(line, dates), "item-caption");
  box->append(*texts);
  row->set_child(*box);
  setAccessibleLabel(*row, CommaDelimitedList(said));
  wrapTexts(*row);
  return row;
}

}  // namespace nimbo
