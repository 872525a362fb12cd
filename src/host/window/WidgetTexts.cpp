#include "host/window/WidgetTexts.h"

#include <gtkmm/button.h>
#include <gtkmm/editable.h>
#include <gtkmm/label.h>
#include <gtkmm/widget.h>

namespace nimbo {

void setAccessibleLabel(Gtk::Widget& widget, const std::string& label) {
  gtk_accessible_update_property(GTK_ACCESSIBLE(widget.gobj()), GTK_ACCESSIBLE_PROPERTY_LABEL, label.c_str(), -1);
}

void setAccessibleDescription(Gtk::Widget& widget, const std::string& description) {
  gtk_accessible_update_property(GTK_ACCESSIBLE(widget.gobj()), GTK_ACCESSIBLE_PROPERTY_DESCRIPTION,
                                 description.c_str(), -1);
}

void hideFromAccessibility(Gtk::Widget& widget, bool hidden) {
  gtk_accessible_update_state(GTK_ACCESSIBLE(widget.gobj()), GTK_ACCESSIBLE_STATE_HIDDEN, hidden, -1);
}

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
