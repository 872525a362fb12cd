#include "host/window/FeedFinder.h"

#include <gtkmm/linkbutton.h>

#include <algorithm>

#include "desktop/gtfs/feeds/FeedSetup.h"
#include "host/FeedAnswers.h"
#include "host/window/Texts.h"
#include "host/window/WidgetTexts.h"
#include "platform/Localization.h"

namespace nimbo {

namespace {

/// More feeds than anybody reads: the search narrows them.
constexpr std::size_t kMostRows = 30;

void addText(Gtk::Box& box, const std::string& text, const char* style) {
  auto* label = Gtk::make_managed<Gtk::Label>(text);
  label->set_xalign(0);
  label->add_css_class(style);
  box.append(*label);
}

std::string placeOf(const KnownFeed& known, const std::string& locale) {
  std::vector<std::string> parts{known.municipality, known.subdivision};
  if (!known.country.empty()) parts.push_back(stringsPart().countryName(known.country, locale));
  std::erase(parts, "");
  return CommaDelimitedList(parts);
}

std::string localeOf(const PageContext& context) {
  const std::string chosen = context.preferences.locale();
  return chosen.empty() ? DesktopPlatform::localeOfEnvironment() : chosen;
}

}  // namespace

KnownFeedRow::KnownFeedRow(const PageContext& context, const KnownFeed& known, Kept kept)
    : _context(context), _known(known), _kept(std::move(kept)), _check(context) {
  _box.add_css_class("item");
  addText(_box, known.title(), "item-heading");
  const std::string place = placeOf(known, localeOf(context));
  addText(_box, place, "item-caption");
  if (known.firstKey()) addText(_box, LocalizedString("Window_Find_Wants"), "item-caption");
  setAccessibleLabel(*this, CommaDelimitedList({known.title(), place}));
  if (const WantedKey* key = known.firstKey()) addKey(*key);
  _problem.add_css_class("failed");
  _problem.set_xalign(0);
  _problem.hide();
  _details.append(_problem);
  _details.append(_check);
  auto* buttons = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::HORIZONTAL, 8);
  _add.set_label(LocalizedString("Window_Feed_Add"));
  _add.add_css_class("suggested-action");
  _add.signal_clicked().connect([this] { start(); });
  _addAnyway.set_label(LocalizedString("Window_Feed_AddAnyway"));
  _addAnyway.signal_clicked().connect([this] { finish(true); });
  _addAnyway.hide();
  buttons->append(_add);
  buttons->append(_addAnyway);
  _details.append(*buttons);
  _details.hide();
  _box.append(_details);
  set_child(_box);
  wrapTexts(_box);
}

void KnownFeedRow::addKey(const WantedKey& key) {
  addText(_details, LocalizedFormat(LocalizedString("Window_Find_KeyText"), {_known.provider}), "item-text");
  if (!key.page.empty()) {
    auto* link = Gtk::make_managed<Gtk::LinkButton>(key.page, key.page);
    link->set_halign(Gtk::Align::START);
    link->add_css_class("link-text");
    _details.append(*link);
  }
  _key.set_placeholder_text(LocalizedString("Window_Find_KeyPrompt"));
  _key.set_visibility(false);
  _key.signal_activate().connect([this] { start(); });
  setAccessibleLabel(_key, LocalizedString("Window_Feed_Key"));
  _details.append(_key);
}

void KnownFeedRow::open() {
  if (_details.get_visible()) return;
  _details.show();
  if (_known.firstKey())
    _key.grab_focus();
  else
    start();
}

void KnownFeedRow::start() {
  _problem.hide();
  _addAnyway.hide();
  const std::string key = _key.get_text();
  if (const ErrorRef problem = _known.firstKey() ? checkKey(_known, key) : nullptr) {
    showProblem(problem);
    _key.grab_focus();
    return;
  }
  const auto present = _context.feeds().feeds();
  if (!present) return showProblem(present.error());
  _feeds = feedsOf(_known, nameForFeed(_known, *present), key);
  _reports.clear();
  _add.set_sensitive(false);
  _key.set_sensitive(false);
  checkNext();
}

