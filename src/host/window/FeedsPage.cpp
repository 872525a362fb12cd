#include "host/window/FeedsPage.h"

#include <gtkmm/label.h>

#include "desktop/gtfs/feeds/FeedCache.h"
#include "desktop/store/FavoritesEditor.h"
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
  _check.check({.feed = _feed.name}, [this](const protocol::FeedReport*) {
    _checkButton.set_sensitive(true);
    _checkButton.grab_focus();
  });
  _checkButton.set_sensitive(false);
}

namespace {

/// The answer that the feed goes and its favourites with it.
constexpr int kWithFavorites = 1;

}  // namespace

FeedsPage::FeedsPage(const PageContext& context)
    : Page(LocalizedString("Window_Feeds_Title")),
      _context(context),
      _form(context, [this](const protocol::FeedReport* report) {
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
  const auto feeds = _context.feeds().feeds();
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
  const std::vector<std::uint64_t> favorites = favoritesOf(feed.name);
  if (!favorites.empty())
    _confirmation->add_button(
        LocalizedFormat(LocalizedString("Window_Feed_RemoveWithFavorites"), {std::uint64_t{favorites.size()}}),
        kWithFavorites);
  _confirmation->signal_response().connect([this, name = feed.name, favorites](int response) {
    _confirmation->hide();
    if (response == kWithFavorites) remove(name, favorites);
    if (response == Gtk::ResponseType::ACCEPT) remove(name, {});
  });
  _confirmation->show();
}

std::vector<std::uint64_t> FeedsPage::favoritesOf(const std::string& feed) const {
  std::vector<std::uint64_t> muids;
  const auto favorites = _context.platform->favoritesEditor().left();
  if (!favorites) return muids;
  for (const FavoriteRef& favorite : *favorites)
    if (const auto* line = dynamic_cast<const FavoriteTransitLine*>(favorite.get()); line && line->transitLine())
      if (const auto& locator = line->transitLine()->identifier()->locator(); locator && locator->feed == feed)
        muids.push_back(line->transitLine()->muid());
  return muids;
}

void FeedsPage::remove(const std::string& name, const std::vector<std::uint64_t>& favorites) {
  ErrorRef failure = _context.feeds().remove(name);
  if (!failure) {
    FeedCache(_context.command.paths.cache).remove(name);
    if (!favorites.empty()) failure = _context.platform->favoritesEditor().remove(favorites);
  }
  showFeeds();
  if (failure) _context.navigator.tell(textOfError(*failure));
}

}  // namespace nimbo
