#include "host/window/WindowStyle.h"

#include <algorithm>
#include <cmath>

#include "platform/ui/SystemColors.h"

namespace nimbo {

namespace {

constexpr const char* kStyle = R"css(
window, headerbar { background: none; background-color: @page_color; }
headerbar { border: none; box-shadow: none; }
.page { padding: 18px; }
.card {
  background: none;
  background-color: @card_color;
  border: 1px solid alpha(@borders, 0.7);
  border-radius: 12px;
}
.card-header { padding: 8px 8px 8px 16px; border-bottom: 1px solid alpha(@borders, 0.5); }
.card-header:dir(rtl) { padding: 8px 16px 8px 8px; }
button { border-radius: 8px; box-shadow: none; text-shadow: none; }
button.flat:hover, row.activatable:hover { background: none; background-color: alpha(currentColor, 0.08); }
button.text-button:not(.flat):not(.link):not(.suggested-action) {
  background: none;
  background-color: alpha(currentColor, 0.08);
  border-color: alpha(@borders, 0.7);
}
button.text-button:not(.flat):not(.link):not(.suggested-action):hover { background-color: alpha(currentColor, 0.14); }
button.suggested-action { background: none; background-color: @button_color; border-color: @button_color; color: white; }
button.suggested-action:hover { background-color: shade(@button_color, 1.1); }
button.link, link { color: @accent_text_color; }
*:focus-visible { outline-color: @accent_text_color; }
.widget-row, .widget-row:hover, .widget-row:active {
  margin: 0; padding: 0; min-width: 0; min-height: 0;
  border: none; border-radius: 0; background: none; box-shadow: none;
}
.widget-row:focus-visible { outline: 2px solid @accent_text_color; outline-offset: -4px; border-radius: 12px; }
/* The theme's own is an SVG file, whose library takes 7 MiB. */
spinner { -gtk-icon-source: -gtk-icontheme("view-refresh-symbolic"); }
.line-title { font-size: 150%; font-weight: bold; }
.item-heading { font-size: 110%; font-weight: bold; }
.item-caption { font-size: 90%; opacity: 0.75; }
.item { padding: 10px 12px; }
.notice { padding: 12px 16px; }
.failed { color: @failed_color; }
.starred { color: @star_color; }
.small-button { padding: 2px 6px; min-width: 20px; min-height: 20px; }
.link-text { padding: 0; }
list { background: none; }
list.card { padding: 0; }
list.card > row { border-radius: 0; }
list.card > row:first-child { border-top-left-radius: 11px; border-top-right-radius: 11px; }
list.card > row:last-child { border-bottom-left-radius: 11px; border-bottom-right-radius: 11px; }
list.card > row:not(:last-child) { border-bottom: 1px solid alpha(@borders, 0.5); }
list.cards > row:not(:last-child) { margin-bottom: 12px; }
)css";

/// Texts in these colours have a contrast of 4.5 to 1 or more on the cards, other marks one of 3 to 1.
constexpr const char* kLightColors =
    "@define-color page_color white; @define-color accent_text_color #1a5fb4; @define-color button_color #1c71d8;"
    "@define-color failed_color #b3131d; @define-color star_color #9c6a00;";
constexpr const char* kDarkColors =
    "@define-color page_color #121214; @define-color accent_text_color #78aeed; @define-color button_color #1c71d8;"
    "@define-color failed_color #ff8f80; @define-color star_color #e5b53b;";

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
  return (appearance == Appearance::dark ? kDarkColors : kLightColors) +
         ("@define-color card_color " + cssColor(colorOf(SystemColor::background, appearance)) + ";") + kStyle +
         "window, tooltip { font-size: " + percent(textScale) + "; }" +
         "headerbar { font-size: " + percent(headerScale / textScale) + "; }" +
         "popover { font-size: 100%; } headerbar popover { font-size: " + percent(textScale / headerScale) + "; }" +
         ".page { -gtk-icon-size: " + std::to_string(std::lround(kIconSize * textScale)) + "px; }";
}

}  // namespace nimbo
