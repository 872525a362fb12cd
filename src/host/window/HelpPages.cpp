#include "host/window/HelpPages.h"

#include <gtkmm/grid.h>
#include <gtkmm/icontheme.h>
#include <gtkmm/image.h>
#include <gtkmm/label.h>
#include <gtkmm/linkbutton.h>

#include "host/window/WidgetTexts.h"
#include "platform/Localization.h"
#include "platform/foundation/Version.h"

namespace nimbo {

namespace {

Gtk::Label* makeText(const std::string& text, const char* style) {
  auto* label = Gtk::make_managed<Gtk::Label>(text);
  label->set_xalign(0);
  label->add_css_class(style);
  return label;
}

/// Keys are written alike in every language.
constexpr std::pair<const char*, const char*> kKeys[] = {
    {"F5", "Window_Update"},          {"Esc, Alt+←", "Window_Back"},     {"F10", "Window_Menu"},
    {"Ctrl++", "Window_Text_Larger"}, {"Ctrl+−", "Window_Text_Smaller"}, {"Ctrl+0", "Window_Text_Normal"},
    {"Ctrl+?", "Window_Shortcuts"},   {"Ctrl+W", "Window_Close"},        {"Ctrl+Q", "Window_Quit"}};

}  // namespace

AboutPage::AboutPage() : Page(LocalizedString("Window_About")) {
  // A program that is not installed has none.
  if (Gtk::IconTheme::get_for_display(Gdk::Display::get_default())->has_icon("org.nimbo.Transit")) {
    auto* icon = Gtk::make_managed<Gtk::Image>();
    icon->set_from_icon_name("org.nimbo.Transit");
    icon->set_pixel_size(64);
    icon->set_halign(Gtk::Align::START);
    hideFromAccessibility(*icon);
    content().append(*icon);
  }
  content().append(*makeText(LocalizedString("Window_Title") + " " + kVersion, "line-title"));
  content().append(*makeText(LocalizedString("Window_About_Text"), "item-text"));
  content().append(*makeText(LocalizedString("Window_About_Sources"), "item-heading"));
  for (const auto& [address, source] :
       {std::pair("https://mobilitydatabase.org", "Mobility Database, CC0 1.0"),
        {"https://github.com/transitland/transitland-atlas", "Transitland Atlas, CC BY 4.0"}}) {
    auto* link = Gtk::make_managed<Gtk::LinkButton>(address, source);
    link->set_halign(Gtk::Align::START);
    link->add_css_class("link-text");
    content().append(*link);
  }
  content().append(*makeText(LocalizedString("Window_About_Mirror"), "item-caption"));
  wrapTexts(content());
}

ShortcutsPage::ShortcutsPage() : Page(LocalizedString("Window_Shortcuts")) {
  auto* grid = Gtk::make_managed<Gtk::Grid>();
  constexpr int kColumnSpacing = 24, kRowSpacing = 8;
  grid->set_column_spacing(kColumnSpacing);
  grid->set_row_spacing(kRowSpacing);
  for (int row = 0; const auto& [keys, text] : kKeys) {
    grid->attach(*makeText(keys, "item-heading"), 0, row);
    grid->attach(*makeText(LocalizedString(text), "item-text"), 1, row++);
  }
  content().append(*grid);
  wrapTexts(content());
}

}  // namespace nimbo
