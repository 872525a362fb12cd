#include "host/window/WindowStyle.h"

#include <algorithm>
#include <cmath>

#include "platform/ui/SystemColors.h"

namespace nimbo {

namespace {

constexpr const char* kStyle = R"css(
.page { padding: 18px; }
.card {
  background-color: @theme_base_color;
  border: 1px solid alpha(@borders, 0.7);
  border-radius: 12px;
}
.card-header { padding: 8px 8px 8px 16px; border-bottom: 1px solid alpha(@borders, 0.5); }
.widget-row {
  margin: 0; padding: 0; min-width: 0; min-height: 0;
  border: none; border-radius: 0; background: none; box-shadow: none;
}
.widget-row:focus-visible { outline: 2px solid @theme_selected_bg_color; outline-offset: -4px; border-radius: 12px; }
.line-title { font-size: 150%; font-weight: bold; }
.item-heading { font-size: 110%; font-weight: bold; }
.item-caption { font-size: 90%; opacity: 0.75; }
.item { padding: 10px 12px; }
.notice { padding: 12px 16px; }
.failed { color: @error_color; }
.starred { color: #b5830a; }
.small-button { padding: 2px 6px; min-width: 20px; min-height: 20px; }
.link-text { padding: 0; }
list.card { padding: 0; }
list.card > row { border-radius: 0; }
list.card > row:first-child { border-top-left-radius: 11px; border-top-right-radius: 11px; }
list.card > row:last-child { border-bottom-left-radius: 11px; border-bottom-right-radius: 11px; }
list.card > row:not(:last-child) { border-bottom: 1px solid alpha(@borders, 0.5); }
)css";

std::string percent(double scale) { return std::to_string(std::lround(scale * 100)) + "%"; }

std::string cssColor(const Color& color) {
  const auto part = [](double value) { return std::to_string(std::lround(value * 255)); };
  return "rgb(" + part(color.red) + "," + part(color.green) + "," + part(color.blue) + ")";
}

}  // namespace

std::string windowStyle(Appearance appearance, double textScale) {
  // A title that is much larger leaves no room for the buttons beside it.
  constexpr double kLargestHeaderScale = 1.4;
  return "window, popover { font-size: " + percent(textScale) + "; }" +  //
         "headerbar { font-size: " + percent(std::min(textScale, kLargestHeaderScale) / textScale) + "; }" +
         ".widget-card { background-color: " + cssColor(colorOf(SystemColor::background, appearance)) + "; }" + kStyle;
}

}  // namespace nimbo
