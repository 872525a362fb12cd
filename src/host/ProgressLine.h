#pragma once

#include "host/Commands.h"
#include "host/WidgetClient.h"

namespace nimbo {

/// A line of a terminal that says what is waited for, and goes when it is over. Nothing where standard error is no
/// terminal.
class ProgressLine {
 public:
  ProgressLine();
  ~ProgressLine() { clear(); }
  ProgressLine(const ProgressLine&) = delete;
  ProgressLine& operator=(const ProgressLine&) = delete;

  void show(const protocol::ProgressParams& progress);
  void clear();
  /// Whether there is a terminal.
  bool isSeen() const { return _isTerminal; }

 private:
  bool _isTerminal;
  bool _isShown = false;
};

/// Says on the terminal how far the static feeds are that a widget process downloads, while this lives. The client
/// outlives it.
class DownloadProgress {
 public:
  explicit DownloadProgress(WidgetClient& client);
  ~DownloadProgress();
  DownloadProgress(const DownloadProgress&) = delete;
  DownloadProgress& operator=(const DownloadProgress&) = delete;

 private:
  void show(const protocol::Downloads& downloads);

  ProgressLine _line;
  std::shared_ptr<Timer> _timer;  // null where nobody sees it
  std::shared_ptr<bool> _alive = std::make_shared<bool>(true);
};

/// A widget process for questions about feeds; what takes longer than a second is told of on the terminal.
class WidgetWithProgress {
 public:
  explicit WidgetWithProgress(const CommandContext& context);

  /// As `WidgetClient::call`.
  template <class Params, class Result>
  Result call(const protocol::Method<Params, Result>& method, const Params& params) {
    const Result result = _client.call(method, params);
    _line.clear();
    return result;
  }

 private:
  ProgressLine _line;
  WidgetClient _client;
};

}  // namespace nimbo
