#include "host/window/WindowStyle.h"

#include <cmath>

namespace nimbo {

namespace {

constexpr const char* kStyle = R"css(
.page { padding: 18px; }
.card {
  background-color: @theme_base_color;
  border: 1px solid alpha(@borders, 0.7);
  border-radius: 12px;
}
.card-header { padding: 8px 8px 8px 14px; border-bottom: 1px solid alpha(@borders, 0.5); }
.widget-row { margin: 0; padding: 0; min-width: 0; min-height: 0; border: none; border-radius: 0; background: none; box-shadow: none; }
.widget-row:focus-visible { outline: 2px solid @theme_selected_bg_color; outline-offset: -4px; border-radius: 12px; }
.line-title { font-size: 140%; font-weight: bold; }
.heading { font-weight: bold; }
.caption { font-size: 88%; opacity: 0.75; }
.item { padding: 10px 12px; }
.notice { padding: 10px 14px; }
.failed { color: @error_color; }
list.card > row { border-radius: 0; }
list.card > row:first-child { border-top-left-radius: 11px; border-top-right-radius: 11px; }
list.card > row:last-child { border-bottom-left-radius: 11px; border-bottom-right-radius: 11px; }
list.card > row:not(:last-child) { border-bottom: 1px solid alpha(@borders, 0.5); }
)css";

}  // namespace

std::string windowStyle(double textScale) {
  return "window, popover { font-size: " + std::to_string(std::lround(textScale * 100)) + "%; }" + kStyle;
}

}  // namespace nimbo
