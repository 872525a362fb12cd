#include "host/StatusWatch.h"

#include "host/StatusBar.h"

namespace nimbo {

using nlohmann::json;

StatusWatch::StatusWatch(const CommandContext& context, WidgetPresentation presentation, Show show)
    : _context(context), _presentation(std::move(presentation)), _show(std::move(show)) {
  start();
}

StatusWatch::~StatusWatch() {
  for (auto* timer : {&_restart, &_update}) cancel(*timer);
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
  client.setNoticeHandler(_context.tell);
  _widget->ask(protocol::kInitialize, initializationOf(_presentation));
  for (const auto& step : {protocol::kLoadView, protocol::kViewWillAppear, protocol::kViewDidAppear})
    _widget->ask(step);
  update();
  look();
}

void StatusWatch::update() {
  _widget->ask(protocol::kPerformUpdate, {}, [this](const auto&) { look(); });
}

void StatusWatch::look() {
  _widget->ask(protocol::kSnapshot, {.rows = false}, [this](const auto& snapshot) { showSnapshot(snapshot); });
}

void StatusWatch::showSnapshot(const protocol::Snapshot& snapshot) {
  if (const auto line = statusBarLine(snapshot)) showLine(*line);
  if (!snapshot.result) return;
  _restarts.reset();
  if (snapshot.result == protocol::FetchResult::success) {
    _updates.reset();
    cancel(_update);
  } else if (!_update) {
    // After a failed fetch the widget waits for its host.
    _update = _context.runLoop.scheduleTimer(_updates.next(), false, [this](Timer&) {
      _update = nullptr;
      update();
    });
  }
}

void StatusWatch::showLine(const std::string& line) {
  if (line == _lastLine) return;
  _lastLine = line;
  _show(line);
}

void StatusWatch::restartAfter(const std::string& failure) {
  _widget.reset();
  cancel(_update);
  _restart = _context.runLoop.scheduleTimer(_restarts.next(), false, [this](Timer&) {
    _restart = nullptr;
    start();
  });
  showLine(statusBarErrorLine(failure + " It is started again."));
}

}  // namespace nimbo
