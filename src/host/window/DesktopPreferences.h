#pragma once

#include <gtkmm/cssprovider.h>
#include <sigc++/sigc++.h>

#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "host/ColorSchemePortal.h"
#include "platform/ui/Environment.h"

namespace nimbo {

/// The style sheet of the application's windows, texts larger by `textScale` than the desktop has them.
std::string windowStyle(Appearance appearance, double textScale);

/// How the user wants things to look and read: as the desktop has it, changed by what he chose in this application.
/// Follows both while it lives, and dresses all windows of the program so. Main thread; one at a time.
class DesktopPreferences {
 public:
  DesktopPreferences();
  ~DesktopPreferences();

  /// "system" follows the desktop, as the choices below do when they were never made.
  const std::string& appearanceChoice() const { return _appearanceChoice; }
  void chooseAppearance(const std::string& choice);
  /// A language with a string table, or "system".
  const std::string& languageChoice() const { return _languageChoice; }
  void chooseLanguage(const std::string& choice);
  /// After how many seconds what is shown is asked for again (RefreshSetting.h).
  static std::string refreshChoice();
  static void chooseRefresh(const std::string& choice);
  /// Makes texts larger (1) or smaller (-1) than they are, or as large as on the desktop (0).
  void stepTextSize(int step);

  /// Width and height of the window when it was closed the last time.
  static std::pair<int, int> windowSize();
  static void keepWindowSize(int width, int height);

  Appearance appearance() const;
  ContentSizeCategory textSize() const;
  /// How large texts are beside those of `ContentSizeCategory::large`.
  double textScale() const;
  /// A BCP 47 tag or POSIX name; empty: the environment's.
  std::string locale() const;

  /// Appearance or text size is another.
  sigc::signal<void()>& signalLookChanged() { return _lookChanged; }
  /// The locale is another.
  sigc::signal<void()>& signalLocaleChanged() { return _localeChanged; }

 private:
  void apply();
  double desktopTextScale() const;

  bool _desktopIsDark;  // by the toolkit's own settings
  ColorSchemePortal _portal{[this] { apply(); }};
  std::string _appearanceChoice;
  std::string _languageChoice;
  int _textSizeSteps = 0;
  Glib::RefPtr<Gtk::CssProvider> _style;
  std::vector<sigc::connection> _connections;
  sigc::signal<void()> _lookChanged;
  sigc::signal<void()> _localeChanged;
};

}  // namespace nimbo
