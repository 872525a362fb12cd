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

 private:
  bool _isTerminal;
  bool _isShown = false;
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
