#include "host/StatusWatch.h"

#include "host/StatusBar.h"

namespace nimbo {

using nlohmann::json;

StatusWatch::StatusWatch(const CommandContext& context, WidgetPresentation presentation, Show show)
    : _context(context),
      _presentation(std::move(presentation)),
      _show(std::move(show)),
      _refresh(
          context.runLoop, _random, [this] { return _conditions.areScarce(); },
          [this](TimeInterval maxAge) { update(maxAge); }) {
  start();
}

StatusWatch::~StatusWatch() {
  if (_restart) _restart->invalidate();
  if (!_widget) return;
  // The process does what it was asked before it finds its input closed.
  _widget->ask(protocol::kViewWillDisappear);
  _widget->ask(protocol::kViewDidDisappear);
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

void StatusWatch::update(TimeInterval maxAge) {
  _widget->ask(protocol::kPerformUpdate, {maxAge}, [this](const protocol::UpdateResult& result) {
    _refresh.answered(result);
    look();
  });
}

void StatusWatch::look() {
  // More favorites than an answer has room for are no fault of the process.
  if (_linesObserver)
    _widget->call(protocol::kLines, {}, [this](const std::optional<protocol::Lines>& lines, const auto&) {
      if (lines) _linesObserver(*lines);
    });
  _widget->ask(protocol::kSnapshot, {.rows = false}, [this](const auto& snapshot) { showSnapshot(snapshot); });
}

void StatusWatch::showSnapshot(const protocol::Snapshot& snapshot) {
  if (const auto line = statusBarLine(snapshot)) showLine(*line);
  if (snapshot.result) _restarts.reset();
}

void StatusWatch::showLine(const std::string& line) {
  if (line == _lastLine) return;
  _lastLine = line;
  _show(line);
}

void StatusWatch::restartAfter(const std::string& failure) {
  _refresh.setOnScreen(false);
  _widget.reset();
  _restart = _context.runLoop.scheduleTimer(_restarts.next(), false, [this](Timer&) {
    _restart = nullptr;
    start();
  });
  showLine(statusBarErrorLine(failure + " It is started again."));
}

}  // namespace nimbo
