#pragma once

#include <string>

namespace Gtk {
class Widget;
}

namespace nimbo {

/// What a screen reader says of a widget, in place of the texts in it.
void setAccessibleLabel(Gtk::Widget& widget, const std::string& label);

/// Hides a widget that only decorates from screen readers.
void hideFromAccessibility(Gtk::Widget& widget);

}  // namespace nimbo
