#include "host/window/WindowStyle.h"

#include <algorithm>
#include <cmath>

#include "desktop/resources/Resources.h"
#include "platform/ui/SystemColors.h"

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

}  // namespace nimbo
