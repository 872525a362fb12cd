#include "host/StatusBar.h"

#include <unistd.h>

#include <csignal>
#include <cstring>
#include <iostream>
#include <optional>
#include <vector>

#include "desktop/system/SystemClock.h"
#include "host/BarClicks.h"
#include "host/BarOutput.h"
#include "host/HostPlatform.h"
#include "host/OnScreenWidget.h"
#include "host/QuitOnSignal.h"
#include "host/SavedRows.h"
#include "host/StatusWatch.h"
#include "host/WindowLauncher.h"
#include "host/telling/Teller.h"

namespace nimbo {

namespace {

/// Rows that a tooltip has room for.
constexpr int kTooltipRows = 10;

WidgetPresentation presentationForBar() {
  WidgetPresentation presentation;
  presentation.expandedHeight = kTooltipRows * WidgetPresentation::kDefaultRowHeight;
  return presentation;
}

/// A bar that somebody reads, and what he does there.
class BarSession {
 public:
  BarSession(const CommandContext& context, const BarFormat& format, bool notifies)
      : _context(context),
        _format(format),
        _output(context.runLoop, STDOUT_FILENO, [this](int failure) { end(failure); }),
        _launcher(context.widgetArguments, [this](const std::string& message) { tell(message); }),
        _platform(context),
        _teller(context.runLoop, *_platform.operator->(), {.isAsked = notifies}),
        _watch(context, _clock, presentationForBar(), [this](const BarContent& content) { show(content); }) {
    _output.begin(format.beginning);
    _watch.setLinesObserver([this](const protocol::Lines& lines) { notify(lines); }, [this] { return _teller.isOn(); });
    for (const int signal : {SIGTERM, SIGINT}) _signals.push_back(quitOnSignal(context.runLoop, signal));
    if (format.takesClicks) _clicks.emplace(context.runLoop, STDIN_FILENO, [this](int button) { click(button); });
  }
  ~BarSession() {
    if (_told) _told->invalidate();
  }

  void run() {
    _context.runLoop.run();
    if (_failure != 0)
      throw CommandFailure(std::string("cannot write to the standard output: ") + std::strerror(_failure));
  }

 private:
  void show(const BarContent& content) {
    _line = _format.write(content);
    if (!_told) _output.show(_line);
  }

  void click(int button) {
    constexpr int kLeft = 1, kMiddle = 2, kRight = 3;
    if (button == kLeft) _launcher.openURL("nimbo://");
    if (button == kMiddle) _watch.markSeen();
    if (button == kRight) _launcher.openURL("nimbo://planned");
  }

  void notify(const protocol::Lines& lines) {
    _teller.take(lines, [this](const ErrorRef& error) {
      const std::string failure = error ? "cannot notify: " + error->reason() : "";
      if (!failure.empty() && failure != _toldFailure) _context.tell(failure);
      _toldFailure = failure;
    });
  }

  /// Tells what a click has come to in the place of the rows, for a while.
  void tell(const std::string& message) {
    constexpr TimeInterval kPatience = 10;
    printMessage(message);
    BarContent content = barContentOfFailure(message);
    content.text = message;
    _output.show(_format.write(content));
    if (_told) _told->invalidate();
    _told = _context.runLoop.scheduleTimer(kPatience, false, [this](Timer&) {
      _told = nullptr;
      _output.show(_line);
    });
  }

  void end(int failure) {
    _failure = failure;
    _context.runLoop.quit();
  }

  const CommandContext& _context;
  const BarFormat& _format;
  SystemClock _clock;
  int _failure = 0;
  std::string _line;             // of what the widget shows
  std::shared_ptr<Timer> _told;  // while something else stands there
  BarOutput _output;
  WindowLauncher _launcher;
  std::vector<GSourceHandle> _signals;
  HostPlatform _platform;
  Teller _teller;
  std::string _toldFailure;  // of the desktop's notifications
  StatusWatch _watch;
  std::optional<BarClicks> _clicks;
};

void print(const BarFormat& format, const BarContent& content) {
  std::cout << format.beginning << format.write(content) << "\n" << format.end;
}

}  // namespace

int runStatusBar(const CommandContext& context, const BarFormat& format, const StatusOptions& options) {
  WidgetPresentation presentation = presentationForBar();
  presentation.virtualTime = options.now;
  const Date now = options.now ? *dateFromISOText(*options.now) : SystemClock().now();
  const auto printRows = [&](const protocol::Snapshot& snapshot, const protocol::Lines& lines) {
    print(format, barContentOf(snapshot, lines, now).value_or(BarContent()));
  };
  try {
    if (options.saved) {
      printRows(savedSnapshot(context, presentation, WidgetDisplayMode::Compact, {.rows = false}), {});
      return kExitSuccess;
    }
    OnScreenWidget widget(context, presentation);
    // A bar may ask every few seconds.
    const std::optional<std::string> failure = widget.update(sharedAge(context));
    printRows(widget.snapshot({.rows = false}), widget.lines({.texts = false}));
    widget.close();
    if (failure) throw CommandFailure(*failure);
  } catch (const WidgetClientFailure& failure) {
    print(format, barContentOfFailure(failure.what()));
    throw;
  }
  return kExitSuccess;
}

int runStatusWatch(const CommandContext& context, const BarFormat& format, bool notify) {
  BarSession(context, format, notify).run();
  return kExitSuccess;
}

}  // namespace nimbo
