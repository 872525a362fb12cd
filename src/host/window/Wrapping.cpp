#include "host/window/Wrapping.h"

#include <gtkmm/button.h>
#include <gtkmm/editable.h>
#include <gtkmm/label.h>

namespace nimbo {

void wrapTexts(Gtk::Widget& root) {
  if (dynamic_cast<Gtk::Editable*>(&root)) return;  // its prompt is one line, as what is written over it
  if (auto* label = dynamic_cast<Gtk::Label*>(&root)) {
    label->set_wrap();
    // Long addresses and names break where they must, the few words on a button do not.
    const bool isOnButton = dynamic_cast<Gtk::Button*>(label->get_parent());
    label->set_wrap_mode(isOnButton ? Pango::WrapMode::WORD : Pango::WrapMode::WORD_CHAR);
  }
  for (Gtk::Widget* child = root.get_first_child(); child; child = child->get_next_sibling()) wrapTexts(*child);
}

}  // namespace nimbo
