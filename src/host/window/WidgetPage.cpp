#include "host/window/WidgetPage.h"

#include <gdkmm/toplevel.h>
#include <gio/gio.h>
#include <gtkmm/image.h>
#include <gtkmm/native.h>

#include <utility>

#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/rpc/Base64.h"
#include "host/telling/TellingSettings.h"
#include "host/window/Texts.h"
#include "host/window/WidgetTexts.h"
#include "platform/Localization.h"
#include "platform/Platform.h"
#include "platform/foundation/Log.h"

namespace nimbo {

namespace {

/// Setting: whether the user last had a row for each incident.
constexpr std::string_view kExpandedKey = "Nimbo.Window.expanded";

/// As many rows as a picture has room for at twice the scale; the page scrolls.
constexpr int kMostRows = 64;

/// Pixels of the sign that the widget is waited for.
constexpr int kWaitingSize = 32;

Gtk::Widget* makePlace(const char* icon, const std::string& name) {
  auto* row = Gtk::make_managed<Gtk::ListBoxRow>();
  auto* box = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::HORIZONTAL, 12);
  box->add_css_class("item");
  auto* image = Gtk::make_managed<Gtk::Image>();
  image->set_from_icon_name(icon);
  hideFromAccessibility(*image);
  auto* label = Gtk::make_managed<Gtk::Label>(name);
  label->set_hexpand();
  label->set_xalign(0);
  auto* arrow = Gtk::make_managed<Gtk::Image>();
  arrow->set_from_icon_name("go-next-symbolic");
  hideFromAccessibility(*arrow);
  for (Gtk::Widget* child :
       {static_cast<Gtk::Widget*>(image), static_cast<Gtk::Widget*>(label), static_cast<Gtk::Widget*>(arrow)})
    box->append(*child);
  row->set_child(*box);
  setAccessibleLabel(*row, name);
  return row;
}

/// Whether no server can be reached, whichever it was.
bool isOffline(const Error& error) {
  return error.domain() == kTransitLineServiceErrorDomain &&
         error.code() == static_cast<std::int64_t>(TransitLineServiceError::unreachable) &&
         !g_network_monitor_get_network_available(g_network_monitor_get_default());
}

/// Why a fetch failed, of which feed, and what is known of the others.
std::string textOfFailedFetch(const WidgetContent& content) {
  const Error& error = *content.failure;
  std::string text = isOffline(error) ? LocalizedString("TransitWidgetLoadingError_No_Internet") : textOfError(error);
  if (!error.feed().empty()) text = LocalizedFormat(LocalizedString("Window_Feed_Failed"), {error.feed(), text});
  if (!content.known.empty()) text += "\n\n" + LocalizedString("Window_Feed_Known");
  for (const std::string& incident : content.known) text += "\n" + incident;
  return text;
}

}  // namespace

WidgetPage::WidgetPage(const PageContext& context)
    : Page(LocalizedString("Window_Title")),
      _context(context),
      _process(context.command.runLoop, Platform::current().clock(), context.command.widgetArguments, *this),
      _wantsExpanded(Platform::current().sharedSettings().groupStore()->boolForKey(kExpandedKey)),
      _teller(context.command.runLoop, *context.platform.operator->(), {.locale = context.preferences.locale()}) {
  buildGone();
  buildCard();
  buildLines();
  buildPlaces();
  _process.setPresentation(presentation());
  _process.setExpanded(_wantsExpanded);
  _connections.push_back(
      _context.preferences.signalLookChanged().connect([this] { _process.setPresentation(presentation()); }));
  property_scale_factor().signal_changed().connect([this] { _process.setPresentation(presentation()); });
  watchVisibility();
}

WidgetPage::~WidgetPage() {
  for (sigc::connection& connection : _connections) connection.disconnect();
  if (_downloadTimer) _downloadTimer->invalidate();
}

void WidgetPage::buildGone() {
  _gone.add_css_class("notice");
  _goneText.set_xalign(0);
  auto* button = Gtk::make_managed<Gtk::Button>(LocalizedString("Window_Favorites_Title"));
  button->set_halign(Gtk::Align::START);
  button->signal_clicked().connect([this] { _context.navigator.open(ShowFavorites()); });
  _gone.append(_goneText);
  _gone.append(*button);
  _gone.hide();
}

