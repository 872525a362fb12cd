#include "host/window/WidgetHostProcess.h"

#include <algorithm>
#include <system_error>

#include "platform/foundation/Log.h"

namespace nimbo {

using nlohmann::json;

namespace {

constexpr LogFacility kLog{kDefaultLogSubsystem, "WidgetHostProcess"};

/// More than a widget has to say.
constexpr std::size_t kLinesPerSecond = 1000;

SharedPicture::Layout layoutOf(const json& answer) {
  return {answer.at("width"), answer.at("height"), answer.at("stride"), answer.at("scale")};
}

}  // namespace

WidgetHostProcess::WidgetHostProcess(GLibRunLoop& runLoop, const Clock& clock, std::vector<std::string> arguments,
                                     Delegate& delegate)
    : _runLoop(runLoop), _clock(clock), _arguments(std::move(arguments)), _delegate(delegate) {}

WidgetHostProcess::~WidgetHostProcess() {
  if (_hiddenTimer) _hiddenTimer->invalidate();
  stop();
}

void WidgetHostProcess::setVisible(bool visible) {
  if (visible == _visible) return;
  _visible = visible;
  if (_hiddenTimer) std::exchange(_hiddenTimer, nullptr)->invalidate();
  if (visible) {
    if (_client)
      appear();
    else if (!_gaveUp)
      start();
  } else if (_client) {
    disappear();
    _hiddenTimer = _runLoop.scheduleTimer(kHiddenPatience, false, [this](Timer&) {
      _hiddenTimer = nullptr;
      stop();
      setUpdating(false);
    });
  }
}

void WidgetHostProcess::setPresentation(const WidgetPresentation& presentation) {
  _presentation = presentation;
  tellPresentation();
}

void WidgetHostProcess::tellPresentation() {
  if (!_client || _told == _presentation) return;
  if (_told.locale != _presentation.locale) {
    stop();
    setUpdating(false);
    if (_visible) start();
    return;
  }
  WidgetPresentation next = _presentation;
  if (_contentHeight == 0) {
    // The height that the widget has is not known yet, and a size that is told replaces it.
    next.width = _told.width;
    next.compactHeight = _told.compactHeight;
    next.expandedHeight = _told.expandedHeight;
  }
  const WidgetPresentation old = std::exchange(_told, next);
  if (displayModesOf(old) != displayModesOf(next))
    ask("transitionToSize", {{"size", {next.width, _contentHeight}}, {"displayModes", displayModesOf(next)}});
  if (old.scale != next.scale) ask("setScale", {{"scale", next.scale}});
  if (old.appearance != next.appearance) ask("setAppearance", {{"appearance", next.appearance}});
  if (old.textSize != next.textSize) ask("setTextSize", {{"category", next.textSize}});
}

void WidgetHostProcess::setExpanded(bool expanded) {
  _wantsExpanded = expanded;
  if (_client) setExpandedMode(expanded);
}

void WidgetHostProcess::setExpandedMode(bool expanded) {
  if (expanded == _isExpanded) return;
  _isExpanded = expanded;
  ask("setActiveDisplayMode", {{"mode", expanded ? "expanded" : "compact"}});
  askForContent();
}

void WidgetHostProcess::start() {
  try {
    _client = std::make_unique<WidgetClient>(_runLoop, _arguments);
  } catch (const WidgetClientFailure& failure) {
    return giveUp(failure.what());
  }
  ++_generation;
  _told = _presentation;
  _contentHeight = 0;
  _isExpanded = _wantsExpanded;
  _awaitsContent = _contentIsStale = false;
  _heardSince = _clock.now();
  _heardLines = 0;
  setUpConnection();
  json initialization = initializationOf(_told);
  if (_isExpanded) initialization["activeDisplayMode"] = "expanded";
  ask("initialize", initialization);
  ask("loadView");
  appear();
}

void WidgetHostProcess::setUpConnection() {
  JSONRPCConnection& connection = _client->connection();
  connection.setLineObserver([this](std::string_view) { countLine(); });
  connection.setMalformedHandler([this](const std::string& problem) { failSoon("it speaks nonsense: " + problem); });
  connection.setClosedHandler([this] { failSoon("it ended"); });
  connection.setHandler("frame", [this](const json&, const JSONRPCResponder&) { askForContent(); });
  _client->setNoticeHandler([this](const std::string& message) { _delegate.widgetTells(message); });
  _client->setOpenHandler([this](std::string_view method, const json& params) {
    try {
      return _delegate.widgetOpens(method, params);
    } catch (const json::exception& malformed) {
      failSoon(std::string("it speaks nonsense: ") + malformed.what());
      return false;
    }
  });
}

void WidgetHostProcess::countLine() {
  const Date now = _clock.now();
  if (intervalBetween(_heardSince, now) >= 1) {
    _heardSince = now;
    _heardLines = 0;
  }
  if (++_heardLines == kLinesPerSecond) failSoon("it does not stop talking");
}

void WidgetHostProcess::appear() {
  _appeared = true;
  ask("viewWillAppear");
  ask("viewDidAppear");
  askForContent();
}

void WidgetHostProcess::disappear() {
  _appeared = false;
  ask("viewWillDisappear");
  ask("viewDidDisappear");
}

void WidgetHostProcess::stop() {
  if (!_client) return;
  if (_appeared) disappear();
  for (const auto& timer : std::exchange(_patience, {})) timer->invalidate();
  // What was asked is still done: the process reads it before the end of its input.
  _client.reset();
}

void WidgetHostProcess::failSoon(const std::string& reason) {
  _runLoop.dispatchAsync([this, reason, generation = _generation] {
    if (_client && generation == _generation) fail(reason);
  });
}

void WidgetHostProcess::fail(const std::string& reason) {
  writeLog(kLog, LogLevel::error, "The widget process is ended: %@", {reason});
  _client->kill();
  _appeared = false;
  stop();
  setUpdating(false);
  const Date now = _clock.now();
  std::erase_if(_crashes, [&](Date crash) { return intervalBetween(crash, now) > kCrashWindow; });
  _crashes.push_back(now);
  if (_crashes.size() >= kCrashLimit)
    return giveUp("its process had to be started " + std::to_string(kCrashLimit) +
                  " times within a minute, the last time since " + reason +
                  ". Start the window in a terminal with NIMBO_LOG=debug to see why.");
  if (_visible) start();
}

void WidgetHostProcess::giveUp(const std::string& reason) {
  writeLog(kLog, LogLevel::error, "No widget process: %@", {reason});
  _gaveUp = true;
  _delegate.widgetDidFail(reason);
}

void WidgetHostProcess::restart() {
  _gaveUp = false;
  _crashes.clear();
  if (_visible && !_client) start();
}

void WidgetHostProcess::ask(std::string_view method, const json& params, Completion completion) {
  call(method, params, [this, name = std::string(method), completion](const json& result, const auto& error) {
    if (error && error->code == JSONRPCError::kConnectionClosed) return;
    if (error) return failSoon(name + ": " + error->message);
    if (!completion) return;
    try {
      completion(result);
    } catch (const json::exception& malformed) {
      failSoon("it answers \"" + name + "\" with nonsense: " + malformed.what());
    }
  });
}

void WidgetHostProcess::askOfRow(std::string_view method, std::size_t row, json params) {
  if (!_client) return;
  params.update({{"section", 0}, {"row", row}});
  call(method, params, [](const json&, const auto&) {});
}

void WidgetHostProcess::call(std::string_view method, const json& params, JSONRPCConnection::Completion completion) {
  // A fetch takes as long as its feeds; all else is answered at once.
  std::shared_ptr<Timer> patience;
  if (method != "performUpdate") {
    patience = _runLoop.scheduleTimer(kAnswerPatience, false, [this, name = std::string(method)](Timer&) {
      failSoon("it does not answer \"" + name + "\"");
    });
    _patience.push_back(patience);
  }
  _client->connection().call(method, params, [this, patience, completion](const json& result, const auto& error) {
    if (patience) patience->invalidate();
    std::erase_if(_patience, [](const auto& timer) { return !timer->isValid(); });
    completion(result, error);
  });
}

void WidgetHostProcess::askForContent() {
  if (!_appeared) return;
  if (_awaitsContent) {
    _contentIsStale = true;
    return;
  }
  std::shared_ptr<SharedPicture> picture;
  try {
    picture = std::make_shared<SharedPicture>();
  } catch (const std::system_error& failure) {
    return failSoon(failure.what());
  }
  _awaitsContent = true;
  _contentIsStale = false;
  ask("render", {{"surface", picture->path()}}, [this, picture](const json& answer) {
    if (!picture->map(layoutOf(answer))) failSoon("it has not drawn what it says");
  });
  ask("snapshot", json::object(), [this, picture](const json& snapshot) {
    _awaitsContent = false;
    if (_contentIsStale) askForContent();
    if (!picture->pixels().empty()) show(picture, snapshot);
  });
}

void WidgetHostProcess::show(const std::shared_ptr<SharedPicture>& picture, const json& snapshot) {
  auto content = std::make_shared<WidgetContent>(WidgetContent::ofSnapshot(snapshot));
  content->picture = picture;
  _contentHeight = picture->layout().height / picture->layout().scale;
  tellPresentation();
  // The expanded mode ends with the rows that need it, and comes back with them.
  setExpandedMode(_wantsExpanded && content->canExpand);
  _delegate.widgetDidChange(content);
}

void WidgetHostProcess::update() {
  if (!_client || _isUpdating) return;
  setUpdating(true);
  ask("performUpdate", json::object(), [this](const json&) { setUpdating(false); });
}

void WidgetHostProcess::setUpdating(bool updating) {
  if (std::exchange(_isUpdating, updating) != updating) _delegate.widgetIsUpdating(updating);
}

void WidgetHostProcess::highlightRow(std::size_t row, bool highlighted) {
  askOfRow("highlightRow", row, {{"highlighted", highlighted}});
}

void WidgetHostProcess::selectRow(std::size_t row) { askOfRow("selectRow", row); }

}  // namespace nimbo
