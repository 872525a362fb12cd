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
  for (const auto& [text, style] : {std::pair(name, "body"), std::pair(system, "caption")}) {
    auto* label = Gtk::make_managed<Gtk::Label>(text);
    label->add_css_class(style);
    label->set_xalign(0);
    label->set_wrap();
    label->set_wrap_mode(Pango::WrapMode::WORD_CHAR);
    label->set_visible(!text.empty());
    texts->append(*label);
  }
  _box->append(*texts);
  addButton(isFavorite ? "starred-symbolic" : "non-starred-symbolic",
            LocalizedFormat(LocalizedString(isFavorite ? "Window_Favorites_Remove" : "Window_Favorites_Add"), {name}),
            true, std::move(toggle));
  set_child(*_box);
  setAccessibleLabel(*this, CommaDelimitedList(system.empty() ? std::vector{name} : std::vector{name, system}));
}

void LineRow::addButton(const char* icon, const std::string& name, bool isEnabled, std::function<void()> act) {
  auto* button = Gtk::make_managed<Gtk::Button>();
  button->set_icon_name(icon);
  button->add_css_class("flat");
  button->set_valign(Gtk::Align::CENTER);
  button->set_tooltip_text(name);
  button->set_sensitive(isEnabled);
  button->signal_clicked().connect(std::move(act));
  setAccessibleLabel(*button, name);
  _box->append(*button);
}

void LineRow::addMoving(bool up, bool down, std::function<void(int)> move) {
  const std::string name = nameOfLine(*_line);
  addButton("go-up-symbolic", LocalizedFormat(LocalizedString("Window_Favorites_Up"), {name}), up,
            [move] { move(-1); });
  addButton("go-down-symbolic", LocalizedFormat(LocalizedString("Window_Favorites_Down"), {name}), down,
            [move] { move(1); });
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
