#include "host/window/LineRow.h"

#include <gdkmm/contentprovider.h>
#include <glibmm/main.h>
#include <gtkmm/dragsource.h>
#include <gtkmm/droptarget.h>
#include <gtkmm/eventcontrollerkey.h>
#include <gtkmm/label.h>

#include "host/window/ShieldImage.h"
#include "host/window/Texts.h"
#include "host/window/WidgetTexts.h"
#include "platform/Localization.h"

namespace nimbo {

LineRow::LineRow(const PageContext& context, TransitLineRef line, bool isFavorite, std::function<void()> toggle)
    : _line(std::move(line)) {
  set_activatable(false);
  set_child(_box);
  _box.add_css_class("item");
  _box.append(shieldOfRow(context.preferences, artworkOfLine(*_line)));

  _texts.set_hexpand();
  _texts.set_valign(Gtk::Align::CENTER);
  _box.append(_texts);
  const std::string system = systemNameOfLine(*_line);
  addText(nameBesideShield(*_line), "item-text");
  addText(system, "item-caption");
  _said.push_back(nameOfLine(*_line));
  if (!system.empty()) _said.push_back(system);
  setAccessibleLabel(*this, CommaDelimitedList(_said));

  _star.signal_clicked().connect(toggle);
  _box.append(_star);
  setFavorite(isFavorite);
}

void LineRow::addText(const std::string& text, const char* style) {
  if (text.empty()) return;
  auto* label = Gtk::make_managed<Gtk::Label>(text);
  label->add_css_class(style);
  label->set_xalign(0);
  label->set_wrap();
  label->set_wrap_mode(Pango::WrapMode::WORD_CHAR);
  _texts.append(*label);
}

void LineRow::showGone(const char* key) {
  const std::string text = LocalizedString(key);
  addText(text, "failed");
  _said.push_back(text);
  setAccessibleLabel(*this, CommaDelimitedList(_said));
}

void LineRow::setFavorite(bool isFavorite) {
  setUpButton(_star, isFavorite ? "starred-symbolic" : "non-starred-symbolic",
              LocalizedFormat(LocalizedString(isFavorite ? "Window_Favorites_Remove" : "Window_Favorites_Add"),
                              {nameOfLine(*_line)}));
  if (isFavorite)
    _star.add_css_class("starred");
  else
    _star.remove_css_class("starred");
}

void LineRow::setUpButton(Gtk::Button& button, const char* icon, const std::string& name) {
  button.set_icon_name(icon);
  button.add_css_class("flat");
  button.set_valign(Gtk::Align::CENTER);
  button.set_tooltip_text(name);
  setAccessibleLabel(button, name);
}

void LineRow::addMoving(bool up, bool down, std::function<void(int)> move) {
  auto* arrows = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::VERTICAL);
  arrows->set_valign(Gtk::Align::CENTER);
  const auto addArrow = [&](const char* icon, const char* key, bool isEnabled, int step) {
    auto* arrow = Gtk::make_managed<Gtk::Button>();
    setUpButton(*arrow, icon, LocalizedFormat(LocalizedString(key), {nameOfLine(*_line)}));
    arrow->signal_clicked().connect([move, step] { move(step); });
    arrow->add_css_class("small-button");
    arrow->set_sensitive(isEnabled);
    arrows->append(*arrow);
  };
  addArrow("go-up-symbolic", "Window_Favorites_Up", up, -1);
  addArrow("go-down-symbolic", "Window_Favorites_Down", down, 1);
  _box.append(*arrows);
  const auto keys = Gtk::EventControllerKey::create();
  keys->signal_key_pressed().connect(
      [up, down, move](guint key, guint, Gdk::ModifierType modifiers) {
        if ((modifiers & Gdk::ModifierType::ALT_MASK) == Gdk::ModifierType()) return false;
        const bool isUp = key == GDK_KEY_Up && up, isDown = key == GDK_KEY_Down && down;
        if (isUp || isDown) move(isUp ? -1 : 1);
        return isUp || isDown;
      },
      false);
  add_controller(keys);
}

void LineRow::addDragging(int place, std::function<void(int from, int to)> move) {
  const auto drag = Gtk::DragSource::create();
  drag->set_actions(Gdk::DragAction::MOVE);
  drag->signal_prepare().connect(
      [place](double, double) {
        Glib::Value<int> value;
        value.init(Glib::Value<int>::value_type());
        value.set(place);
        return Gdk::ContentProvider::create(value);
      },
      false);
  add_controller(drag);
  const auto drop = Gtk::DropTarget::create(Glib::Value<int>::value_type(), Gdk::DragAction::MOVE);
  drop->signal_drop().connect(
      [place, move = std::move(move)](const Glib::ValueBase& value, double, double) {
        const int from = g_value_get_int(value.gobj());
        // The rows are made anew, which must not be while one of them is dropped on.
        if (from != place) Glib::signal_idle().connect_once([move, from, place] { move(from, place); });
        return from != place;
      },
      false);
  add_controller(drop);
}

}  // namespace nimbo