void WidgetPage::buildCard() {
  auto* header = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::HORIZONTAL, 8);
  header->add_css_class("card-header");
  auto* name = Gtk::make_managed<Gtk::Label>(LocalizedString("Window_Widget_Title"));
  name->add_css_class("item-heading");
  name->set_hexpand();
  name->set_xalign(0);
  _expand.add_css_class("flat");
  _expand.set_valign(Gtk::Align::CENTER);
  _expand.signal_clicked().connect([this] { toggleExpanded(); });
  for (Gtk::Widget* child :
       {static_cast<Gtk::Widget*>(name), static_cast<Gtk::Widget*>(&_updating), static_cast<Gtk::Widget*>(&_expand)})
    header->append(*child);

  _view.signalSelected().connect([this](std::size_t row) { _process.selectRow(row); });
  _view.signalWidthChanged().connect([this](double width) {
    _width = width;
    _process.setPresentation(presentation());
  });
  _view.signalPressed().connect([this](std::size_t row, bool pressed) { _process.highlightRow(row, pressed); });

  // As high as a row in all; itself of a size that icon themes have as pixels, since their SVG files bring a library.
  _waiting.set_size_request(kWaitingSize, kWaitingSize);
  _waiting.set_halign(Gtk::Align::CENTER);
  const auto margin = (static_cast<int>(WidgetPresentation::kDefaultRowHeight) - kWaitingSize) / 2;
  _waiting.set_margin_top(margin);
  _waiting.set_margin_bottom(margin);
  _waiting.start();

  _failure.add_css_class("notice");
  _failureReason.set_xalign(0);
  auto* button = Gtk::make_managed<Gtk::Button>(LocalizedString("Window_TryAgain"));
  button->set_halign(Gtk::Align::START);
  button->signal_clicked().connect([this] { tryAgain(); });
  _failureDetail.set_xalign(0);
  _failureDetail.add_css_class("item-caption");
  _failureDetail.set_selectable();
  _failure.append(_failureReason);
  _failure.append(_failureDetail);
  _failure.append(*button);
  _failure.hide();

  _card.add_css_class("card");
  _card.set_overflow(Gtk::Overflow::HIDDEN);
  _downloadText.set_xalign(0);
  _downloadText.add_css_class("notice");
  _downloadText.hide();
  for (Gtk::Widget* child : {static_cast<Gtk::Widget*>(header), static_cast<Gtk::Widget*>(&_downloadText),
                             static_cast<Gtk::Widget*>(&_failure), static_cast<Gtk::Widget*>(&_waiting),
                             static_cast<Gtk::Widget*>(&_view), static_cast<Gtk::Widget*>(&_gone)})
    _card.append(*child);
  content().append(_card);
  showExpandButton();
}

void WidgetPage::buildLines() {
  _updated.set_xalign(0);
  _updated.add_css_class("item-caption");
  _updated.hide();
  content().append(_updated);
  _planned.set_child(_plannedText);
  _planned.add_css_class("flat");
  _planned.set_halign(Gtk::Align::START);
  _planned.signal_clicked().connect([this] { _context.navigator.open(ShowPlanned()); });
  _planned.hide();
  content().append(_planned);
  content().append(_sampleNotice);
  buildNotifyQuestion();
  content().append(_notifyQuestion);
  content().append(_lines);
}

void WidgetPage::buildNotifyQuestion() {
  _notifyQuestion.add_css_class("card");
  _notifyQuestion.add_css_class("notice");
  auto* text = Gtk::make_managed<Gtk::Label>(LocalizedString("Window_Notify_Question"));
  text->set_xalign(0);
  auto* answers = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::HORIZONTAL, 8);
  for (const auto& [key, value] : {std::pair("Window_Notify_Yes", "on"), {"Window_Notify_No", "off"}}) {
    auto* button = Gtk::make_managed<Gtk::Button>(LocalizedString(key));
    button->signal_clicked().connect([this, answer = std::string(value)] {
      if (answer == "on") return static_cast<void>(activate_action("win.notify"));
      if (const ErrorRef failure = setNotify(*_context.platform.operator->(), answer))
        return _context.navigator.tell(textOfError(*failure));
      showNotifyQuestion();
    });
    answers->append(*button);
  }
  _notifyQuestion.append(*text);
  _notifyQuestion.append(*answers);
  _notifyQuestion.hide();
}

void WidgetPage::showNotifyQuestion() {
  const auto feeds = _context.feeds().feeds();
  const bool hasOwn = feeds && !feeds->empty() && !_context.lines.lines.empty();
  _notifyQuestion.set_visible(hasOwn && !Platform::current().sharedSettings().groupStore()->valueForKey(kNotifyKey));
}

void WidgetPage::markSeen(const std::vector<std::string>& ids, bool isAsked) {
  _seenQuestion = _process.ask(protocol::kMarkSeen, {ids}, [this, isAsked](const Outcome<protocol::Kept>& kept) {
    if (!isAsked || (kept && !kept->failure)) return;
    _context.navigator.tell(kept ? *kept->failure : textOfError(*kept.error()));
  });
}

