#include "host/window/FeedForm.h"

#include <gtkmm/dialog.h>

#include <algorithm>
#include <charconv>

#include "desktop/gtfs/feeds/FeedSetup.h"
#include "host/FeedAnswers.h"
#include "host/window/WidgetTexts.h"
#include "platform/Localization.h"

namespace nimbo {

FeedForm::FeedForm(const PageContext& context, std::optional<Feed> edited, Kept kept)
    : Gtk::Box(Gtk::Orientation::VERTICAL, 8),
      _context(context),
      _edited(std::move(edited)),
      _kept(std::move(kept)),
      _check(context) {
  const bool hasKey = _edited && !(_edited->staticFeed.key().isEmpty() && _edited->alerts.key().isEmpty());
  if (_edited) {
    auto* title =
        Gtk::make_managed<Gtk::Label>(LocalizedFormat(LocalizedString("Window_Feed_EditTitle"), {_edited->name}));
    title->add_css_class("item-heading");
    title->set_xalign(0);
    append(*title);
    _name.entry.set_text(_edited->name);
    _static.entry.set_text(_edited->staticFeed.text());
    _alerts.entry.set_text(_edited->alerts.text());
    _minorAlerts.set_active(_edited->minorAlerts);
    _combined.set_active(_edited->isCombined);
    if (_edited->staticMirror) _mirror.entry.set_text(_edited->staticMirror->text());
    if (_edited->maximumAlertsAge) _maximumAge.entry.set_text(std::to_string(_edited->maximumAlertsAge->count()));
  } else {
    addField(_name, "Window_Feed_Name", "Window_Feed_NamePrompt");
  }
  addField(_static, "Window_Feed_Static", "Window_Feed_StaticPrompt");
  addField(_alerts, "Window_Feed_Alerts", "Window_Feed_AlertsPrompt");
  if (_edited) {
    addField(_mirror, "Window_Feed_Mirror", "Window_Feed_MirrorPrompt");
    addField(_maximumAge, "Window_Feed_MaximumAge", "Window_Feed_MaximumAgePrompt");
  }
  addField(_key, "Window_Feed_Key", hasKey ? "Window_Feed_KeyKept" : "Window_Feed_KeyPrompt");
  _key.entry.set_visibility(false);
  _removeKeys.set_label(LocalizedString("Window_Feed_RemoveKeys"));
  _removeKeys.set_visible(hasKey);
  append(_removeKeys);
  _minorAlerts.set_label(LocalizedString("Window_Feed_MinorAlerts"));
  append(_minorAlerts);
  // Of a new feed asked only where the answer does not tell.
  _combined.set_label(LocalizedString("Window_Feed_Combined"));
  _combined.set_visible(_edited.has_value());
  append(_combined);
  append(_check);
  auto* buttons = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::HORIZONTAL, 8);
  _keep.set_label(LocalizedString(_edited ? "Window_Feed_Save" : "Window_Feed_Add"));
  _keep.add_css_class("suggested-action");
  _keep.signal_clicked().connect([this] { check(); });
  _keepAnyway.set_label(LocalizedString(_edited ? "Window_Feed_SaveAnyway" : "Window_Feed_AddAnyway"));
  _keepAnyway.signal_clicked().connect([this] {
    if (const auto entered = feed()) keep(*entered, nullptr);
  });
  _keepAnyway.hide();
  buttons->append(_keep);
  buttons->append(_keepAnyway);
  append(*buttons);
  wrapTexts(*this);
}

void FeedForm::addField(Field& field, const char* labelKey, const char* promptKey) {
  auto* label = Gtk::make_managed<Gtk::Label>(LocalizedString(labelKey));
  label->set_xalign(0);
  label->add_css_class("item-caption");
  append(*label);
  auto* row = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::HORIZONTAL);
  row->add_css_class("linked");
  Gtk::Entry& entry = field.entry;
  entry.set_hexpand();
  entry.set_placeholder_text(LocalizedString(promptKey));
  entry.signal_activate().connect([this] { check(); });
  entry.signal_changed().connect([this, &field] {
    _keepAnyway.hide();
    clear(field);
  });
  setAccessibleLabel(entry, label->get_text());
  row->append(entry);
  if (&field == &_static)
    addChooser(*row, entry, Gtk::FileChooser::Action::SELECT_FOLDER, "folder-symbolic", "Window_Feed_ChooseFolder");
  if (&field == &_static || &field == &_alerts)
    addChooser(*row, entry, Gtk::FileChooser::Action::OPEN, "document-open-symbolic", "Window_Feed_ChooseFile");
  append(*row);
  field.problem.add_css_class("failed");
  field.problem.set_xalign(0);
  field.problem.hide();
  append(field.problem);
}

