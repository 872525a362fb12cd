#include "host/window/FeedsPage.h"

#include <gtkmm/label.h>

#include "desktop/gtfs/feeds/FeedCache.h"
#include "desktop/store/FavoritesEditor.h"
#include "host/window/Texts.h"
#include "host/window/WidgetTexts.h"
#include "platform/Localization.h"

namespace nimbo {

FeedRow::FeedRow(const PageContext& context, const Feed& feed, std::function<void()> remove, FeedForm::Kept changed)
    : _context(context), _feed(feed), _changed(std::move(changed)), _check(context) {
  set_activatable(false);
  Gtk::Box* const box = &_box;
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
  auto* editButton = Gtk::make_managed<Gtk::Button>(LocalizedString("Window_Feed_Edit"));
  editButton->signal_clicked().connect([this] { edit(); });
  removeButton->add_css_class("destructive-action");
  buttons->append(_checkButton);
  buttons->append(*editButton);
  buttons->append(*removeButton);
  // Large texts do not fit beside each other, and would make the window wider.
  const auto arrange = [&context, buttons] {
    constexpr double kLargestBeside = 1.4;
    const bool isBeside = context.preferences.textScale() <= kLargestBeside;
    buttons->set_orientation(isBeside ? Gtk::Orientation::HORIZONTAL : Gtk::Orientation::VERTICAL);
  };
  arrange();
  _lookChanged = context.preferences.signalLookChanged().connect(arrange);
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

void FeedRow::edit() {
  if (_form) {
    _box.remove(*std::exchange(_form, nullptr));
    return;
  }
  _form = Gtk::make_managed<FeedForm>(_context, _feed, _changed);
  _box.append(*_form);
  _form->child_focus(Gtk::DirectionType::TAB_FORWARD);
}

namespace {

/// The answer that the feed goes and its favourites with it.
constexpr int kWithFavorites = 1;

}  // namespace

FeedsPage::FeedsPage(const PageContext& context)
    : Page(LocalizedString("Window_Feeds_Title")),
      _context(context),
      _finder(context, [this](const Feed& feed, const protocol::FeedReport* report) { showAdded(feed, report); }),
      _form(context, std::nullopt,
            [this](const Feed& feed, const protocol::FeedReport* report) { showAdded(feed, report); }) {
  _none.set_text(LocalizedString("Window_Feeds_None"));
  _none.set_xalign(0);
  _list.add_css_class("card");
  _list.set_selection_mode(Gtk::SelectionMode::NONE);
  content().append(_none);
  content().append(_list);
  content().append(_finder);
  _byAddress.set_label(LocalizedString("Window_Find_ByAddress"));
  setAccessibleLabel(_byAddress, _byAddress.get_label());
  _form.add_css_class("card");
  _form.add_css_class("notice");
  _byAddress.set_child(_form);
  content().append(_byAddress);
  showFeeds();
}

void FeedsPage::showKept(const Feed& feed, const protocol::FeedReport* report) {
  showFeeds();
  for (int i = 0; auto* row = dynamic_cast<FeedRow*>(_list.get_row_at_index(i)); ++i)
    if (row->name() == feed.name && report) row->show(*report);
}

void FeedsPage::showAdded(const Feed& feed, const protocol::FeedReport* report) {
  const bool isFirst = _none.get_visible();
  showKept(feed, report);
  _finder.clear();
  if (isFirst && report) _context.navigator.open(ShowFavorites{});
}

void FeedsPage::showFeeds() {
  while (Gtk::ListBoxRow* row = _list.get_row_at_index(0)) _list.remove(*row);
  const auto feeds = _context.feeds().feeds();
  if (!feeds) return _context.navigator.tell(textOfError(*feeds.error()));
  for (const Feed& feed : *feeds)
    _list.append(*Gtk::make_managed<FeedRow>(
        _context, feed, [this, feed] { confirmRemoval(feed); },
        [this](const Feed& changed, const protocol::FeedReport* report) { showKept(changed, report); }));
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
  _confirmation->add_button(LocalizedString("Window_Feed_Remove"), Gtk::ResponseType::ACCEPT)
      ->add_css_class("destructive-action");
  const std::vector<TransitLineRef> favorites = favoritesOf(feed.name);
  if (!favorites.empty())
    _confirmation->add_button(
        LocalizedFormat(LocalizedString("Window_Feed_RemoveWithFavorites"), {std::uint64_t{favorites.size()}}),
        kWithFavorites);
  _confirmation->signal_response().connect([this, feed, favorites](int response) {
    _confirmation->hide();
    if (response == kWithFavorites) remove(feed, favorites);
    if (response == Gtk::ResponseType::ACCEPT) remove(feed, {});
  });
  _confirmation->show();
}

std::vector<TransitLineRef> FeedsPage::favoritesOf(const std::string& feed) const {
  std::vector<TransitLineRef> lines;
  const auto favorites = _context.platform->favoritesEditor().left();
  if (!favorites) return lines;
  for (const FavoriteRef& favorite : *favorites)
    if (const auto* line = dynamic_cast<const FavoriteTransitLine*>(favorite.get()); line && line->transitLine())
      if (const auto& locator = line->transitLine()->identifier()->locator(); locator && locator->feed == feed)
        lines.push_back(line->transitLine());
  return lines;
}

void FeedsPage::remove(const Feed& feed, const std::vector<TransitLineRef>& lines) {
  std::vector<std::uint64_t> favorites;
  favorites.reserve(lines.size());
  for (const TransitLineRef& line : lines) favorites.push_back(line->muid());
  ErrorRef failure = _context.feeds().remove(feed.name);
  if (!failure) {
    FeedCache(_context.command.paths.cache).remove(feed);
    if (!favorites.empty()) failure = _context.platform->favoritesEditor().remove(favorites);
  }
  showFeeds();
  if (failure) return _context.navigator.tell(textOfError(*failure));
  _context.navigator.tell(LocalizedFormat(LocalizedString("Window_Removed"), {feed.name}), [this, feed, lines] {
    ErrorRef undoFailure = _context.feeds().add(feed);
    if (!undoFailure && !lines.empty()) undoFailure = _context.platform->favoritesEditor().add(lines);
    showFeeds();
    if (undoFailure) _context.navigator.tell(textOfError(*undoFailure));
  });
}

}  // namespace nimbo
