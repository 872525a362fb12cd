#include "host/window/IncidentPages.h"

#include <gtkmm/label.h>

#include <algorithm>

#include "desktop/store/FavoritesEditor.h"
#include "host/FeedAnswers.h"
#include "host/window/IncidentCard.h"
#include "host/window/LineStates.h"
#include "host/window/ShieldImage.h"
#include "host/window/Texts.h"
#include "host/window/WidgetTexts.h"
#include "platform/Localization.h"

namespace nimbo {

namespace {

constexpr std::int64_t kShieldSize = 7;

Gtk::Label* makeLabel(const std::string& text, const char* style) {
  auto* label = Gtk::make_managed<Gtk::Label>(text);
  if (style) label->add_css_class(style);
  label->set_xalign(0);
  label->set_visible(!text.empty());
  return label;
}

/// Marks incidents as seen, those too that are out of view; where none is new there is no button to see.
Gtk::Button* makeSeenButton(const PageContext& context, const TransitIncidents& incidents) {
  std::vector<std::string> ids;
  for (const TransitIncidentRef& incident : incidents) ids.push_back(std::to_string(incident->muid()));
  const std::vector<std::string> unseen = newIncidents(context.lines);
  auto* button = Gtk::make_managed<Gtk::Button>(LocalizedString("Window_Seen"));
  button->set_halign(Gtk::Align::START);
  button->set_visible(std::any_of(unseen.begin(), unseen.end(), [&ids](const std::string& id) {
    return std::find(ids.begin(), ids.end(), id) != ids.end();
  }));
  button->signal_clicked().connect([&context, button, ids] {
    context.navigator.markSeen(ids, true);
    button->hide();
  });
  return button;
}

}  // namespace

FavoriteStar::FavoriteStar(const PageContext& context, std::uint64_t muid, TransitLineRef line, std::string name)
    : _context(context), _muid(muid), _line(std::move(line)), _name(std::move(name)) {
  add_css_class("flat");
  set_valign(Gtk::Align::CENTER);
  signal_clicked().connect([this] { toggle(); });
  show();
}

void FavoriteStar::show() {
  _isFavorite = false;
  if (const auto favorites = _context.platform->favoritesEditor().left())
    for (const FavoriteRef& favorite : *favorites)
      if (const auto* kept = dynamic_cast<const FavoriteTransitLine*>(favorite.get());
          kept && kept->transitLine() && kept->transitLine()->muid() == _muid) {
        _isFavorite = true;
        _line = kept->transitLine();
      }
  set_icon_name(_isFavorite ? "starred-symbolic" : "non-starred-symbolic");
  const std::string text =
      LocalizedFormat(LocalizedString(_isFavorite ? "Window_Favorites_Remove" : "Window_Favorites_Add"), {_name});
  set_tooltip_text(text);
  setAccessibleLabel(*this, text);
  if (_isFavorite)
    add_css_class("starred");
  else
    remove_css_class("starred");
  set_visible(_isFavorite || _line);
}

void FavoriteStar::toggle() {
  FavoritesEditor& editor = _context.platform->favoritesEditor();
  const ErrorRef failure = _isFavorite ? editor.remove({_muid}) : editor.add({_line});
  show();
  if (failure) _context.navigator.tell(textOfError(*failure));
}

void LinePage::addHeader(const PageContext& context, const TransitArtworkRef& artwork, const std::string& name,
                         const std::string& agency, Gtk::Widget* star) {
  auto* header = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::HORIZONTAL, 12);
  header->append(*Gtk::make_managed<ShieldImage>(context.preferences, artwork, kShieldSize));
  auto* texts = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::VERTICAL, 2);
  texts->set_hexpand();
  texts->append(*makeLabel(name, "line-title"));
  texts->append(*makeLabel(agency, "item-caption"));
  header->append(*texts);
  if (star) header->append(*star);
  content().append(*header);
}

void LinePage::addText(const std::string& text, const char* style) { content().append(*makeLabel(text, style)); }