void FeedForm::addChooser(Gtk::Box& row, Gtk::Entry& entry, Gtk::FileChooser::Action action, const char* icon,
                          const char* nameKey) {
  auto* button = Gtk::make_managed<Gtk::Button>();
  button->set_icon_name(icon);
  button->set_tooltip_text(LocalizedString(nameKey));
  setAccessibleLabel(*button, LocalizedString(nameKey));
  button->signal_clicked().connect([this, &entry, action] { choose(entry, action); });
  row.append(*button);
}

void FeedForm::choose(Gtk::Entry& entry, Gtk::FileChooser::Action action) {
  auto* window = dynamic_cast<Gtk::Window*>(get_root());
  if (!window) return;
  const bool isFolder = action == Gtk::FileChooser::Action::SELECT_FOLDER;
  _chooser = Gtk::FileChooserNative::create(
      LocalizedString(isFolder ? "Window_Feed_ChooseFolder" : "Window_Feed_ChooseFile"), *window, action);
  _chooser->set_modal();
  _chooser->signal_response().connect([this, &entry](int response) {
    const auto file = _chooser->get_file();
    if (response == Gtk::ResponseType::ACCEPT && file) entry.set_text(file->get_path());
    _chooser.reset();
  });
  _chooser->show();
}

std::optional<FeedAddress> FeedForm::addressIn(Field& field, const std::optional<FeedAddress>& before) {
  const std::string text = field.entry.get_text().raw();
  if (before && text == before->text()) return before;
  const auto address = FeedAddress::parse(text);
  if (!address) {
    showProblem(field, address.error());
    return std::nullopt;
  }
  return address->withQueryAsKey();
}

std::optional<Feed> FeedForm::feed() {
  for (Field* field : fields()) clear(*field);
  const std::string name = _name.entry.get_text();
  const ErrorRef problem = _edited ? nullptr : _context.feeds().checkNewName(name);
  if (problem) showProblem(_name, problem);
  const auto staticFeed = addressIn(_static, _edited ? std::optional(_edited->staticFeed) : std::nullopt);
  const auto alerts = addressIn(_alerts, _edited ? std::optional(_edited->alerts) : std::nullopt);
  if (problem || !staticFeed || !alerts) return std::nullopt;
  Feed feed = _edited.value_or(Feed{.name = name, .staticFeed = *staticFeed, .alerts = *alerts});
  feed.staticFeed = *staticFeed;
  feed.alerts = *alerts;
  if (_removeKeys.get_active())
    for (FeedAddress* address : {&feed.staticFeed, &feed.alerts}) *address = address->withKey({});
  if (_edited && !(takeMirror(feed) && takeMaximumAge(feed))) return std::nullopt;
  feed.minorAlerts = _minorAlerts.get_active();
  feed.isCombined = _combined.get_active();
  if (!takeKey(feed)) return std::nullopt;
  return feed;
}

bool FeedForm::takeMirror(Feed& feed) {
  const std::string text = _mirror.entry.get_text();
  const bool isAsBefore = feed.staticMirror && text == feed.staticMirror->text();
  // A copy is one of the address that there was.
  if (text.empty() || (isAsBefore && feed.staticFeed.text() != _edited->staticFeed.text())) {
    feed.staticMirror.reset();
    return true;
  }
  const auto address = FeedAddress::parse(text);
  if (!address || !address->isRemote()) {
    showProblem(_mirror, LocalizedString("Window_Feed_MirrorProblem"));
    return false;
  }
  feed.staticMirror = *address;
  return true;
}