void WidgetPage::showLines(const protocol::Lines& lines, std::optional<Date> updated) {
  _context.lines = lines;
  _lines.show(lines);
  showNotifyQuestion();
  const std::uint64_t unseen = newIncidents(lines).size();
  setTitle(unseen == 0
               ? LocalizedString("Window_Title")
               : LocalizedFormat(LocalizedString("Window_Title_New"), {unseen, LocalizedString("Window_Title")}));
  _teller.take(lines, [](const ErrorRef& error) {
    if (error) writeLog({kDefaultLogSubsystem, "WidgetPage"}, LogLevel::error, "Not notified: %@", {error->reason()});
  });
  const std::size_t planned = countOfPlanned(lines);
  _plannedText.set_text(LocalizedFormat(LocalizedString("Window_Planned_Count"), {std::uint64_t{planned}}));
  setAccessibleLabel(_planned, _plannedText.get_text());
  _planned.set_visible(planned > 0);
  if (updated)
    _updated.set_text(
        LocalizedFormat(LocalizedString("Window_Updated"), {DateText(_context.preferences.locale()).textOf(*updated)}));
  _updated.set_visible(updated.has_value());
}

void WidgetPage::withLines(std::function<void(const protocol::Lines&)> completion) {
  if (_content && _content->isFetched) return completion(_context.lines);
  _linesQuestion = _process.ask(protocol::kPerformUpdate, {}, [this, completion = std::move(completion)](const auto&) {
    _linesQuestion = _process.ask(protocol::kLines, {}, [this, completion](const Outcome<protocol::Lines>& lines) {
      if (!lines) return _context.navigator.tell(textOfError(*lines.error()));
      _context.lines = *lines;
      completion(*lines);
    });
  });
}

void WidgetPage::buildPlaces() {
  _sampleNotice.add_css_class("card");
  _sampleNotice.add_css_class("notice");
  auto* text = Gtk::make_managed<Gtk::Label>(LocalizedString("Window_Sample_Text"));
  text->set_xalign(0);
  auto* button = Gtk::make_managed<Gtk::Button>(LocalizedString("Window_Sample_Button"));
  button->add_css_class("suggested-action");
  button->set_halign(Gtk::Align::START);
  button->signal_clicked().connect([this] { _context.navigator.open(ShowFeeds()); });
  _sampleNotice.append(*text);
  _sampleNotice.append(*button);

  _places.add_css_class("card");
  _places.set_selection_mode(Gtk::SelectionMode::NONE);
  _places.append(*makePlace("starred-symbolic", LocalizedString("Window_Favorites_Title")));
  _places.append(*makePlace("network-transmit-receive-symbolic", LocalizedString("Window_Feeds_Title")));
  _places.signal_row_activated().connect([this](Gtk::ListBoxRow* row) {
    if (row->get_index() == 0)
      _context.navigator.open(ShowFavorites());
    else
      _context.navigator.open(ShowFeeds());
  });
  content().append(_places);
}

void WidgetPage::watchVisibility() {
  signal_map().connect([this] {
    const auto feeds = _context.feeds().feeds();
    _sampleNotice.set_visible(feeds && feeds->empty());
    updateVisibility();
  });
  signal_unmap().connect([this] { updateVisibility(); });
  signal_realize().connect([this] {
    const auto toplevel = std::dynamic_pointer_cast<Gdk::Toplevel>(get_native()->get_surface());
    if (toplevel)
      _connections.push_back(toplevel->property_state().signal_changed().connect([this] { updateVisibility(); }));
  });
}

void WidgetPage::updateVisibility() {
  const Gtk::Native* native = get_native();
  const auto toplevel = native ? std::dynamic_pointer_cast<const Gdk::Toplevel>(native->get_surface()) : nullptr;
  const bool minimized =
      toplevel && (toplevel->get_state() & Gdk::Toplevel::State::MINIMIZED) != Gdk::Toplevel::State();
  _process.setVisible(get_mapped() && !minimized);
}

WidgetPresentation WidgetPage::presentation() const {
  const DesktopPreferences& preferences = _context.preferences;
  WidgetPresentation presentation;
  presentation.width = _width;
  presentation.compactHeight = WidgetPresentation::rowHeightForTextSize(preferences.textSize());
  presentation.expandedHeight = kMostRows * presentation.compactHeight;
  presentation.scale = get_scale_factor();
  presentation.textSize = preferences.textSize();
  presentation.appearance = preferences.appearance();
  if (!preferences.locale().empty()) presentation.locale = preferences.locale();
  return presentation;
}

void WidgetPage::toggleExpanded() {
  _wantsExpanded = !_wantsExpanded;
  const ErrorRef failure =
      Platform::current().sharedSettings().groupStore()->setValue_forKey(_wantsExpanded, kExpandedKey);
  if (failure) _context.navigator.tell(textOfError(*failure));
  _process.setExpanded(_wantsExpanded);
  showExpandButton();
}

