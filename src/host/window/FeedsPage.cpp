#include "host/window/FeedsPage.h"

#include <gtkmm/label.h>

#include "host/window/Texts.h"
#include "host/window/WidgetTexts.h"
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

FeedsPage::FeedsPage(const PageContext& context)
    : Page(LocalizedString("Window_Feeds_Title")),
      _context(context),
      _form(context, [this](const FeedCheckReport* report) {
        showFeeds();
        auto* added = dynamic_cast<FeedRow*>(_list.get_last_child());
        if (added && report) added->show(*report);
      }) {
  _none.set_text(LocalizedString("Window_Feeds_None"));
  _none.set_xalign(0);
  _list.add_css_class("card");
  _list.set_selection_mode(Gtk::SelectionMode::NONE);
  content().append(_none);
  content().append(_list);
  content().append(_form);
  showFeeds();
}

void FeedsPage::showFeeds() {
  while (Gtk::ListBoxRow* row = _list.get_row_at_index(0)) _list.remove(*row);
  const auto feeds = _context.library.configuration().feeds();
  if (!feeds) return _context.navigator.tell(textOfError(*feeds.error()));
  for (const Feed& feed : *feeds)
    _list.append(*Gtk::make_managed<FeedRow>(_context, feed, [this, feed] { confirmRemoval(feed); }));
  _list.set_visible(!feeds->empty());
  _none.set_visible(feeds->empty());
}

void FeedsPage::confirmRemoval(const Feed& feed) {
  auto* window = dynamic_cast<Gtk::Window*>(get_root());
  if (!window) return;
  _confirmation = std::make_unique<Gtk::MessageDialog>(
      *window, LocalizedFormat(LocalizedString("Window_Feed_RemoveQuestion"), {feed.name}), false,
      Gtk::MessageType::QUESTION, Gtk::ButtonsType::NONE, true);
  _confirmation->set_secondary_text(LocalizedString("Window_Feed_RemoveText"));
  _confirmation->add_button(LocalizedString("Window_Cancel"), Gtk::ResponseType::CANCEL);
  _confirmation->add_button(LocalizedString("Window_Feed_Remove"), Gtk::ResponseType::ACCEPT);
  _confirmation->signal_response().connect([this, name = feed.name](int response) {
    _confirmation->hide();
    if (response == Gtk::ResponseType::ACCEPT) remove(name);
  });
  _confirmation->show();
}

void FeedsPage::remove(const std::string& name) {
  const ErrorRef failure = FeedConfiguration(_context.command.paths.config).remove(name);
  if (!failure) _context.library.cache().remove(name);
  showFeeds();
  if (failure) _context.navigator.tell(textOfError(*failure));
}

}  // namespace nimbo
