#include "host/window/LineRow.h"

#include <gtkmm/eventcontrollerkey.h>
#include <gtkmm/label.h>

#include "host/window/Accessible.h"
#include "host/window/LineTexts.h"
#include "host/window/ShieldImage.h"
#include "platform/Localization.h"

namespace nimbo {

namespace {

constexpr std::int64_t kShieldSize = 5;
/// Shields stand in a column of this width, so that names begin below each other.
constexpr int kShieldColumn = 56;

}  // namespace

LineRow::LineRow(const PageContext& context, TransitLineRef line, bool isFavorite, std::function<void()> toggle)
    : _line(std::move(line)), _box(Gtk::make_managed<Gtk::Box>(Gtk::Orientation::HORIZONTAL, 8)) {
  set_activatable(false);
  _box->add_css_class("item");
  auto* shield = Gtk::make_managed<Gtk::Box>();
  shield->set_size_request(kShieldColumn, -1);
  shield->append(*Gtk::make_managed<ShieldImage>(context.preferences, artworkOfLine(*_line), kShieldSize));
  _box->append(*shield);

  const std::string name = nameOfLine(*_line), system = systemNameOfLine(*_line);
  auto* texts = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::VERTICAL, 2);
  texts->set_hexpand();
  for (const auto& [text, style] :
       {std::pair(nameBesideShield(*_line), "item-text"), std::pair(system, "item-caption")}) {
    auto* label = Gtk::make_managed<Gtk::Label>(text);
    label->add_css_class(style);
    label->set_xalign(0);
    label->set_wrap();
    label->set_wrap_mode(Pango::WrapMode::WORD_CHAR);
    label->set_visible(!text.empty());
    texts->append(*label);
  }
  _box->append(*texts);
  Gtk::Button& star = addButton(
      *_box, isFavorite ? "starred-symbolic" : "non-starred-symbolic",
      LocalizedFormat(LocalizedString(isFavorite ? "Window_Favorites_Remove" : "Window_Favorites_Add"), {name}),
      std::move(toggle));
  if (isFavorite) star.add_css_class("starred");
  set_child(*_box);
  setAccessibleLabel(*this, CommaDelimitedList(system.empty() ? std::vector{name} : std::vector{name, system}));
}

Gtk::Button& LineRow::addButton(Gtk::Box& box, const char* icon, const std::string& name, std::function<void()> act) {
  auto* button = Gtk::make_managed<Gtk::Button>();
  button->set_icon_name(icon);
  button->add_css_class("flat");
  button->set_valign(Gtk::Align::CENTER);
  button->set_tooltip_text(name);
  button->signal_clicked().connect(std::move(act));
  setAccessibleLabel(*button, name);
  box.append(*button);
  return *button;
}

void LineRow::addMoving(bool up, bool down, std::function<void(int)> move) {
  const std::string name = nameOfLine(*_line);
  auto* arrows = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::VERTICAL);
  arrows->set_valign(Gtk::Align::CENTER);
  const auto addArrow = [&](const char* icon, const char* key, bool isEnabled, int step) {
    Gtk::Button& arrow =
        addButton(*arrows, icon, LocalizedFormat(LocalizedString(key), {name}), [move, step] { move(step); });
    arrow.add_css_class("small-button");
    arrow.set_sensitive(isEnabled);
  };
  addArrow("go-up-symbolic", "Window_Favorites_Up", up, -1);
  addArrow("go-down-symbolic", "Window_Favorites_Down", down, 1);
  _box->append(*arrows);
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

}  // namespace nimbo
