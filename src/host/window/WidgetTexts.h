#pragma once

#include <string>

namespace Gtk {
class Widget;
}

namespace nimbo {

/// What a screen reader says of a widget, in place of the texts in it.
void setAccessibleLabel(Gtk::Widget& widget, const std::string& label);

/// What a screen reader says of a widget after its label.
void setAccessibleDescription(Gtk::Widget& widget, const std::string& description);

/// Hides a widget that only decorates, or is out of sight, from screen readers; or shows it again.
void hideFromAccessibility(Gtk::Widget& widget, bool hidden = true);

/// Lets all texts in a widget take more than one line, those of buttons too: large ones would make the window wider
/// than its screen, or be cut off.
void wrapTexts(Gtk::Widget& root);

}  // namespace nimbo
