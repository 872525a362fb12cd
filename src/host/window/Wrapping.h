#pragma once

namespace Gtk {
class Widget;
}

namespace nimbo {

/// Lets all texts in a widget take more than one line, those of buttons too: large ones would make the window wider
/// than its screen, or be cut off.
void wrapTexts(Gtk::Widget& root);

}  // namespace nimbo
