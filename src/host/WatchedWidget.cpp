#include "host/WatchedWidget.h"

namespace nimbo {

using nlohmann::json;

namespace {

/// More than a widget has to say.
constexpr std::size_t kLinesPerSecond = 1000;

}  // namespace

WatchedWidget::WatchedWidget(GLibRunLoop& runLoop, const std::vector<std::string>& arguments, TimeInterval patience,
                             FailureHandler failed, const PictureMemory* pictures)
    : _runLoop(runLoop), _patience(patience), _failed(std::move(failed)), _client(runLoop, arguments, pictures) {
  JSONRPCConnection& connection = _client.connection();
  connection.setLineObserver([this](std::string_view) { countLine(); });
  _client.setNonsenseHandler([this](const std::string& problem) { fail("it speaks nonsense: " + problem); });
  connection.setClosedHandler([this] { fail("it ended"); });
}

WatchedWidget::~WatchedWidget() {
  for (const auto& timer : _waiting) timer->invalidate();
  if (_second) _second->invalidate();
}

void WatchedWidget::fail(const std::string& reason) {
  if (std::exchange(*_hasFailed, true)) return;
  // When nothing of the process is on the stack any more.
  _runLoop.dispatchAsync([this, reason, alive = std::weak_ptr(_hasFailed)] {
    if (alive.expired()) return;
    _client.kill();
    const FailureHandler failed = std::move(_failed);
    failed(reason);
  });
}

void WatchedWidget::countLine() {
  if (!_second)
    _second = _runLoop.scheduleTimer(1, false, [this](Timer&) {
      _second = nullptr;
      _lines = 0;
    });
  if (++_lines == kLinesPerSecond) fail("it does not stop talking");
}

std::int64_t WatchedWidget::send(const char* method, const json& params, bool waitsForFeeds,
                                 JSONRPCConnection::Completion completion) {
  std::shared_ptr<Timer> timer;
  if (!waitsForFeeds) {
    timer = _runLoop.scheduleTimer(
        _patience, false, [this, name = std::string(method)](Timer&) { fail("it does not answer \"" + name + "\""); });
    _waiting.push_back(timer);
  }
  return _client.connection().call(method, params, [this, timer, completion](const json& result, const auto& error) {
    if (timer) timer->invalidate();
    std::erase_if(_waiting, [](const auto& waiting) { return !waiting->isValid(); });
    completion(result, error);
  });
}

}  // namespace nimbo
