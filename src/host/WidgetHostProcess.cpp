#include "host/WidgetHostProcess.h"

#include <algorithm>
#include <stdexcept>

namespace nimbo {

namespace {

/// Domain of the errors of a process that is asked and does not answer as it should.
constexpr std::string_view kProcessErrorDomain = "org.nimbo.WidgetHostProcess";

}  // namespace

WidgetHostProcess::WidgetHostProcess(GLibRunLoop& runLoop, const Clock& clock, std::vector<std::string> arguments,
                                     Delegate& delegate)
    : _runLoop(runLoop),
      _clock(clock),
      _arguments(std::move(arguments)),
      _delegate(delegate),
      _refresh(
          runLoop, _random, [this] { return _conditions.areScarce(); },
          [this](TimeInterval maxAge) { fetch(maxAge); }) {}

WidgetHostProcess::~WidgetHostProcess() {
  if (_hiddenTimer) _hiddenTimer->invalidate();
  _questions.clear();  // those who asked go, too
  stop();
}

void WidgetHostProcess::prepare() {
  if (!_widget && !_gaveUp) start();
}

void WidgetHostProcess::setVisible(bool visible) {
  if (visible == _visible) return;
  _visible = visible;
  if (_hiddenTimer) std::exchange(_hiddenTimer, nullptr)->invalidate();
  if (visible) {
    if (_widget)
      appear();
    else if (!_gaveUp)
      start();
  } else if (_widget) {
    disappear();
    stopLater();
  }
}

void WidgetHostProcess::stopLater() {
  if (_hiddenTimer) _hiddenTimer->invalidate();
  _hiddenTimer = _runLoop.scheduleTimer(kHiddenPatience, false, [this](Timer&) {
    _hiddenTimer = nullptr;
    const bool isAsked = std::any_of(_questions.begin(), _questions.end(), [](const auto& waiting) {
      const auto asked = waiting.lock();
      return asked && asked->_fail;
    });
    if (isAsked) return stopLater();
    stop();
    setUpdating(false);
  });
}

void WidgetHostProcess::setPresentation(const WidgetPresentation& presentation) {
  _presentation = presentation;
  tellPresentation();
}

void WidgetHostProcess::tellPresentation() {
  if (!_widget || _told == _presentation) return;
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
    _widget->ask(protocol::kTransitionToSize,
                 {.size = {next.width, _contentHeight}, .displayModes = displayModesOf(next)});
  if (old.scale != next.scale) _widget->ask(protocol::kSetScale, {next.scale});
  if (old.appearance != next.appearance) _widget->ask(protocol::kSetAppearance, {next.appearance});
  if (old.textSize != next.textSize) _widget->ask(protocol::kSetTextSize, {next.textSize});
}

void WidgetHostProcess::setExpanded(bool expanded) {
  _wantsExpanded = expanded;
  if (_widget) setExpandedMode(expanded);
}

void WidgetHostProcess::setExpandedMode(bool expanded) {
  if (expanded == _isExpanded) return;
  _isExpanded = expanded;
  _widget->ask(protocol::kSetActiveDisplayMode,
               {.mode = expanded ? WidgetDisplayMode::Expanded : WidgetDisplayMode::Compact});
  askForContent();
}

void WidgetHostProcess::start() {
  try {
    const PictureMemory& pictures = _delegate.newPictureMemory();
    _widget = std::make_unique<WatchedWidget>(
        _runLoop, _arguments, kAnswerPatience, [this](const std::string& reason) { replace(reason); }, &pictures);
  } catch (const std::runtime_error& failure) {
    return giveUp(Failure::cannotStart, failure.what());
  }
  _processMark = std::make_shared<bool>(true);
  _told = _presentation;
  _contentHeight = 0;
  _isExpanded = _wantsExpanded;
  _awaitsContent = _contentIsStale = false;
  setUpConnection();
  protocol::InitializeParams initialization = initializationOf(_told);
  if (_isExpanded) initialization.activeDisplayMode = WidgetDisplayMode::Expanded;
  _widget->ask(protocol::kInitialize, initialization);
  _widget->ask(protocol::kLoadView);
  if (_visible)
    appear();
  else
    stopLater();
}

void WidgetHostProcess::setUpConnection() {
  WidgetClient& client = _widget->client();
  client.connection().setHandler(protocol::kFrame.name,
                                 [this](const auto&, const JSONRPCResponder&) { askForContent(); });
  client.connection().setHandler(protocol::kUpdated.name, [this](const auto&, const JSONRPCResponder&) {
    if (_delegate.wantsLines())
      askForLines([this](const protocol::Lines& lines) { _delegate.widgetLinesDidChange(lines); });
  });
  client.connection().setHandler(protocol::kChanged.name,
                                 [this](const auto&, const JSONRPCResponder&) { _refresh.askNow(); });
  client.setNoticeHandler([this](const std::string& message) { _delegate.widgetTells(message); });
  client.setProgressHandler([this](const protocol::ProgressParams& progress) {
    for (const auto& waiting : _questions)
      if (const auto asked = waiting.lock();
          asked && asked->_fail && asked->_progress && progress.request == protocol::RequestID(asked->_request))
        asked->_progress(progress);
  });
  client.setOpenHandler([this](const WidgetClient::Opening& opening) { return _delegate.widgetOpens(opening); });
}

void WidgetHostProcess::appear() {
  _appeared = true;
  // Its rows of the last time are drawn before the fetch takes its time.
  askForContent();
  _widget->ask(protocol::kViewWillAppear);
  _widget->ask(protocol::kViewDidAppear);
  _refresh.setOnScreen(true);
}

void WidgetHostProcess::disappear() {
  _appeared = false;
  _refresh.setOnScreen(false);
  _widget->ask(protocol::kViewWillDisappear);
  _widget->ask(protocol::kViewDidDisappear);
}

void WidgetHostProcess::stop() {
  if (!_widget) return;
  if (_appeared) disappear();
  // What was asked is still done: the process reads it before the end of its input.
  _processMark.reset();
  _widget.reset();
  endQuestions("the widget process was ended");
}

void WidgetHostProcess::replace(const std::string& reason) {
  _delegate.widgetEnded(reason);
  _appeared = false;
  _refresh.setOnScreen(false);
  stop();
  setUpdating(false);
  const Date now = _clock.now();
  std::erase_if(_crashes, [&](Date crash) { return intervalBetween(crash, now) > kCrashWindow; });
  _crashes.push_back(now);
  if (_crashes.size() >= kCrashLimit)
    return giveUp(Failure::keepsFailing, "its process had to be started " + std::to_string(kCrashLimit) +
                                             " times within a minute, the last time since " + reason +
                                             ". Start the program in a terminal with NIMBO_LOG=debug to see why.");
  if (_visible) start();
}

void WidgetHostProcess::giveUp(Failure failure, const std::string& detail) {
  _gaveUp = true;
  _delegate.widgetDidFail(failure, detail);
}

void WidgetHostProcess::restart() {
  _gaveUp = false;
  _crashes.clear();
  if (_visible && !_widget) start();
}

template <class Params, class Result>
void WidgetHostProcess::askOfRow(const protocol::Method<Params, Result>& method, const Params& params) {
  if (_widget) _widget->call(method, params, [](const auto&, const auto&) {});
}

void WidgetHostProcess::askForContent() {
  if (!_appeared) return;
  if (_awaitsContent) {
    _contentIsStale = true;
    return;
  }
  const auto room = _delegate.roomForPicture();
  if (!room) return;
  _awaitsContent = true;
  _contentIsStale = false;
  const auto content = std::make_shared<Content>();
  _widget->ask(protocol::kRender, *room, [this, content](const protocol::Rendered& answer) {
    if (_delegate.widgetDrew(answer))
      content->picture = answer;
    else
      _widget->fail("it has not drawn what it says");
  });
  const auto finish = [this, content] {
    _awaitsContent = false;
    if (content->picture) show(*content);
    if (_contentIsStale) askForContent();
  };
  const bool wantsLines = _delegate.wantsLines();
  _widget->ask(protocol::kSnapshot, {}, [content, finish, wantsLines](const protocol::Snapshot& snapshot) {
    content->snapshot = snapshot;
    if (!wantsLines) finish();
  });
  if (wantsLines)
    askForLines([content, finish](const protocol::Lines& lines) {
      content->lines = lines;
      finish();
    });
}

void WidgetHostProcess::askForLines(std::function<void(const protocol::Lines&)> completion) {
  _widget->call(protocol::kLines, protocol::LinesParams(),
                [completion = std::move(completion)](const std::optional<protocol::Lines>& lines, const auto& error) {
                  // More favorites than an answer has room for are no fault of the process.
                  if (error.code != JSONRPCError::kConnectionClosed) completion(lines.value_or(protocol::Lines()));
                });
}

void WidgetHostProcess::show(const Content& content) {
  const protocol::Snapshot& snapshot = content.snapshot;
  _contentHeight = content.picture->height / content.picture->scale;
  tellPresentation();
  // The expanded mode ends with the rows that need it, and comes back with them; rows that could not take it are
  // compact without being told. What was asked for before the last mode was told decides nothing.
  if (!_contentIsStale) {
    _isExpanded = snapshot.expanded;
    setExpandedMode(_wantsExpanded && snapshot.largestAvailableDisplayMode == WidgetDisplayMode::Expanded);
  }
  _delegate.widgetDidChange(snapshot, content.lines);
}

void WidgetHostProcess::fetch(std::optional<TimeInterval> maxAge,
                              std::function<void(const protocol::UpdateResult&)> completion) {
  _widget->ask(protocol::kPerformUpdate, {maxAge},
               [this, completion = std::move(completion)](const protocol::UpdateResult& result) {
                 _refresh.answered(result);
                 if (completion) completion(result);
                 // Rows of an error stay the same where another one is the reason.
                 if (completion || result.updateResult == WidgetUpdateResult::Failed) askForContent();
               });
}

void WidgetHostProcess::update() {
  if (!_widget || _isUpdating) return;
  setUpdating(true);
  fetch(std::nullopt, [this](const auto&) { setUpdating(false); });
}

void WidgetHostProcess::setUpdating(bool updating) {
  if (std::exchange(_isUpdating, updating) != updating) _delegate.widgetIsUpdating(updating);
}

void WidgetHostProcess::highlightRow(std::size_t row, bool highlighted) {
  askOfRow(protocol::kHighlightRow, {.row = static_cast<std::uint32_t>(row), .highlighted = highlighted});
}

void WidgetHostProcess::selectRow(std::size_t row) {
  askOfRow(protocol::kSelectRow, {.row = static_cast<std::uint32_t>(row)});
}

ErrorRef WidgetHostProcess::failure(std::string reason) {
  return Error::errorWithDomain_code_reason(std::string(kProcessErrorDomain), 0, std::move(reason));
}

bool WidgetHostProcess::prepareFor(const std::shared_ptr<Question>& question) {
  prepare();
  std::erase_if(_questions, [](const auto& asked) { return asked.expired(); });
  _questions.push_back(question);
  if (_widget && !_visible) stopLater();
  if (_widget) return true;
  // Not before the one who asks has the question.
  _runLoop.dispatchAsync([waiting = std::weak_ptr(question)] {
    const auto asked = waiting.lock();
    if (!asked) return;
    if (const auto fail = std::exchange(asked->_fail, nullptr)) fail(failure("the widget process does not run"));
  });
  return false;
}

void WidgetHostProcess::endQuestions(const std::string& reason) {
  for (const auto& waiting : std::exchange(_questions, {})) {
    const auto asked = waiting.lock();
    if (!asked) continue;
    asked->_cancel = nullptr;
    if (const auto fail = std::exchange(asked->_fail, nullptr)) fail(failure(reason));
  }
}

}  // namespace nimbo
