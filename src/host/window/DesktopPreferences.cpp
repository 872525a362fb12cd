#include "host/window/DesktopPreferences.h"

#include <gtkmm/settings.h>
#include <gtkmm/stylecontext.h>

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstdio>

#include "desktop/resources/Resources.h"
#include "desktop/store/RefreshSetting.h"
#include "platform/Platform.h"
#include "platform/ui/Color.h"
#include "platform/ui/Font.h"

namespace nimbo {

namespace {

std::string sheet(const char* name) { return std::string(resourceNamed(name).value()); }

std::string percent(double scale) { return std::to_string(std::lround(scale * 100)) + "%"; }

std::string cssColor(const Color& color) {
  const auto part = [](double value) { return std::to_string(std::lround(value * 255)); };
  return "rgb(" + part(color.red) + "," + part(color.green) + "," + part(color.blue) + ")";
}

}  // namespace

std::string windowStyle(Appearance appearance, double textScale) {
  // A title that is much larger leaves no room for the buttons beside it.
  constexpr double kLargestHeaderScale = 1.4;
  const double headerScale = std::min(textScale, kLargestHeaderScale);
  constexpr double kIconSize = 16;  // pixels, beside texts of the usual size
  return sheet(appearance == Appearance::dark ? "window/dark.css" : "window/light.css") + "@define-color card_color " +
         cssColor(colorOf(SystemColor::background, appearance)) + ";" + sheet("window/style.css") +
         "window, tooltip { font-size: " + percent(textScale) + "; }" +
         "headerbar { font-size: " + percent(headerScale / textScale) + "; }" +
         "popover { font-size: 100%; } headerbar popover { font-size: " + percent(textScale / headerScale) + "; }" +
         ".page { -gtk-icon-size: " + std::to_string(std::lround(kIconSize * textScale)) + "px; }";
}

namespace {

constexpr const char* kSystem = "system";
constexpr std::string_view kAppearanceKey = "Nimbo.Window.appearance";
constexpr std::string_view kLanguageKey = "Nimbo.Window.language";
constexpr std::string_view kTextSizeKey = "Nimbo.Window.textSizeSteps";
constexpr std::string_view kWindowSizeKey = "Nimbo.Window.size";

constexpr int kLargestCategory = static_cast<int>(ContentSizeCategory::accessibilityExtraExtraExtraLarge);

/// The category whose texts are nearest to this scale.
int categoryOfScale(double scale) {
  const auto distance = [scale](int category) {
    return std::abs(std::log(textScaleForCategory(static_cast<ContentSizeCategory>(category)) / scale));
  };
  int nearest = 0;
  for (int category = 1; category <= kLargestCategory; ++category)
    if (distance(category) < distance(nearest)) nearest = category;
  return nearest;
}

std::string storedText(std::string_view key, const char* otherwise) {
  return Platform::current().sharedSettings().groupStore()->stringForKey(key).value_or(otherwise);
}

/// The choice serves now even where it cannot be kept, which the store logs.
void keep(const std::string& text, std::string_view key) {
  const auto store = Platform::current().sharedSettings().groupStore();
  const ErrorRef ignored = text == kSystem ? store->removeValueForKey(key) : store->setValue_forKey(text, key);
}

}  // namespace

DesktopPreferences::DesktopPreferences()
    : _appearanceChoice(storedText(kAppearanceKey, kSystem)), _languageChoice(storedText(kLanguageKey, kSystem)) {
  const std::string steps = storedText(kTextSizeKey, "0");
  std::from_chars(steps.data(), steps.data() + steps.size(), _textSizeSteps);
  const auto settings = Gtk::Settings::get_default();
  _desktopIsDark = settings->property_gtk_application_prefer_dark_theme();
  const auto changed = [this] { apply(); };
  _connections = {settings->property_gtk_theme_name().signal_changed().connect(changed),
                  settings->property_gtk_xft_dpi().signal_changed().connect(changed)};
  _style = Gtk::CssProvider::create();
  Gtk::StyleContext::add_provider_for_display(Gdk::Display::get_default(), _style,
                                              GTK_STYLE_PROVIDER_PRIORITY_APPLICATION);
  apply();
}

DesktopPreferences::~DesktopPreferences() {
  for (sigc::connection& connection : _connections) connection.disconnect();
  Gtk::StyleContext::remove_provider_for_display(Gdk::Display::get_default(), _style);
}

std::pair<int, int> DesktopPreferences::windowSize() {
  constexpr int kWidth = 420, kHeight = 680, kLeast = 200, kMost = 10'000;
  int width = 0, height = 0;
  const std::string text = storedText(kWindowSizeKey, "");
  if (std::sscanf(text.c_str(), "%dx%d", &width, &height) != 2) return {kWidth, kHeight};
  return {std::clamp(width, kLeast, kMost), std::clamp(height, kLeast, kMost)};
}

void DesktopPreferences::keepWindowSize(int width, int height) {
  keep(std::to_string(width) + "x" + std::to_string(height), kWindowSizeKey);
}

void DesktopPreferences::chooseAppearance(const std::string& choice) {
  _appearanceChoice = choice;
  keep(choice, kAppearanceKey);
  apply();
}

void DesktopPreferences::chooseLanguage(const std::string& choice) {
  if (choice == _languageChoice) return;
  _languageChoice = choice;
  keep(choice, kLanguageKey);
  _localeChanged.emit();
}

std::string DesktopPreferences::refreshChoice() {
  return std::to_string(std::lround(refreshSecondsOf(*Platform::current().sharedSettings().groupStore())));
}

void DesktopPreferences::chooseRefresh(const std::string& choice) { keep(choice, kRefreshSecondsKey); }

void DesktopPreferences::stepTextSize(int step) {
  const int base = categoryOfScale(desktopTextScale());
  const int wanted = step == 0 ? base : static_cast<int>(textSize()) + step;
  _textSizeSteps = std::clamp(wanted, 0, kLargestCategory) - base;
  keep(_textSizeSteps == 0 ? kSystem : std::to_string(_textSizeSteps), kTextSizeKey);
  apply();
}

Appearance DesktopPreferences::appearance() const {
  if (_appearanceChoice != kSystem) return _appearanceChoice == "dark" ? Appearance::dark : Appearance::light;
  const Glib::ustring theme = Gtk::Settings::get_default()->property_gtk_theme_name();
  const bool themeIsDark = theme.lowercase().find("dark") != Glib::ustring::npos;
  return _portal.prefersDark().value_or(_desktopIsDark || themeIsDark) ? Appearance::dark : Appearance::light;
}

double DesktopPreferences::desktopTextScale() const {
  // Desktops say how much larger texts are by the resolution of fonts. Source: GtkSettings:gtk-xft-dpi.
  constexpr double kUnitsPerDot = 1024, kUsualResolution = 96;
  const int resolution = Gtk::Settings::get_default()->property_gtk_xft_dpi();
  return resolution > 0 ? resolution / kUnitsPerDot / kUsualResolution : 1;
}

ContentSizeCategory DesktopPreferences::textSize() const {
  return static_cast<ContentSizeCategory>(
      std::clamp(categoryOfScale(desktopTextScale()) + _textSizeSteps, 0, kLargestCategory));
}

double DesktopPreferences::textScale() const { return textScaleForCategory(textSize()); }

std::string DesktopPreferences::locale() const { return _languageChoice == kSystem ? "" : _languageChoice; }

void DesktopPreferences::apply() {
  auto isDark = Gtk::Settings::get_default()->property_gtk_application_prefer_dark_theme();
  const bool wantsDark = appearance() == Appearance::dark;
  // The toolkit reads its theme anew with each call.
  if (isDark != wantsDark) isDark = wantsDark;
  _style->load_from_data(windowStyle(appearance(), textScale() / desktopTextScale()));
  _lookChanged.emit();
}

}  // namespace nimbo
