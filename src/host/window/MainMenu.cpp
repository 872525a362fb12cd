#include "host/window/MainMenu.h"

#include <giomm/menu.h>

#include "platform/Localization.h"

namespace nimbo {

namespace {

/// The languages that have string tables, each in its own words.
constexpr std::pair<const char*, const char*> kLanguages[] = {{"ar", "العربية"}, {"de", "Deutsch"},  {"en", "English"},
                                                              {"es", "Español"}, {"fr", "Français"}, {"ja", "日本語"}};

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

  const auto look = Gio::Menu::create();
  look->append_submenu(LocalizedString("Window_Appearance"), appearance);
  look->append_submenu(LocalizedString("Window_Language"), language);

  const auto last = Gio::Menu::create();
  last->append(LocalizedString("Window_Quit"), "app.quit");

  const auto menu = Gio::Menu::create();
  menu->append_section(texts);
  menu->append_section(look);
  menu->append_section(last);
  return menu;
}

}  // namespace nimbo
