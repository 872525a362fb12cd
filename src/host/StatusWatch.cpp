#include "host/StatusWatch.h"

#include "desktop/system/SmallMemory.h"

namespace nimbo {

using nlohmann::json;

StatusWatch::StatusWatch(const CommandContext& context, const Clock& clock, WidgetPresentation presentation, Show show)
    : _context(context),
      _clock(clock),
      _presentation(std::move(presentation)),
      _show(std::move(show)),
      _refresh(
          context.runLoop, _random, [this] { return _conditions.areScarce(); },
          [this](TimeInterval maxAge) { update(maxAge); }) {
  start();
}

StatusWatch::~StatusWatch() {
  for (auto* timer : {&_restart, &_stale}) cancel(*timer);
  if (!_widget) return;
  // The process does what it was asked before it finds its input closed.
  _widget->ask(protocol::kViewWillDisappear);
  _widget->ask(protocol::kViewDidDisappear);
}

void StatusWatch::cancel(std::shared_ptr<Timer>& timer) {
  if (timer) std::exchange(timer, nullptr)->invalidate();
}

void StatusWatch::start() {
  try {
    _widget = std::make_unique<WatchedWidget>(
        _context.runLoop, _context.widgetArguments, WidgetClient::kPatience,
        [this](const std::string& reason) { restartAfter("The widget process failed: " + reason + "."); });
  } catch (const WidgetClientFailure& failure) {
    return restartAfter(failure.what());
  }
  WidgetClient& client = _widget->client();
  for (const char* heard : {protocol::kFrame.name, protocol::kUpdated.name})
    client.connection().setHandler(heard, [this](const json&, const JSONRPCResponder&) { look(); });
  client.connection().setHandler(protocol::kChanged.name,
                                 [this](const json&, const JSONRPCResponder&) { _refresh.askNow(); });
  client.setNoticeHandler(_context.tell);
  _widget->ask(protocol::kInitialize, initializationOf(_presentation));
  for (const auto& step : {protocol::kLoadView, protocol::kViewWillAppear, protocol::kViewDidAppear})
    _widget->ask(step);
  _refresh.setOnScreen(true);
  look();
}

void StatusWatch::markSeen() {
  protocol::MarkSeenParams marked;
  for (const protocol::LineReport& line : _lines.lines)
    for (const protocol::LineIncident& incident : line.incidents) marked.ids.push_back(incident.id);
  if (!_widget || marked.ids.empty()) return;
  _widget->ask(protocol::kMarkSeen, marked, [this](const protocol::Kept& kept) {
    if (kept.failure) _context.tell("what was seen cannot be kept: " + *kept.failure);
  });
}

void StatusWatch::update(TimeInterval maxAge) {
  _widget->ask(protocol::kPerformUpdate, {maxAge}, [this](const protocol::UpdateResult& result) {
    _refresh.answered(result);
    if (result.updateResult == WidgetUpdateResult::Failed) look();  // others are told by `updated`
  });
}

void StatusWatch::look() {
  const bool hasTexts = _linesObserver && _wantsLines();
  // More favorites than an answer has room for are no fault of the process.
  _widget->call(protocol::kLines, {.texts = hasTexts},
                [this, hasTexts](const std::optional<protocol::Lines>& lines, const auto&) {
                  _lines = lines.value_or(protocol::Lines());
                  if (lines && hasTexts && _linesObserver) _linesObserver(*lines);
                });
  _widget->ask(protocol::kSnapshot, {.rows = false}, [this](const auto& snapshot) { showSnapshot(snapshot); });
}

void StatusWatch::showSnapshot(const protocol::Snapshot& snapshot) {
  const Date now = _clock.now();
  const auto content = barContentOf(snapshot, _lines, now);
  if (content) _show(*content);
  giveBackHeapSoon(_context.runLoop, _givesBack);
  cancel(_stale);
  if (content && !content->isStale && snapshot.result == protocol::FetchResult::success && snapshot.updated)
    _stale = _context.runLoop.scheduleTimer(kBarStaleAfter - intervalBetween(*snapshot.updated, now) + 1, false,
                                            [this](Timer&) {
                                              _stale = nullptr;
                                              look();
                                            });
  if (snapshot.result) _restarts.reset();
}

void StatusWatch::restartAfter(const std::string& failure) {
  _refresh.setOnScreen(false);
  _widget.reset();
  cancel(_stale);
  _restart = _context.runLoop.scheduleTimer(_restarts.next(), false, [this](Timer&) {
    _restart = nullptr;
    start();
  });
  _show(barContentOfFailure(failure + " It is started again."));
}

}  // namespace nimbo
