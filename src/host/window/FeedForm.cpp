#include "host/window/FeedForm.h"

#include <gtkmm/dialog.h>

#include "host/FeedAnswers.h"
#include "host/window/Texts.h"
#include "host/window/WidgetTexts.h"
#include "platform/Localization.h"

namespace nimbo {

FeedForm::FeedForm(const PageContext& context, Added added)
    : Gtk::Box(Gtk::Orientation::VERTICAL, 8), _context(context), _added(std::move(added)), _check(context) {
  add_css_class("card");
  add_css_class("notice");
  auto* title = Gtk::make_managed<Gtk::Label>(LocalizedString("Window_Feed_AddTitle"));
  title->add_css_class("item-heading");
  title->set_xalign(0);
  append(*title);
  addEntry(_name, "Window_Feed_Name", "Window_Feed_NamePrompt");
  addEntry(_static, "Window_Feed_Static", "Window_Feed_StaticPrompt");
  addEntry(_alerts, "Window_Feed_Alerts", "Window_Feed_AlertsPrompt");
  // Asked only where the answer does not tell.
  _combined.set_label(LocalizedString("Window_Feed_Combined"));
  _combined.hide();
  append(_combined);
  _problem.add_css_class("failed");
  _problem.set_xalign(0);
  _problem.hide();
  append(_problem);
  append(_check);
  auto* buttons = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::HORIZONTAL, 8);
  _add.set_label(LocalizedString("Window_Feed_Add"));
  _add.add_css_class("suggested-action");
  _add.signal_clicked().connect([this] { check(); });
  _addAnyway.set_label(LocalizedString("Window_Feed_AddAnyway"));
  _addAnyway.signal_clicked().connect([this] {
    if (const auto entered = feed()) keep(*entered, nullptr);
  });
  _addAnyway.hide();
  buttons->append(_add);
  buttons->append(_addAnyway);
  append(*buttons);
}

void FeedForm::addEntry(Gtk::Entry& entry, const char* labelKey, const char* promptKey) {
  auto* label = Gtk::make_managed<Gtk::Label>(LocalizedString(labelKey));
  label->set_xalign(0);
  label->add_css_class("item-caption");
  append(*label);
  auto* row = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::HORIZONTAL);
  row->add_css_class("linked");
  entry.set_hexpand();
  entry.set_placeholder_text(LocalizedString(promptKey));
  entry.signal_activate().connect([this] { check(); });
  entry.signal_changed().connect([this] { _addAnyway.hide(); });
  setAccessibleLabel(entry, label->get_text());
  row->append(entry);
  if (&entry == &_static)
    addChooser(*row, entry, Gtk::FileChooser::Action::SELECT_FOLDER, "folder-symbolic", "Window_Feed_ChooseFolder");
  if (&entry != &_name)
    addChooser(*row, entry, Gtk::FileChooser::Action::OPEN, "document-open-symbolic", "Window_Feed_ChooseFile");
  append(*row);
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

std::optional<Feed> FeedForm::feed() {
  _problem.hide();
  const std::string name = _name.get_text();
  if (const ErrorRef problem = FeedConfiguration::checkName(name)) {
    showProblem(textOfError(*problem));
    _name.grab_focus();
    return std::nullopt;
  }
  std::optional<FeedAddress> addresses[2];
  Gtk::Entry* entries[] = {&_static, &_alerts};
  for (std::size_t i = 0; i < std::size(entries); ++i) {
    const auto address = FeedAddress::parse(entries[i]->get_text().raw());
    if (!address) {
      showProblem(textOfError(*address.error()));
      entries[i]->grab_focus();
      return std::nullopt;
    }
    addresses[i] = *address;
  }
  return Feed{.name = name, .staticFeed = *addresses[0], .alerts = *addresses[1], .isCombined = _combined.get_active()};
}

void FeedForm::showProblem(const std::string& text) {
  _problem.set_text(text);
  _problem.show();
}

void FeedForm::setBusy(bool busy) {
  for (Gtk::Widget* widget :
       {static_cast<Gtk::Widget*>(&_name), static_cast<Gtk::Widget*>(&_static), static_cast<Gtk::Widget*>(&_alerts),
        static_cast<Gtk::Widget*>(&_combined), static_cast<Gtk::Widget*>(&_add)})
    widget->set_sensitive(!busy);
}

void FeedForm::check() {
  const auto entered = feed();
  if (!entered) return;
  _addAnyway.hide();
  _check.check({.definition = definitionOf(*entered)}, [this, entered = *entered](const protocol::FeedReport* report) {
    setBusy(false);
    _add.grab_focus();
    if (!report) return;
    if (report->faults().empty()) return keep(entered, report);
    if (report->isOtherFeed) return _combined.show();
    _addAnyway.show();
  });
  // The keyboard is with the check by now.
  setBusy(true);
}

void FeedForm::keep(Feed feed, const protocol::FeedReport* report) {
  if (report && report->alerts && report->alerts->hasOthers) feed.isCombined = true;
  if (const ErrorRef failure = _context.feeds().add(feed)) return showProblem(textOfError(*failure));
  for (Gtk::Entry* entry : {&_name, &_static, &_alerts}) entry->set_text("");
  _check.cancel();
  _addAnyway.hide();
  _combined.hide();
  _combined.set_active(false);
  _added(report);
}

}  // namespace nimbo
