#include "host/window/MainWindow.h"

#include <giomm/menu.h>
#include <giomm/simpleaction.h>
#include <gtkmm/eventcontrollerkey.h>
#include <gtkmm/gestureclick.h>

#include <algorithm>
#include <iterator>

#include "desktop/rpc/Base64.h"
#include "host/FeedAnswers.h"
#include "host/telling/Teller.h"
#include "host/telling/TellingSettings.h"
#include "host/window/FavoritesPage.h"
#include "host/window/FeedsPage.h"
#include "host/window/HelpPages.h"
#include "host/window/IncidentPages.h"
#include "host/window/LineStates.h"
#include "host/window/WidgetTexts.h"
#include "platform/Localization.h"
#include "platform/Platform.h"

namespace nimbo {

namespace {

/// The languages that have string tables, each in its own words.
constexpr std::pair<const char*, const char*> kLanguages[] = {{"ar", "العربية"}, {"de", "Deutsch"},  {"en", "English"},
                                                              {"es", "Español"}, {"fr", "Français"}, {"ja", "日本語"}};

/// Seconds to choose from. Their texts need no plural forms, for which ICU would be opened with the window.
constexpr std::pair<const char*, const char*> kRefreshChoices[] = {{"30", "Window_Refresh_30"},
                                                                   {"60", "Window_Refresh_60"},
                                                                   {"300", "Window_Refresh_300"},
                                                                   {"1800", "Window_Refresh_1800"}};

bool isNotifyOn() { return TellingSettings::read(*Platform::current().sharedSettings().groupStore()).isOn; }

}  // namespace

Glib::RefPtr<Gio::MenuModel> makeMainMenu() {
  const auto texts = Gio::Menu::create();
  texts->append(LocalizedString("Window_Text_Larger"), "win.text-larger");
  texts->append(LocalizedString("Window_Text_Smaller"), "win.text-smaller");
  texts->append(LocalizedString("Window_Text_Normal"), "win.text-normal");

  const auto appearance = Gio::Menu::create();
  appearance->append(LocalizedString("Window_Appearance_System"), "win.appearance::system");
  appearance->append(LocalizedString("Window_Appearance_Light"), "win.appearance::light");
  appearance->append(LocalizedString("Window_Appearance_Dark"), "win.appearance::dark");

  const auto language = Gio::Menu::create();
  language->append(LocalizedString("Window_Language_System"), "win.language::system");
  for (const auto& [tag, name] : kLanguages) language->append(name, std::string("win.language::") + tag);

  const auto refresh = Gio::Menu::create();
  for (const auto& [seconds, key] : kRefreshChoices)
    refresh->append(LocalizedString(key), std::string("win.refresh::") + seconds);

  const auto look = Gio::Menu::create();
  look->append_submenu(LocalizedString("Window_Appearance"), appearance);
  look->append_submenu(LocalizedString("Window_Language"), language);
  look->append_submenu(LocalizedString("Window_Refresh"), refresh);

  const auto telling = Gio::Menu::create();
  telling->append(LocalizedString("Window_Seen_All"), "win.mark-seen");
  telling->append(LocalizedString("Window_Notify"), "win.notify");

  const auto last = Gio::Menu::create();
  last->append(LocalizedString("Window_Shortcuts"), "win.shortcuts");
  last->append(LocalizedString("Window_About"), "win.about");
  last->append(LocalizedString("Window_Quit"), "app.quit");

  const auto menu = Gio::Menu::create();
  menu->append_section(telling);
  menu->append_section(texts);
  menu->append_section(look);
  menu->append_section(last);
  return menu;
}

MainWindow::MainWindow(const CommandContext& command, HostPlatform& platform, DesktopPreferences& preferences)
    : _context{command, platform, preferences, *this, _asOf, _lines},
      _widgetPage(new WidgetPage(_context)),
      _pages(std::unique_ptr<Page>(_widgetPage)) {
  _context.process = &_widgetPage->process();
  _context.images = &_widgetPage->images();
  const auto [width, height] = preferences.windowSize();
  set_default_size(width, height);
  set_icon_name("org.nimbo.Transit");
  buildHeader();
  buildMessageBar();
  _body.append(_messageBar);
  _body.append(_pages);
  set_child(_body);
  addActions();
  _pages.signalFrontChanged().connect([this] { showFront(); });
  _widgetPage->signalTitleChanged().connect([this] { showTitle(); });
  showFront();
}

void MainWindow::buildHeader() {
  _back.set_icon_name("go-previous-symbolic");
  _back.set_tooltip_text(LocalizedString("Window_Back"));
  _back.set_action_name("win.back");
  _update.set_icon_name("view-refresh-symbolic");
  _update.set_tooltip_text(LocalizedString("Window_Update"));
  _update.set_action_name("win.update");
  _menu.set_icon_name("open-menu-symbolic");
  _menu.set_tooltip_text(LocalizedString("Window_Menu"));
  // A window is seldom open for its menu.
  _menu.set_create_popup_func([this] {
    if (!_menu.get_menu_model()) _menu.set_menu_model(makeMainMenu());
    // Other programs turn it on and off too.
    change_action_state("notify", Glib::Variant<bool>::create(isNotifyOn()));
  });
  _menu.set_primary();
  _menu.set_has_frame(false);
  // The focus stays on the page, where it comes back to when the page does.
  for (Gtk::Button* button : {&_back, &_update}) {
    button->add_css_class("flat");
    button->set_focus_on_click(false);
    setAccessibleLabel(*button, button->get_tooltip_text());
  }
  setAccessibleLabel(_menu, _menu.get_tooltip_text());
  _header.pack_start(_back);
  _header.pack_end(_menu);
  _header.pack_end(_update);
  set_titlebar(_header);
}

void MainWindow::buildMessageBar() {
  _message.set_wrap();
  _message.set_xalign(0);
  _message.set_hexpand();
  _messageBar.add_child(_message);
  _undoButton.set_label(LocalizedString("Window_Undo"));
  _undoButton.set_action_name("win.undo");
  _undoButton.set_visible(false);
  _messageBar.add_action_widget(_undoButton, Gtk::ResponseType::NONE);
  _messageBar.set_message_type(Gtk::MessageType::WARNING);
  _messageBar.set_show_close_button();
  _messageBar.set_visible(false);
  _messageBar.signal_response().connect([this](int) { _messageBar.set_visible(false); });
}

void MainWindow::addActions() {
  add_action("back", [this] { _pages.pop(); });
  add_action("shortcuts", [this] { push(std::make_unique<ShortcutsPage>()); });
  add_action("about", [this] { push(std::make_unique<AboutPage>()); });
  add_action("close-window", [this] { close(); });
  add_action("undo", [this] {
    _messageBar.set_visible(false);
    if (const auto undo = std::exchange(_undo, nullptr)) undo();
  });
  add_action("update", [this] { _widgetPage->update(); });
  add_action("mark-seen", [this] { markSeen(newIncidents(_lines), true); });
  addNotifyAction();
  DesktopPreferences& preferences = _context.preferences;
  add_action("text-larger", [&preferences] { preferences.stepTextSize(1); });
  add_action("text-smaller", [&preferences] { preferences.stepTextSize(-1); });
  add_action("text-normal", [&preferences] { preferences.stepTextSize(0); });
  const auto addChoice = [this](const char* name, const std::string& chosen, std::function<void(std::string)> choose) {
    const auto action = add_action_radio_string(name, chosen);
    action->signal_activate().connect([action, choose = std::move(choose)](const Glib::VariantBase& value) {
      action->set_state(value);
      choose(Glib::VariantBase::cast_dynamic<Glib::Variant<Glib::ustring>>(value).get());
    });
  };
  addChoice("appearance", preferences.appearanceChoice(),
            [&preferences](const std::string& choice) { preferences.chooseAppearance(choice); });
  addChoice("language", preferences.languageChoice(),
            [&preferences](const std::string& choice) { preferences.chooseLanguage(choice); });
  addChoice("refresh", preferences.refreshChoice(),
            [&preferences](const std::string& choice) { preferences.chooseRefresh(choice); });

  const auto keys = Gtk::EventControllerKey::create();
  keys->signal_key_pressed().connect(
      [this](guint key, guint, Gdk::ModifierType) {
        if (key != GDK_KEY_Escape || _pages.depth() < 2) return false;
        _pages.pop();
        return true;
      },
      false);
  add_controller(keys);
  constexpr guint kBackButton = 8;
  const auto clicks = Gtk::GestureClick::create();
  clicks->set_button(kBackButton);
  clicks->signal_pressed().connect([this](int, double, double) { _pages.pop(); });
  add_controller(clicks);
}

void MainWindow::addNotifyAction() {
  const auto action = add_action_bool("notify", isNotifyOn());
  action->signal_activate().connect([this, action](const Glib::VariantBase&) {
    if (const ErrorRef failure = setNotify(*_context.platform.operator->(), isNotifyOn() ? "off" : "on"))
      return tell(textOfError(*failure));
    action->set_state(Glib::Variant<bool>::create(isNotifyOn()));
    _widgetPage->showNotifyQuestion();
  });
}

void MainWindow::markSeen(const std::vector<std::string>& ids, bool isAsked) {
  std::vector<std::string> marked;
  for (const std::string& id : newIncidents(_lines))
    if (std::find(ids.begin(), ids.end(), id) != ids.end()) marked.push_back(id);
  if (!marked.empty()) _widgetPage->markSeen(marked, isAsked);
}

void MainWindow::showFront() {
  showTitle();
  const bool isFirst = _pages.depth() == 1;
  _back.set_visible(!isFirst);
  _update.set_visible(isFirst);
  _undo = nullptr;  // of the page that was left
  _messageBar.set_visible(false);
}

void MainWindow::push(std::unique_ptr<Page> page) { _pages.push(std::move(page)); }

void MainWindow::open(const OpenRequest& request) {
  struct Opener {
    MainWindow& window;
    void operator()(const ShowWidget&) { window._pages.popToFirst(); }
    void operator()(const ShowFavorites& show) {
      window.push(std::make_unique<FavoritesPage>(window._context, show.query));
    }
    void operator()(const ShowFeeds&) { window.push(std::make_unique<FeedsPage>(window._context)); }
    void operator()(const ShowLine& show) { window.push(std::make_unique<LinePage>(window._context, show.line)); }
    void operator()(const ShowIncidents& show) {
      window.push(std::make_unique<IncidentListPage>(window._context, show.incidents));
    }
    void operator()(const ShowFavoriteLine& show) {
      window._widgetPage->withLines(
          [&window = window, show](const protocol::Lines& lines) { window.openLine(show, lines); });
    }
    void operator()(const ShowIncident& show) {
      window._widgetPage->withLines(
          [&window = window, show](const protocol::Lines& lines) { window.openIncident(show, lines); });
    }
    void operator()(const ShowPlanned&) {
      window._widgetPage->withLines([&window = window](const protocol::Lines& lines) {
        window.push(std::make_unique<PlannedPage>(window._context, lines));
      });
    }
    void operator()(const ShowHandoff& show) {
      window._decoding =
          window._context.process->ask(protocol::kDecode, {base64(show.payload)},
                                       [&window = window, show](const Outcome<protocol::Handoff>& decoded) {
                                         if (const auto request = openRequestOfHandoff(show, decoded))
                                           window.open(*request);
                                         else
                                           window.tell(request.error()->reason());
                                       });
    }
  };
  std::visit(Opener{*this}, request);
}

void MainWindow::openLine(const ShowFavoriteLine& show, const protocol::Lines& lines) {
  const auto line = std::find_if(lines.lines.begin(), lines.lines.end(),
                                 [&](const protocol::LineReport& report) { return report.id == show.identifier; });
  if (line != lines.lines.end()) return push(std::make_unique<LinePage>(_context, *line, lines));
  _lineLookup =
      _context.process->ask(protocol::kDescribeLines, {.lines = {{.id = show.identifier}}},
                            [this, show](const Outcome<protocol::DescribedLines>& described) {
                              if (described && !described->lines.empty() && described->lines.front().line)
                                push(std::make_unique<LinePage>(_context, lineOf(*described->lines.front().line)));
                              else
                                tell(LocalizedFormat(LocalizedString("Window_Line_None"), {show.identifier}));
                            });
}

void MainWindow::openIncident(const ShowIncident& show, const protocol::Lines& lines) {
  const std::string id = std::to_string(show.muid);
  std::vector<protocol::LineIncident> periods;
  bool isUnknown = lines.error.has_value();
  for (const protocol::LineReport& line : lines.lines) {
    isUnknown = isUnknown || line.state == protocol::LineState::unknown;
    if (!periods.empty()) continue;
    for (const auto* list : {&line.incidents, &line.planned})
      std::copy_if(list->begin(), list->end(), std::back_inserter(periods),
                   [&](const protocol::LineIncident& incident) { return incident.id == id; });
  }
  if (!periods.empty())
    push(std::make_unique<IncidentListPage>(_context, incidentsOf(periods, lines)));
  else
    tell(LocalizedString(isUnknown ? "Window_Incident_Unknown" : "Window_Incident_Over"));
}

void MainWindow::tell(const std::string& message) { tell(message, nullptr); }

void MainWindow::tell(const std::string& message, std::function<void()> undo) {
  _undo = std::move(undo);
  _undoButton.set_visible(_undo != nullptr);
  _message.set_text(message);
  _messageBar.set_visible(true);
}

}  // namespace nimbo
