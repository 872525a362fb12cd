#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <nlohmann/json.hpp>
#include <optional>
#include <string>
#include <string_view>

#include "desktop/rpc/JSONRPC.h"
#include "desktop/system/GLibRunLoop.h"

namespace nimbo {

/// JSON-RPC 2.0 over two descriptors, one message a line, both ends alike. A line that is no message gets its error
/// answer and the connection goes on; a line longer than `kMaximumLine` bytes is skipped whole: an answer that would be
/// one becomes an error, and a request that would be one ends in an error without being sent. A non-blocking output
/// that stays full for a second closes the connection. Main thread only.
class JSONRPCConnection {
 public:
  using RequestHandler = std::function<void(const nlohmann::json& params, const JSONRPCResponder& responder)>;
  /// Exactly one of the two is meaningful: the result, or the error when it is set.
  using Completion = std::function<void(const nlohmann::json& result, const std::optional<JSONRPCError>& error)>;

  static constexpr std::size_t kMaximumLine = 4u << 20;

  /// Reads from `input` once `start`ed and writes to `output`; both stay open and belong to the caller.
  JSONRPCConnection(GLibRunLoop& runLoop, int input, int output);
  JSONRPCConnection(const JSONRPCConnection&) = delete;
  JSONRPCConnection& operator=(const JSONRPCConnection&) = delete;

  /// Answers requests and hears notifications of this method. `params` is an object, empty when the message has none.
  /// What the handler throws becomes the error answer.
  void setHandler(std::string method, RequestHandler handler);
  /// Hears once when the other end closed its side or a descriptor failed.
  void setClosedHandler(std::function<void()> closed) { _closed = std::move(closed); }
  /// Hears of what is no message, in place of the other end, which then gets no error answer: for a host that ends a
  /// widget process that speaks nonsense.
  void setMalformedHandler(std::function<void(const std::string& problem)> malformed) {
    _malformed = std::move(malformed);
  }
  /// Sees every line that arrives before it is handled.
  void setLineObserver(std::function<void(std::string_view)> observer) { _lineObserver = std::move(observer); }

  void start();

  void notify(std::string_view method, const nlohmann::json& params);
  /// Asks the other end; `completion` hears once, also (with an error) when the connection closes first; at once
  /// when nothing can be sent. Answers the request's identifier.
  std::int64_t call(std::string_view method, const nlohmann::json& params, Completion completion);
  /// Writes a line as it stands.
  void sendLine(std::string_view line);

 private:
  void readAvailable();
  void handleLine(std::string_view line);
  void handleMessage(const nlohmann::json& message);
  void handleAnswer(const nlohmann::json& message);
  void handleRequest(const nlohmann::json& message);
  void close();
  void send(const nlohmann::json& message);
  /// Answers what is no message with an error.
  void refuse(const nlohmann::json& id, int code, std::string problem);

  GLibRunLoop& _runLoop;
  int _input;
  int _output;
  GSourceHandle _watch;
  std::string _buffer;
  bool _skippingLine = false;
  bool _open = true;
  std::int64_t _nextID = 1;
  std::map<std::string, RequestHandler, std::less<>> _handlers;
  std::map<std::int64_t, Completion> _pending;
  std::function<void()> _closed;
  std::function<void(const std::string&)> _malformed;
  std::function<void(std::string_view)> _lineObserver;
  // Callbacks may destroy the connection while it handles a line.
  std::shared_ptr<bool> _alive = std::make_shared<bool>(true);
};

}  // namespace nimbo
