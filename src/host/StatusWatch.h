#pragma once

#include <functional>
#include <memory>

#include "desktop/system/SystemClock.h"
#include "host/BarContent.h"
#include "host/MachineConditions.h"
#include "host/OnScreenWidget.h"
#include "host/RefreshRule.h"
#include "host/WatchedWidget.h"
#include "platform/SystemServices.h"

namespace nimbo {

/// Follows a widget on screen for a status bar: tells what to show whenever that may have changed. It asks again by the
/// rule of `RefreshRule`; a process that fails is replaced, after waiting times that grow. Main thread only.
class StatusWatch {
 public:
  using Show = std::function<void(const BarContent& content)>;

  /// Starts the widget. `context`, `clock`, and what `show` holds, outlive this.
  StatusWatch(const CommandContext& context, const Clock& clock, WidgetPresentation presentation, Show show);
  /// Takes the widget off the screen, which saves its rows, and ends the process.
  ~StatusWatch();
  /// Hears what is known of the favorites, with all that incidents say, whenever that may be new and `wants` says so.
  void setLinesObserver(std::function<void(const protocol::Lines& lines)> observer, std::function<bool()> wants) {
    _linesObserver = std::move(observer);
    _wantsLines = std::move(wants);
  }
  StatusWatch(const StatusWatch&) = delete;
  StatusWatch& operator=(const StatusWatch&) = delete;

  /// Marks the incidents in force that were told last as seen.
  void markSeen();

  /// Seconds before the first and the later attempts to start a process.
  static constexpr TimeInterval kFirstRestart = 1, kLongestRestart = 300;

 private:
  void start();
  void update(TimeInterval maxAge);
  void look();
  void showSnapshot(const protocol::Snapshot& snapshot);
  /// Another process follows later.
  void restartAfter(const std::string& failure);
  static void cancel(std::shared_ptr<Timer>& timer);

  const CommandContext& _context;
  const Clock& _clock;
  WidgetPresentation _presentation;
  Show _show;
  std::function<void(const protocol::Lines&)> _linesObserver;  // null: nobody asks
  std::function<bool()> _wantsLines;                           // with the observer
  protocol::Lines _lines;                                      // as the widget told last
  Backoff _restarts{kFirstRestart, kLongestRestart};
  std::shared_ptr<Timer> _restart;
  std::shared_ptr<Timer> _stale;      // when the rows become old
  std::shared_ptr<Timer> _givesBack;  // null before the first rows
  SystemRandom _random;
  MachineConditions _conditions{[this] { _refresh.networkReturned(); }};
  RefreshRule _refresh;
  std::unique_ptr<WatchedWidget> _widget;  // null until it is started again
};

}  // namespace nimbo
