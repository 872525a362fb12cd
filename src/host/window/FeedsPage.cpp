#include "host/window/FeedsPage.h"

#include "host/window/ErrorTexts.h"
#include "host/window/FeedRow.h"
#include "platform/Localization.h"

namespace nimbo {

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