LinePage::LinePage(const PageContext& context, const TransitLineItemRef& line) : Page(nameOfLine(*line)) {
  // What is handed over keeps no place of the line, by which it could become a favourite.
  addHeader(context, artworkOfLine(*line), nameBesideShield(*line), systemNameOfLine(*line),
            Gtk::make_managed<FavoriteStar>(context, line->muid(), nullptr, nameOfLine(*line)));
  if (line->incidents().empty()) addText(LocalizedString("Window_Line_NothingHandedOver"));
  content().append(*Gtk::make_managed<IncidentCards>(context, line->incidents(), line->muid()));
}

LinePage::LinePage(const PageContext& context, const protocol::LineReport& line, const protocol::Lines& lines)
    : Page(line.name) {
  addHeader(context, artworkOf(line.shield), nameBesideShield(line), line.agency.value_or(""),
            Gtk::make_managed<FavoriteStar>(context, line.muid, nullptr, line.name));
  addText(textOfState(line), styleOfState(line.state));
  if (line.reason) addText(detailOfError(*errorOf(*line.reason)), "item-caption");
  content().append(*Gtk::make_managed<IncidentCards>(context, incidentsOf(line.incidents, lines), line.muid));
  if (!line.planned.empty()) {
    addText(LocalizedString("Window_Planned_Title"), "item-heading");
    content().append(*Gtk::make_managed<IncidentCards>(context, incidentsOf(line.planned, lines), line.muid));
  }
  TransitIncidents shown = incidentsOf(line.incidents, lines);
  for (TransitIncidentRef& planned : incidentsOf(line.planned, lines)) shown.push_back(std::move(planned));
  content().append(*makeSeenButton(context, shown));
  if (lines.updated && line.state != protocol::LineState::unknown)
    addText(LocalizedFormat(LocalizedString("Window_Updated"),
                            {DateText(context.preferences.locale()).textOf(*lines.updated)}),
            "item-caption");
}

LinePage::LinePage(const PageContext& context, const TransitLineRef& line) : Page(nameOfLine(*line)) {
  addHeader(context, artworkOfLine(*line), nameBesideShield(*line), systemNameOfLine(*line),
            Gtk::make_managed<FavoriteStar>(context, line->muid(), line, nameOfLine(*line)));
  addText(LocalizedString("Window_Line_NoFavorite"));
}

IncidentListPage::IncidentListPage(const PageContext& context, const TransitIncidents& incidents)
    : Page(LocalizedString("Window_Incidents_Title")) {
  if (incidents.empty())
    content().append(*Gtk::make_managed<Gtk::Label>(LocalizedString("Window_Line_NothingHandedOver")));
  content().append(*Gtk::make_managed<IncidentCards>(context, incidents, std::nullopt));
  content().append(*makeSeenButton(context, incidents));
}

PlannedPage::PlannedPage(const PageContext& context, const protocol::Lines& lines)
    : Page(LocalizedString("Window_Planned_Title")) {
  const DateText dates(context.preferences.locale());
  bool isPlanned = false;
  for (const protocol::LineReport& line : lines.lines) {
    const bool isUnknown = line.state == protocol::LineState::unknown;
    if (line.planned.empty() && !isUnknown) continue;
    auto* heading = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::HORIZONTAL, 8);
    heading->append(*Gtk::make_managed<ShieldImage>(context.preferences, artworkOf(line.shield), 5));
    heading->append(*makeLabel(nameBesideShield(line), "item-heading"));
    content().append(*heading);
    if (isUnknown) content().append(*makeLabel(textOfState(line), "failed"));
    // The planned incidents of each day, which come in the order of their beginnings.
    for (auto begin = line.planned.begin(); begin != line.planned.end();) {
      const std::string day = dates.dayOf(*begin->from);
      auto end = begin;
      while (end != line.planned.end() && dates.dayOf(*end->from) == day) ++end;
      content().append(*makeLabel(day, "item-caption"));
      content().append(*Gtk::make_managed<IncidentCards>(context, incidentsOf({begin, end}, lines), line.muid));
      begin = end;
      isPlanned = true;
    }
  }
  if (!isPlanned) content().append(*makeLabel(LocalizedString("Window_Planned_None"), nullptr));
}

}  // namespace nimbo
