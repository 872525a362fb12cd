#include "host/window/Wrapping.h"

#include <gtkmm/editable.h>
#include <gtkmm/label.h>

namespace nimbo {

void wrapTexts(Gtk::Widget& root) {
  if (dynamic_cast<Gtk::Editable*>(&root)) return;  // its prompt is one line, as what is written over it
  if (auto* label = dynamic_cast<Gtk::Label*>(&root)) {
    label->set_wrap();
    label->set_wrap_mode(Pango::WrapMode::WORD_CHAR);
  }
  for (Gtk::Widget* child = root.get_first_child(); child; child = child->get_next_sibling()) wrapTexts(*child);
}

}  // namespace nimbo