void KnownFeedRow::checkNext() {
  Feed& feed = _feeds[_reports.size()];
  _check.check({.definition = definitionOf(feed)}, [this, &feed](const protocol::FeedReport* report) {
    const auto stop = [this] {
      _add.set_sensitive();
      _key.set_sensitive();
      (_known.firstKey() ? static_cast<Gtk::Widget&>(_key) : _add).grab_focus();
    };
    if (!report) return stop();
    // The catalog says that there are alerts at times.
    if (report->isOtherFeed && !std::exchange(feed.isCombined, true)) return checkNext();
    if (report->alerts && report->alerts->hasOthers) feed.isCombined = true;
    _reports.push_back(*report);
    if (_reports.size() < _feeds.size()) return checkNext();
    forgiveForeignAlerts(_reports);
    const auto isUsable = [](const protocol::FeedReport& found) { return found.faults().empty(); };
    if (std::any_of(_reports.begin(), _reports.end(), isUsable)) return finish(false);
    stop();
    _addAnyway.show();
  });
}

void KnownFeedRow::finish(bool all) {
  FeedConfiguration configuration = _context.feeds();
  std::optional<std::size_t> first;
  for (std::size_t i = 0; i < _feeds.size(); ++i) {
    if (!all && !_reports[i].faults().empty()) continue;
    if (const ErrorRef failure = configuration.add(_feeds[i])) return showProblem(failure);
    if (!first) first = i;
  }
  // The row goes with what is done now.
  const Feed feed = _feeds[*first];
  const protocol::FeedReport report = _reports[*first];
  const Kept kept = _kept;
  kept(feed, &report);
}

void KnownFeedRow::showProblem(const ErrorRef& problem) {
  _problem.set_text(textOfError(*problem));
  _problem.show();
}

FeedFinder::FeedFinder(const PageContext& context, KnownFeedRow::Kept kept)
    : Gtk::Box(Gtk::Orientation::VERTICAL, 8), _context(context), _kept(std::move(kept)) {
  addText(*this, LocalizedString("Window_Find_Title"), "item-heading");
  const std::string prompt = LocalizedString("Window_Find_Search");
  _query.property_placeholder_text() = prompt;
  setAccessibleLabel(_query, prompt);
  _query.signal_search_changed().connect([this] { search(); });
  _query.signal_stop_search().connect([this] {
    if (_query.get_text().empty())
      activate_action("win.back");
    else
      _query.set_text("");
  });
  append(_query);
  _notice.set_xalign(0);
  _notice.hide();
  append(_notice);
  _list.add_css_class("card");
  _list.set_selection_mode(Gtk::SelectionMode::NONE);
  _list.signal_row_activated().connect([](Gtk::ListBoxRow* row) {
    if (auto* known = dynamic_cast<KnownFeedRow*>(row)) known->open();
  });
  _list.hide();
  append(_list);
  wrapTexts(*this);
}

void FeedFinder::search() {
  while (Gtk::ListBoxRow* row = _list.get_row_at_index(0)) _list.remove(*row);
  const std::string text = _query.get_text();
  _notice.hide();
  _list.set_visible(!text.empty());
  if (text.empty()) return;
  if (!_known) _known = KnownFeeds::read();
  if (!*_known) {
    _notice.set_text(textOfError(*_known->error()));
    _notice.show();
    return _list.hide();
  }
  const std::string locale = localeOf(_context);
  const std::vector<KnownFeed> found = (*_known)->matching(text, locale);
  if (found.empty()) return showCountries(**_known, locale);
  for (std::size_t i = 0; i < std::min(found.size(), kMostRows); ++i)
    _list.append(*Gtk::make_managed<KnownFeedRow>(_context, found[i], _kept));
  if (found.size() <= kMostRows) return;
  _notice.set_text(LocalizedFormat(LocalizedString("Window_Find_More"), {std::uint64_t{found.size() - kMostRows}}));
  _notice.show();
}

void FeedFinder::showCountries(const KnownFeeds& known, const std::string& locale) {
  _notice.set_text(LocalizedString("Window_Find_None"));
  _notice.show();
  for (const auto& [name, count] : known.countries(locale)) {
    auto* label = Gtk::make_managed<Gtk::Label>(
        CommaDelimitedList({name, LocalizedFormat(LocalizedString("Window_Find_Count"), {std::uint64_t{count}})}));
    label->set_xalign(0);
    auto* button = Gtk::make_managed<Gtk::Button>();
    button->set_child(*label);
    button->add_css_class("flat");
    setAccessibleLabel(*button, label->get_text());
    wrapTexts(*button);
    button->signal_clicked().connect([this, country = name] {
      _query.set_text(country);
      _query.grab_focus();
    });
    _list.append(*button);
  }
}

}  // namespace nimbo
