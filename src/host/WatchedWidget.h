#pragma once

#include <algorithm>
#include <functional>
#include <memory>
#include <string>
#include <type_traits>
#include <vector>

#include "host/WidgetClient.h"
#include "platform/foundation/Date.h"

namespace nimbo {

/// How long to wait before the next of several attempts: each time twice as long as the time before.
class Backoff {
 public:
  /// `first` and `most` in seconds, 0 < first <= most.
  Backoff(TimeInterval first, TimeInterval most) : _first(first), _most(most), _next(first) {}

  TimeInterval next() {
    const TimeInterval wait = _next;
    _next = std::min(2 * _next, _most);
    return wait;
  }
  /// An attempt succeeded: the next wait is the first one again.
  void reset() { _next = _first; }

 private:
  TimeInterval _first, _most, _next;
};

/// A widget process that a host on screen can rely on: one that ends, hangs, does not stop talking or speaks nonsense
/// is killed, and the host hears of it. Main thread only.
class WatchedWidget {
 public:
  using FailureHandler = std::function<void(const std::string& reason)>;

  /// Starts the widget with these arguments, and with memory to draw into when it is to draw. `patience` is the time,
  /// in seconds, in which it answers anything that waits for no feed. `failed` hears once, in
  /// a call of its own in which it may destroy this, why the process is no more ("it ended"). Throws
  /// WidgetClientFailure when it cannot be started.
  WatchedWidget(GLibRunLoop& runLoop, const std::vector<std::string>& arguments, TimeInterval patience,
                FailureHandler failed, const PictureMemory* pictures = nullptr);
  ~WatchedWidget();

  WidgetClient& client() { return _client; }
  /// A request that a sound process answers with a result.
  template <class Params, class Result>
  void ask(const protocol::Method<Params, Result>& method, const Params& params = {},
           std::function<void(const std::type_identity_t<Result>& result)> completion = nullptr) {
    call(method, params,
         [this, name = method.name, completion = std::move(completion)](const std::optional<Result>& result,
                                                                        const JSONRPCError& error) {
           if (result && completion) completion(*result);
           if (!result && error.code != JSONRPCError::kConnectionClosed)
             fail("it refuses \"" + std::string(name) + "\": " + error.message);
         });
  }
  /// A request that may be answered with an error; the error counts when there is no result. Answers its identifier.
  template <class Params, class Result>
  std::int64_t call(
      const protocol::Method<Params, Result>& method, const Params& params,
      std::function<void(const std::optional<std::type_identity_t<Result>>& result, const JSONRPCError& error)>
          completion) {
    return send(method.name, protocol::write(params), method.waitsForFeeds,
                [this, name = method.name, completion = std::move(completion)](
                    const nlohmann::json& json, const std::optional<JSONRPCError>& error) {
                  std::optional<Result> result;
                  try {
                    if (!error) result = protocol::read<Result>(json);
                  } catch (const protocol::Malformed& malformed) {
                    return fail(nonsense(name, malformed));
                  }
                  completion(result, error.value_or(JSONRPCError()));
                });
  }
  /// Gives the process up for what its host finds wrong with it.
  void fail(const std::string& reason);

 private:
  /// Sends a request, and fails when an answer that waits for nothing does not come in time.
  std::int64_t send(const char* method, const nlohmann::json& params, bool waitsForFeeds,
                    JSONRPCConnection::Completion completion);
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
