#pragma once

#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "host/WidgetClient.h"

namespace nimbo {

/// A widget process that a host on screen can rely on: one that ends, hangs, does not stop talking or speaks nonsense
/// is killed, and the host hears of it. Main thread only.
class WatchedWidget {
 public:
  using Completion = std::function<void(const nlohmann::json& result)>;
  using FailureHandler = std::function<void(const std::string& reason)>;

  /// Starts the widget with these arguments. `patience` is the time, in seconds, in which it answers anything but an
  /// update, which takes as long as its feeds. `failed` hears once, in a call of its own in which it may destroy this,
  /// why the process is no more ("it ended"). Throws WidgetClientFailure when it cannot be started.
  WatchedWidget(GLibRunLoop& runLoop, const std::vector<std::string>& arguments, TimeInterval patience,
                FailureHandler failed);
  ~WatchedWidget();

  WidgetClient& client() { return _client; }
  /// A request that a sound process answers with a result. What `completion` throws at a malformed one is a failure.
  void ask(std::string_view method, const nlohmann::json& params = nlohmann::json::object(),
           Completion completion = nullptr);
  /// A request that may be answered with an error.
  void call(std::string_view method, const nlohmann::json& params, JSONRPCConnection::Completion completion);
  /// Gives the process up for what its host finds wrong with it.
  void fail(const std::string& reason);

 private:
  void countLine();

  GLibRunLoop& _runLoop;
  TimeInterval _patience;
  FailureHandler _failed;
  WidgetClient _client;
  std::vector<std::shared_ptr<Timer>> _waiting;  // one for each answer that is waited for
  std::shared_ptr<Timer> _second;                // while lines are counted
  std::size_t _lines = 0;                        // in that second
  std::shared_ptr<bool> _hasFailed = std::make_shared<bool>(false);
};

}  // namespace nimbo
