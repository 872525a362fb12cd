#include "host/window/IncidentCard.h"

#include <gtkmm/adjustment.h>
#include <gtkmm/linkbutton.h>
#include <gtkmm/picture.h>
#include <gtkmm/scrolledwindow.h>

#include <algorithm>
#include <cmath>

#include "host/FeedAnswers.h"
#include "host/telling/IncidentWords.h"
#include "host/window/LineStates.h"
#include "host/window/Page.h"
#include "host/window/ShieldImage.h"
#include "host/window/Texts.h"
#include "host/window/WidgetTexts.h"
#include "host/window/WidgetView.h"
#include "platform/Localization.h"
#include "platform/Platform.h"
#include "platform/transit/IncidentStringProvider.h"

namespace nimbo {

namespace {

/// More lines than that are a wall.
constexpr std::size_t kLineLimit = 8;
constexpr std::int64_t kCardShieldSize = 3;

const char* styleOfSeverity(protocol::Severity severity) {
  return severity == protocol::Severity::severe    ? "severity-severe"
         : severity == protocol::Severity::warning ? "severity-warning"
                                                   : "severity-info";
}

/// The side on which a publisher's text begins is that of its own direction, not of the interface's.
void alignByDirection(Gtk::Label& label) {
  PangoLayoutLine* const line = pango_layout_get_line(label.get_layout()->gobj(), 0);
  const bool isRightToLeft = pango_layout_line_get_resolved_direction(line) == PANGO_DIRECTION_RTL;
  label.set_xalign(isRightToLeft == (label.get_direction() == Gtk::TextDirection::RTL) ? 0 : 1);
}

/// An image at its own size, or smaller where its room is narrower. Without it a list would give an image that may be
/// smaller no height.
class ImageFrame final : public Gtk::Widget {
 public:
  ImageFrame(const Glib::RefPtr<Gdk::Texture>& image, const std::string& name) : _image(image), _picture(image) {
    _picture.set_parent(*this);
    // In the destructor the toolkit's part is gone.
    signal_destroy().connect([this] { _picture.unparent(); });
    setAccessibleLabel(_picture, name);
  }

 protected:
  Gtk::SizeRequestMode get_request_mode_vfunc() const override { return Gtk::SizeRequestMode::HEIGHT_FOR_WIDTH; }
  void measure_vfunc(Gtk::Orientation orientation, int forSize, int& minimum, int& natural, int& minimumBaseline,
                     int& naturalBaseline) const override {
    minimumBaseline = naturalBaseline = -1;
    natural = orientation == Gtk::Orientation::HORIZONTAL ? _image->get_width() : heightFor(forSize);
    minimum = orientation == Gtk::Orientation::HORIZONTAL ? 0 : natural;
  }
  void size_allocate_vfunc(int width, int, int baseline) override {
    const bool isAtTheRight = get_direction() == Gtk::TextDirection::RTL;
    const int shown = std::min(width, _image->get_width());
    _picture.size_allocate({isAtTheRight ? width - shown : 0, 0, shown, heightFor(width)}, baseline);
  }

 private:
  int heightFor(int width) const {
    if (width < 0 || width >= _image->get_width()) return _image->get_height();
    return std::max(
        1, static_cast<int>(std::lround(static_cast<double>(_image->get_height()) * width / _image->get_width())));
  }