bool FeedForm::takeMaximumAge(Feed& feed) {
  const std::string text = _maximumAge.entry.get_text();
  feed.maximumAlertsAge.reset();
  if (text.empty()) return true;
  const int least = feed.alerts.isRemote() ? 1 : 0;
  int minutes = -1;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), minutes);
  if (error != std::errc() || end != text.data() + text.size() || minutes < least ||
      minutes > kLongestAlertsAgeMinutes) {
    showProblem(_maximumAge, LocalizedFormat(LocalizedString("Window_Feed_MaximumAgeProblem"),
                                             {std::to_string(least), std::to_string(kLongestAlertsAgeMinutes)}));
    return false;
  }
  feed.maximumAlertsAge = std::chrono::minutes(minutes);
  return true;
}

bool FeedForm::takeKey(Feed& feed) {
  const std::string key = _key.entry.get_text();
  if (key.empty()) return true;
  const auto known = KnownFeeds::read();
  bool isWanted = false;
  for (FeedAddress* address : {&feed.staticFeed, &feed.alerts})
    if (const auto wanted = known ? known->keyFor(*address) : std::nullopt) {
      *address = withKey(*address, *wanted, key);
      isWanted = true;
    }
  if (isWanted) return true;
  if (const ErrorRef problem = FeedKey::checkHeader(key)) {
    showProblem(_key, problem);
    return false;
  }
  for (FeedAddress* address : {&feed.staticFeed, &feed.alerts})
    if (address->isRemote()) *address = address->withKey({{key}, address->key().query});
  return true;
}

void FeedForm::showProblem(Field& field, const std::string& problem) {
  const auto all = fields();
  const bool isFirst =
      std::none_of(all.begin(), all.end(), [](const Field* other) { return other->problem.get_visible(); });
  field.problem.set_text(problem);
  field.problem.show();
  field.entry.add_css_class("error");
  setAccessibleDescription(field.entry, field.problem.get_text());
  if (isFirst) field.entry.grab_focus();
}

void FeedForm::clear(Field& field) {
  field.problem.hide();
  field.entry.remove_css_class("error");
  setAccessibleDescription(field.entry, "");
}

void FeedForm::setBusy(bool busy) {
  for (Field* field : fields()) field->entry.set_sensitive(!busy);
  for (Gtk::Widget* widget : std::initializer_list<Gtk::Widget*>{&_removeKeys, &_minorAlerts, &_combined, &_keep})
    widget->set_sensitive(!busy);
}

void FeedForm::check() {
  const auto entered = feed();
  if (!entered) return;
  _keepAnyway.hide();
  _check.check({.definition = definitionOf(*entered)}, [this, entered = *entered](const protocol::FeedReport* report) {
    setBusy(false);
    _keep.grab_focus();
    if (!report) return;
    if (report->faults().empty()) return keep(entered, report);
    showFaults(*report);
    if (report->isOtherFeed) return _combined.show();
    _keepAnyway.show();
  });
  // The keyboard is with the check by now.
  setBusy(true);
}

void FeedForm::showFaults(const protocol::FeedReport& report) {
  _check.showBesideFaults(report);
  if (report.staticError) showProblem(_static, errorOf(*report.staticError));
  if (report.alertsError) showProblem(_alerts, errorOf(*report.alertsError));
  if (!report.alerts) return;
  for (const auto& fault : {report.alerts->staleness, report.alerts->gap})
    if (fault) showProblem(_alerts, errorOf(*fault));
}

void FeedForm::keep(Feed feed, const protocol::FeedReport* report) {
  if (report && report->alerts && report->alerts->hasOthers) feed.isCombined = true;
  FeedConfiguration configuration = _context.feeds();
  if (const ErrorRef failure = _edited ? configuration.replace(feed) : configuration.add(feed))
    return showProblem(_edited ? _static : _name, failure);
  if (!_edited) {
    for (Field* field : fields()) field->entry.set_text("");
    _combined.hide();
    _combined.set_active(false);
    _minorAlerts.set_active(false);
  }
  _check.cancel();
  _keepAnyway.hide();
  const Kept kept = _kept;  // the form may go with it
  const std::optional<protocol::FeedReport> found = report ? std::optional(*report) : std::nullopt;
  kept(feed, found ? &*found : nullptr);
}

}  // namespace nimbo
