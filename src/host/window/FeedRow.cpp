#include "host/window/FeedRow.h"

#include <gtkmm/label.h>

#include "host/window/Accessible.h"
#include "host/window/Wrapping.h"
#include "platform/Localization.h"

namespace nimbo {

FeedRow::FeedRow(const PageContext& context, const Feed& feed, std::function<void()> remove)
    : _feed(feed), _check(context) {
  set_activatable(false);
  auto* box = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::VERTICAL, 4);
  box->add_css_class("item");
  const auto addText = [box](const std::string& text, const char* style) {
    auto* label = Gtk::make_managed<Gtk::Label>(text);
    label->set_xalign(0);
    label->add_css_class(style);
    box->append(*label);
  };
  addText(feed.name, "item-heading");
  addText(feed.staticFeed.publicText(), "item-caption");
  addText(feed.alerts.publicText(), "item-caption");
  box->append(_check);
  auto* buttons = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::HORIZONTAL, 8);
  _checkButton.set_label(LocalizedString("Window_Feed_Check"));
  _checkButton.signal_clicked().connect([this] { check(); });
  auto* removeButton = Gtk::make_managed<Gtk::Button>(LocalizedString("Window_Feed_Remove"));
  removeButton->signal_clicked().connect(remove);
  buttons->append(_checkButton);
  buttons->append(*removeButton);
  box->append(*buttons);
  set_child(*box);
  wrapTexts(*box);
  setAccessibleLabel(*this, feed.name);
}

void FeedRow::check() {
  _check.check(_feed, [this](const FeedCheckReport*) {
    _checkButton.set_sensitive(true);
    _checkButton.grab_focus();
  });
  _checkButton.set_sensitive(false);
}

}  // namespace nimbo