  Glib::RefPtr<Gdk::Texture> _image;
  Gtk::Picture _picture;
};

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
    : _context(context), _incident(periods.front()), _hasLine(line.has_value()) {
  add_css_class("card");
  add_css_class("notice");
  set_activatable(false);
  set_child(_box);
  const TransitIncident& incident = *_incident;
  for (const auto& entity : incident.affectedEntities())
    if (entity->muid() != line && std::find(_affected.begin(), _affected.end(), entity->muid()) == _affected.end())
      _affected.push_back(entity->muid());

  const std::string title = IncidentStringProvider::cellTitleForIncident(&incident);
  addText(_box, title, "item-heading");
  addMarks();
  if (incident.isBlockingIncident()) addSaid(LocalizedString("Window_Incident_Blocking"), "failed");
  addDates(periods);
  addTexts(incident);
  addImage();
  _box.append(_affectedLines);
  showAffectedLines({});
  if (incident.linkURL()) addLink(*incident.linkURL());
  _box.append(_asOf);
  setAccessibleLabel(*this, title);
  setAccessibleDescription(*this, _said);
}

Gtk::Label* IncidentCard::addSaid(const std::string& text, const char* style) {
  if (!text.empty()) _said += (_said.empty() ? "" : "\n") + text;
  return addText(_box, text, style);
}

Gtk::Label* IncidentCard::addText(Gtk::Box& box, const std::string& text, const char* style) {
  if (text.empty()) return nullptr;
  auto* label = Gtk::make_managed<Gtk::Label>(text);
  label->set_wrap();
  label->set_wrap_mode(Pango::WrapMode::WORD_CHAR);
  alignByDirection(*label);
  label->add_css_class(style);
  box.append(*label);
  return label;
}

void IncidentCard::addImage() {
  const protocol::LineIncident* known = incidentNumbered(_context.lines, _incident->muid());
  if (!known) return;
  const std::string text = known->imageText.value_or("");
  Gtk::Label* const label = addSaid(text, "item-text");
  if (!known->hasImage) return;
  auto* place = Gtk::make_managed<Gtk::Box>();
  _box.append(*place);
  const std::string name = text.empty() ? IncidentStringProvider::cellTitleForIncident(_incident.get()) : text;
  const int width = Column::kLargestWidth * get_scale_factor();
  _image = _context.images->ask(known->id, width, [place, label, name](const auto& image) {
    if (!image) return;
    place->append(*Gtk::make_managed<ImageFrame>(textureOf(image), name));
    if (label) label->hide();
  });
}

void IncidentCard::addMarks() {
  const protocol::LineIncident* known = incidentNumbered(_context.lines, _incident->muid());
  if (!known) return;
  if (known->severity != protocol::Severity::unknown) add_css_class(styleOfSeverity(known->severity));
  addSaid(marksOf(*known), "item-caption");
}

void IncidentCard::addTexts(const TransitIncident& incident) {
  for (const std::string& text : textsBelowTitle(incident)) addSaid(text, "item-text");
}

void IncidentCard::addDates(const TransitIncidents& periods) {
  const DateText dates(_context.preferences.locale());
  const Date now = Platform::current().clock().now();
  const auto isOver = [now](const TransitIncidentRef& period) { return period->endDate() && *period->endDate() < now; };
  const bool allAreOver = std::all_of(periods.begin(), periods.end(), isOver);
  std::string text;
  for (const TransitIncidentRef& period : periods) {
    if (isOver(period) && !allAreOver) continue;
    const std::string line = dates.textOfPeriod(period->startDate(), period->endDate(), now);
    if (!line.empty()) text += (text.empty() ? "" : "\n") + line;
  }
  addSaid(text, "item-caption");
}

void IncidentCard::addLink(const std::string& url) {
  const std::string host = hostOfLink(url);
  if (host.empty()) return;
  auto* link =
      Gtk::make_managed<Gtk::LinkButton>(url, LocalizedFormat(LocalizedString("Window_Incident_Link"), {host}));
  link->set_halign(Gtk::Align::START);
  link->add_css_class("link-text");
  _box.append(*link);
}

void IncidentCard::showAsOf(const LinesByNumber& lines) {
  for (const auto& entity : _incident->affectedEntities()) {
    const auto line = lines.find(entity->muid());
    if (line == lines.end() || !line->second->identifier()->locator()) continue;
    const auto date = _context.asOf.find(line->second->identifier()->locator()->feed);
    if (date == _context.asOf.end()) continue;
    addText(_asOf,
            LocalizedFormat(LocalizedString("Window_Incident_Updated"),
                            {DateText(_context.preferences.locale()).textOf(date->second)}),
            "item-caption");
    return;
  }
}

void IncidentCard::showAffectedLines(const LinesByNumber& lines) {
  while (Gtk::Widget* child = _affectedLines.get_first_child()) _affectedLines.remove(*child);
  std::size_t named = 0;
  for (const std::uint64_t muid : _affected) {
    const auto line = lines.find(muid);
    if (line == lines.end() || named == kLineLimit) continue;
    if (named++ == 0)
      addText(_affectedLines, LocalizedString(_hasLine ? "Window_Incident_AlsoAffects" : "Window_Incident_Affects"),
              "item-caption");
    auto* row = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::HORIZONTAL, 8);
    row->append(*Gtk::make_managed<ShieldImage>(_context.preferences, artworkOfLine(*line->second), kCardShieldSize));
    addText(*row, nameBesideShield(*line->second), "item-text");
    _affectedLines.append(*row);
  }
  const std::uint64_t rest = _affected.size() - named;
  if (rest == 0) return;
  const char* key = named > 0  ? "Window_Incident_OtherLines"
                    : _hasLine ? "Window_Incident_AlsoAffectsCount"
                               : "Window_Incident_AffectsCount";
  addText(_affectedLines, LocalizedFormat(LocalizedString(key), {rest}), "item-caption");
}

namespace {

bool isInForce(const TransitIncident& incident, Date now) {
  return (!incident.startDate() || *incident.startDate() <= now) && (!incident.endDate() || *incident.endDate() >= now);
}

/// The incidents in their order, the gravest first, each with all its periods.
std::vector<TransitIncidents> groupedByNumber(const TransitIncidents& incidents, const protocol::Lines& lines) {
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
  const auto severityOf = [&](const TransitIncidents& periods) {
    const protocol::LineIncident* known = incidentNumbered(lines, periods.front()->muid());
    return known ? known->severity : protocol::Severity::unknown;
  };
  std::stable_sort(groups.begin(), groups.end(),
                   [&](const auto& a, const auto& b) { return severityOf(a) > severityOf(b); });
  const Date now = Platform::current().clock().now();
  std::stable_partition(groups.begin(), groups.end(), [now](const TransitIncidents& periods) {
    return std::any_of(periods.begin(), periods.end(), [now](const auto& period) { return isInForce(*period, now); });
  });
  return groups;
}

}  // namespace

IncidentCards::IncidentCards(const PageContext& context, const TransitIncidents& incidents,
                             std::optional<std::uint64_t> line)
    : _context(context) {
  // Cards are stops for the keyboard, which also brings one that is out of sight into view.
  add_css_class("cards");
  set_selection_mode(Gtk::SelectionMode::NONE);
  for (const TransitIncidents& periods : groupedByNumber(incidents, context.lines)) {
    _cards.push_back(Gtk::make_managed<IncidentCard>(context, periods, line));
    append(*_cards.back());
  }
  lookUpLines(context, incidents);
  signal_map().connect([this] { watchView(); });
}

void IncidentCards::watchView() {
  auto* page = dynamic_cast<Gtk::ScrolledWindow*>(get_ancestor(Gtk::ScrolledWindow::get_type()));
  if (!page) return;
  // Not before they have a place.
  add_tick_callback([this](const Glib::RefPtr<Gdk::FrameClock>&) { return !markWhatIsInView(); });
  page->get_vadjustment()->signal_value_changed().connect(
      sigc::hide_return(sigc::mem_fun(*this, &IncidentCards::markWhatIsInView)));
}

bool IncidentCards::markWhatIsInView() {
  GtkWidget* page = gtk_widget_get_ancestor(GTK_WIDGET(gobj()), GTK_TYPE_SCROLLED_WINDOW);
  graphene_rect_t place;
  std::vector<std::string> seen;
  bool havePlaces = false;
  for (IncidentCard* card : _cards) {
    if (!page || !gtk_widget_compute_bounds(GTK_WIDGET(card->gobj()), page, &place) || place.size.height <= 0) continue;
    havePlaces = true;
    const bool isInView =
        place.origin.y < static_cast<float>(gtk_widget_get_height(page)) && place.origin.y + place.size.height > 0;
    if (isInView && _marked.insert(card->id()).second) seen.push_back(card->id());
  }
  if (!seen.empty()) _context.navigator.markSeen(seen, false);
  return havePlaces || _cards.empty();
}

void IncidentCards::lookUpLines(const PageContext& context, const TransitIncidents& incidents) {
  std::set<std::uint64_t> muids;
  for (const TransitIncidentRef& incident : incidents)
    for (const auto& entity : incident->affectedEntities()) muids.insert(entity->muid());
  if (muids.empty()) return;
  protocol::DescribeLinesParams params;
  for (const std::uint64_t muid : muids) params.lines.push_back({.muid = muid});
  _lookup = context.process->ask(protocol::kDescribeLines, params, [this](const auto& described) {
    if (!described) return;  // the cards go on counting what they cannot name
    LinesByNumber lines;
    for (const protocol::DescribedLine& found : described->lines)
      if (found.line) lines.emplace(found.line->muid, lineOf(*found.line));
    for (IncidentCard* card : _cards) {
      card->showAffectedLines(lines);
      card->showAsOf(lines);
    }
  });
}

}  // namespace nimbo
