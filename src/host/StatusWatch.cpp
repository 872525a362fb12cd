#include "host/StatusWatch.h"

#include "host/StatusBarLine.h"

namespace nimbo {

using nlohmann::json;

StatusWatch::StatusWatch(const CommandContext& context, WidgetPresentation presentation, Show show)
    : _context(context), _presentation(std::move(presentation)), _show(std::move(show)) {
  start();
}

StatusWatch::~StatusWatch() {
  for (auto* timer : {&_restart, &_update, &_patience}) cancel(*timer);
  if (!_client) return;
  // The process does what it was asked before it finds its input closed.
  for (const char* step : {"viewWillDisappear", "viewDidDisappear"})
    _client->connection().call(step, json::object(), [](const json&, const auto&) {});
}

void StatusWatch::cancel(std::shared_ptr<Timer>& timer) {
  if (timer) std::exchange(timer, nullptr)->invalidate();
}

void StatusWatch::start() {
  _client.reset();
  _unanswered = 0;
  try {
    _client = std::make_unique<WidgetClient>(_context.runLoop, _context.widgetArguments);
  } catch (const WidgetClientFailure& failure) {
    return fail(failure.what());
  }
  JSONRPCConnection& connection = _client->connection();
  connection.setClosedHandler([this] { fail("The widget process ended."); });
  connection.setMalformedHandler(
      [this](const std::string& problem) { fail("The widget process speaks nonsense: " + problem + "."); });
  connection.setHandler("frame", [this](const json&, const JSONRPCResponder&) { look(); });
  _client->setNoticeHandler(_context.tell);
  ask("initialize", initializationOf(_presentation));
  for (const char* step : {"loadView", "viewWillAppear", "viewDidAppear"}) ask(step);
  update();
  look();
}

void StatusWatch::update() {
  ask("performUpdate", json::object(), [this](const json&) { look(); });
}

void StatusWatch::look() {
  ask("snapshot", json::object(), [this](const json& snapshot) { showSnapshot(snapshot); });
}

void StatusWatch::showSnapshot(const json& snapshot) {
  if (const auto line = statusBarLine(snapshot)) showLine(*line);
  const json& result = snapshot.at("result");
  if (result.is_null()) return;
  _restarts.reset();
  if (result == "success") {
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

void StatusWatch::ask(std::string_view method, const json& params, Completion completion) {
  if (_restart) return;
  if (++_unanswered == 1) waitForAnswer();
  _client->connection().call(
      method, params,
      [this, name = std::string(method), completion = std::move(completion)](const json& result, const auto& error) {
        if (_restart || (error && error->code == JSONRPCError::kConnectionClosed)) return;
        cancel(_patience);
        if (--_unanswered > 0) waitForAnswer();
        if (error) return fail("The widget process refuses \"" + name + "\": " + error->message + ".");
        if (!completion) return;
        try {
          completion(result);
        } catch (const json::exception& malformed) {
          fail("The widget process answers \"" + name + "\" with nonsense: " + malformed.what() + ".");
        }
      });
}

void StatusWatch::waitForAnswer() {
  _patience = _context.runLoop.scheduleTimer(WidgetClient::kPatience, false, [this](Timer&) {
    _patience = nullptr;
    fail("The widget process does not answer.");
  });
}

void StatusWatch::fail(const std::string& reason) {
  if (_restart) return;
  if (_client) _client->kill();
  cancel(_update);
  cancel(_patience);
  _restart = _context.runLoop.scheduleTimer(_restarts.next(), false, [this](Timer&) {
    _restart = nullptr;
    start();
  });
  showLine(statusBarErrorLine(reason + " It is started again."));
}

}  // namespace nimbo
