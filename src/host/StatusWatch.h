#pragma once

#include <functional>
#include <memory>
#include <string>

#include "host/OnScreenWidget.h"
#include "host/WatchedWidget.h"

namespace nimbo {

/// Follows a widget on screen for a status bar: tells a line of `statusBarLine` whenever it is another one than the
/// line before. The widget keeps its own schedule; what it leaves to its host is done here: a failed update is tried
/// again, and a process that fails is replaced, both after waiting times that grow. Main thread only.
class StatusWatch {
 public:
  using Show = std::function<void(const std::string& line)>;

  /// Starts the widget. `context`, and what `show` holds, outlive this.
  StatusWatch(const CommandContext& context, WidgetPresentation presentation, Show show);
  /// Takes the widget off the screen, which saves its rows, and ends the process.
  ~StatusWatch();
  StatusWatch(const StatusWatch&) = delete;
  StatusWatch& operator=(const StatusWatch&) = delete;

  // Seconds before the first and the later attempts.
  static constexpr TimeInterval kFirstRestart = 1, kLongestRestart = 300;
  static constexpr TimeInterval kFirstUpdate = 60, kLongestUpdate = 1800;

 private:
  void start();
  void update();
  void look();
  void showSnapshot(const protocol::Snapshot& snapshot);
  void showLine(const std::string& line);
  /// Another process follows later.
  void restartAfter(const std::string& failure);
  void cancel(std::shared_ptr<Timer>& timer);

  const CommandContext& _context;
  WidgetPresentation _presentation;
  Show _show;
  std::string _lastLine;
  Backoff _restarts{kFirstRestart, kLongestRestart};
  Backoff _updates{kFirstUpdate, kLongestUpdate};
  std::shared_ptr<Timer> _restart;
  std::shared_ptr<Timer> _update;          // the next attempt after a failed one
  std::unique_ptr<WatchedWidget> _widget;  // null until it is started again
};

}  // namespace nimbo