void WidgetPage::showExpandButton() {
  _expand.set_label(LocalizedString(_wantsExpanded ? "Window_ShowLess" : "Window_ShowMore"));
  _expand.set_visible(_content && _content->canExpand);
}

bool WidgetPage::widgetDrew(const protocol::Rendered& picture) {
  auto taken = _pictures->take(picture);
  if (!taken) return false;
  _picture = std::make_shared<const WidgetPicture>(*std::move(taken));
  return true;
}

void WidgetPage::widgetDidChange(const protocol::Snapshot& snapshot, const protocol::Lines& lines) {
  auto content = std::make_shared<WidgetContent>(WidgetContent::ofSnapshot(snapshot));
  content->lines = lines;
  content->picture = _picture;
  _content = content;
  _context.asOf = content->asOf;
  _view.setContent(content);
  _waiting.hide();
  if (content->failure)
    showFailure(textOfFailedFetch(*content), detailOfError(*content->failure));
  else
    _failure.hide();
  showLines(content->lines, content->failure ? std::nullopt : content->updated);
  _goneText.set_text(LocalizedFormat(LocalizedString("Window_Widget_Gone"), {CommaDelimitedList(content->goneLines)}));
  _gone.set_visible(!content->goneLines.empty());
  showExpandButton();
}

void WidgetPage::showFailure(const std::string& text, const std::string& detail) {
  if (_failureReason.get_text().raw() != text) _failureReason.set_text(text);
  if (_failureDetail.get_text().raw() != detail) _failureDetail.set_text(detail);
  _failureDetail.set_visible(!detail.empty());
  _failure.show();
}

void WidgetPage::tryAgain() {
  if (!std::exchange(_processFailed, false)) return _process.update();
  _failure.hide();
  _waiting.set_visible(!_content);
  _process.restart();
}

void WidgetPage::widgetEnded(const std::string& reason) {
  writeLog({kDefaultLogSubsystem, "WidgetPage"}, LogLevel::error, "The widget process is ended: %@", {reason});
}

void WidgetPage::widgetDidFail(WidgetHostProcess::Failure failure, const std::string& detail) {
  writeLog({kDefaultLogSubsystem, "WidgetPage"}, LogLevel::error, "No widget process: %@", {detail});
  _processFailed = true;
  const std::string reason = failure == WidgetHostProcess::Failure::cannotStart
                                 ? LocalizedString("Window_Widget_CannotStart")
                                 : LocalizedFormat(LocalizedString("Window_Widget_KeepsFailing"),
                                                   {std::uint64_t{WidgetHostProcess::kCrashLimit}});
  showFailure(LocalizedFormat(LocalizedString("Window_Widget_Failed"), {reason}), detail);
  _waiting.hide();
}

void WidgetPage::widgetTells(const std::string& message) { _context.navigator.tell(message); }

void WidgetPage::widgetIsUpdating(bool updating) {
  _updating.set_spinning(updating);
  if (_downloadTimer) std::exchange(_downloadTimer, nullptr)->invalidate();
  _downloadQuestion = nullptr;
  _downloadText.hide();
  if (updating) _downloadTimer = _context.command.runLoop.scheduleTimer(1, true, [this](Timer&) { showDownload(); });
}

void WidgetPage::showDownload() {
  _downloadQuestion = _process.ask(protocol::kDownloads, {}, [this](const Outcome<protocol::Downloads>& downloads) {
    std::string text;
    if (downloads && !downloads->downloads.empty()) {
      const protocol::Download& first = downloads->downloads.front();
      text = textOfReceived(first.received, first.length);
      if (!text.empty()) text = CommaDelimitedList({first.feed, text});
    }
    _downloadText.set_text(text);
    _downloadText.set_visible(!text.empty());
  });
}

bool WidgetPage::widgetOpens(const WidgetClient::Opening& opening) {
  const auto request = [&]() -> Outcome<OpenRequest> {
    if (const auto* url = std::get_if<protocol::OpenURLParams>(&opening)) return openRequestOfURL(url->url);
    const auto& activity = std::get<protocol::OpenUserActivityParams>(opening);
    std::map<std::string, Bytes, std::less<>> userInfo;
    for (const auto& [key, text] : activity.userInfo)
      if (auto bytes = bytesFromBase64(text)) userInfo.emplace(key, std::move(*bytes));
    return openRequestOfActivity(activity.activityType, userInfo);
  }();
  if (!request) {
    _context.navigator.tell(request.error()->reason());
    return false;
  }
  // As of when it is comes before what is opened is decoded.
  _process.askForContent();
  // The widget hears that it opened before it hears that it disappears.
  _context.command.runLoop.dispatchAsync(
      [&navigator = _context.navigator, request = *request, alive = std::weak_ptr<bool>(_alive)] {
        if (!alive.expired()) navigator.open(request);
      });
  return true;
}

}  // namespace nimbo
