#include "host/window/FavoritesPage.h"

#include <algorithm>
#include <set>

#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/store/FavoritesEditor.h"
#include "host/FeedAnswers.h"
#include "host/window/Texts.h"
#include "host/window/WidgetTexts.h"
#include "platform/Localization.h"

namespace nimbo {

namespace {

/// Lines that are shown at once.
constexpr std::size_t kLineLimit = 100;

bool isUnknownFeed(const protocol::FetchError& failure) {
  return failure.domain == kTransitLineServiceErrorDomain &&
         failure.code == static_cast<std::int64_t>(TransitLineServiceError::unknownFeed);
}

protocol::FetchError failureOf(const Error& error) { return {error.domain(), error.code(), error.reason(), {}, {}}; }

void clear(Gtk::ListBox& list) {
  while (Gtk::ListBoxRow* row = list.get_row_at_index(0)) list.remove(*row);
}

}  // namespace

FavoritesPage::FavoritesPage(const PageContext& context, const std::string& query)
    : Page(LocalizedString("Window_Favorites_Title")), _context(context) {
  const std::string prompt = LocalizedString("Window_Favorites_Search");
  _query.property_placeholder_text() = prompt;
  setAccessibleLabel(_query, prompt);
  _query.set_text(query);
  _query.signal_search_changed().connect([this] { search(); });
  _query.set_key_capture_widget(*this);
  _query.signal_stop_search().connect([this] {
    if (_query.get_text().empty())
      activate_action("win.back");
    else
      _query.set_text("");
  });
  content().append(_query);
  addSection(_favoritesTitle, "Window_Favorites_Yours", _favoritesList);
  _noFavorites.set_text(LocalizedString("TransitWidget_NoFavoriteTransitLines_SecondaryText"));
  _noFavorites.set_xalign(0);
  content().append(_noFavorites);
  addSection(_linesTitle, "Window_Favorites_Lines", _linesList);
  _notice.set_xalign(0);
  _notice.add_css_class("item-caption");
  content().append(_searching);
  content().append(_notice);
  _more.set_label(LocalizedString("Window_ShowMore"));
  _more.set_halign(Gtk::Align::START);
  _more.signal_clicked().connect([this] { askForLines(_shown); });
  _more.hide();
  content().append(_more);
  readFavorites();
  lookForGone();
  search();
}

void FavoritesPage::addSection(Gtk::Label& title, const char* key, Gtk::ListBox& list) {
  title.set_text(LocalizedString(key));
  title.add_css_class("item-heading");
  title.set_xalign(0);
  list.add_css_class("card");
  list.set_selection_mode(Gtk::SelectionMode::NONE);
  content().append(title);
  content().append(list);
}

bool FavoritesPage::isFavorite(const TransitLine& line) const {
  return std::any_of(_favorites.begin(), _favorites.end(),
                     [&](const TransitLineRef& favorite) { return favorite->muid() == line.muid(); });
}

void FavoritesPage::readFavorites() {
  FavoritesEditor& editor = _context.platform->favoritesEditor();
  const auto all = editor.left();
  if (!all) return _context.navigator.tell(textOfError(*all.error()));
  if (const auto whole = editor.list(); !whole) _context.navigator.tell(textOfError(*whole.error()));
  _favorites.clear();
  for (const FavoriteRef& favorite : *all)
    if (const auto* line = dynamic_cast<const FavoriteTransitLine*>(favorite.get()); line && line->transitLine())
      _favorites.push_back(line->transitLine());
}

void FavoritesPage::lookForGone() {
  protocol::DescribeLinesParams params;
  std::vector<MapItemIdentifierRef> asked;
  for (const TransitLineRef& line : _favorites) {
    if (!line->identifier()->locator()) continue;
    asked.push_back(line->identifier());
    params.lines.push_back(keyOf(*asked.back()));
  }
  _goneLookup = _context.process->ask(protocol::kDescribeLines, params, [this, asked](const auto& described) {
    if (!described) return;
    std::set<std::string> goneFeeds;
    // Feeds that cannot be read are told of by the search.
    for (const protocol::FetchError& failure : described->failures)
      if (isUnknownFeed(failure)) goneFeeds.insert(failure.feed.value_or(""));
    _gone.clear();
    for (std::size_t i = 0; i < std::min(asked.size(), described->lines.size()); ++i) {
      if (described->lines[i].isGone) _gone[asked[i]->muid()] = "Window_Favorites_Gone";
      if (goneFeeds.contains(asked[i]->locator()->feed)) _gone[asked[i]->muid()] = "Window_Favorites_FeedGone";
    }
    if (!_gone.empty()) showFavorites();
  });
}

void FavoritesPage::showFavorites() {
  // Whoever takes stars away by keyboard goes on with the next one.
  int focusedIndex = -1;
  for (int i = 0; const Gtk::ListBoxRow* row = _favoritesList.get_row_at_index(i); ++i)
    if ((row->get_state_flags() & Gtk::StateFlags::FOCUS_WITHIN) != Gtk::StateFlags()) focusedIndex = i;
  clear(_favoritesList);
  for (std::size_t i = 0; i < _favorites.size(); ++i) {
    const TransitLineRef& line = _favorites[i];
    auto* row = Gtk::make_managed<LineRow>(_context, line, true, [this, line] { toggle(line); });
    row->addMoving(i > 0, i + 1 < _favorites.size(), [this, line, i](int step) {
      move(line, static_cast<std::size_t>(static_cast<std::ptrdiff_t>(i) + step));
    });
    row->addDragging(static_cast<int>(i), [this](int from, int to) {
      if (const auto index = static_cast<std::size_t>(from); index < _favorites.size())
        move(_favorites[index], static_cast<std::size_t>(to));
    });
    if (const auto gone = _gone.find(line->muid()); gone != _gone.end()) row->showGone(gone->second);
    _favoritesList.append(*row);
    if (static_cast<int>(i) == std::min(focusedIndex, static_cast<int>(_favorites.size()) - 1))
      row->star().grab_focus();
  }
  const bool isSearching = !_query.get_text().empty();
  _favoritesTitle.set_visible(!isSearching);
  _favoritesList.set_visible(!isSearching && !_favorites.empty());
  _noFavorites.set_visible(!isSearching && _favorites.empty());
}

void FavoritesPage::search() {
  showFavorites();
  askForLines(0);
}

void FavoritesPage::askForLines(std::size_t offset) {
  _searching.start();
  const protocol::FindLinesParams params{.query = _query.get_text().raw(), .offset = offset, .limit = kLineLimit};
  _search = _context.process->ask(protocol::kFindLines, params, [this, offset](const auto& found) {
    _searching.stop();
    if (offset == 0) clear(_linesList);
    showFound(found ? *found : protocol::FoundLines{.failures = {failureOf(*found.error())}}, offset);
  });
}

void FavoritesPage::showFound(const protocol::FoundLines& found, std::size_t offset) {
  for (const protocol::FeedLine& described : found.lines) {
    const TransitLineRef line = lineOf(described);
    _linesList.append(*Gtk::make_managed<LineRow>(_context, line, isFavorite(*line), [this, line] { toggle(line); }));
  }
  _shown = offset + found.lines.size();
  _more.set_visible(found.total > _shown && !found.lines.empty());
  _linesList.set_visible(_shown > 0);
  std::string notice;
  const auto addNotice = [&notice](const std::string& text) { notice += (notice.empty() ? "" : "\n") + text; };
  if (found.total > _shown)
    addNotice(LocalizedFormat(LocalizedString("Window_Favorites_More"), {std::uint64_t{found.total - _shown}}));
  if (_shown == 0 && found.failures.empty()) addNotice(LocalizedString("Window_Favorites_NothingFound"));
  for (const protocol::FetchError& failure : found.failures) addNotice(textOfError(*errorOf(failure)));
  _notice.set_text(notice);
  _notice.set_visible(!notice.empty());
}

void FavoritesPage::toggle(TransitLineRef line) {
  FavoritesEditor& editor = _context.platform->favoritesEditor();
  const auto place = std::find_if(_favorites.begin(), _favorites.end(),
                                  [&](const TransitLineRef& favorite) { return favorite->muid() == line->muid(); });
  if (place == _favorites.end()) return finish(editor.add({line}));
  const auto position = static_cast<std::size_t>(place - _favorites.begin());
  const ErrorRef failure = editor.remove({line->muid()});
  finish(failure);
  if (failure) return;
  _context.navigator.tell(LocalizedFormat(LocalizedString("Window_Removed"), {nameOfLine(*line)}),
                          [this, line, position] {
                            FavoritesEditor& favorites = _context.platform->favoritesEditor();
                            const ErrorRef undoFailure = favorites.add({line});
                            finish(undoFailure ? undoFailure : favorites.move(line->muid(), position));
                          });
}

void FavoritesPage::move(TransitLineRef line, std::size_t position) {
  finish(_context.platform->favoritesEditor().move(line->muid(), position));
  if (Gtk::ListBoxRow* row = _favoritesList.get_row_at_index(static_cast<int>(position))) row->grab_focus();
}

void FavoritesPage::finish(const ErrorRef& failure) {
  readFavorites();
  showFavorites();
  for (int i = 0; auto* row = dynamic_cast<LineRow*>(_linesList.get_row_at_index(i)); ++i)
    row->setFavorite(isFavorite(*row->line()));
  if (failure) _context.navigator.tell(textOfError(*failure));
}

}  // namespace nimbo
