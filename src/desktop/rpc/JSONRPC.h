#pragma once

#include <functional>
#include <memory>
#include <nlohmann/json.hpp>
#include <optional>
#include <string>

namespace nimbo {

/// The error object of JSON-RPC 2.0, section 5.1. https://www.jsonrpc.org/specification
struct JSONRPCError {
  int code = 0;
  std::string message;

  static constexpr int kParseError = -32700;
  static constexpr int kInvalidRequest = -32600;
  static constexpr int kMethodNotFound = -32601;
  static constexpr int kInvalidParams = -32602;
  static constexpr int kInternalError = -32603;
  /// The method exists but not at this stage of the widget's life.
  static constexpr int kInvalidState = -32001;
  /// Drawing failed.
  static constexpr int kDrawingFailed = -32002;
  /// Bytes that are to be decoded are neither a hand-off nor a saved state, or broken.
  static constexpr int kBrokenPayload = -32003;
  /// The other end does not want the answer any more.
  static constexpr int kCancelled = -32004;
  /// Never sent: no answer comes because the connection is closed.
  static constexpr int kConnectionClosed = -1;
};

/// Thrown by a request's handler: becomes the request's error answer, and nothing has changed.
struct JSONRPCFailure : std::exception {
  explicit JSONRPCFailure(JSONRPCError failure) : error(std::move(failure)) {}
  JSONRPCFailure(int code, std::string message) : error{code, std::move(message)} {}
  const char* what() const noexcept override { return error.message.c_str(); }
  JSONRPCError error;
};

/// The answer to a request, now or later. Copies share the request; the first answer counts.
class JSONRPCResponder {
 public:
  using Send = std::function<void(const nlohmann::json& message)>;
  /// No id: a notification, whose answers go nowhere.
  JSONRPCResponder(std::optional<nlohmann::json> id, Send send);
  void answer(const nlohmann::json& result) const;
  void fail(const JSONRPCError& error) const;
  /// As the request has it; absent for a notification.
  const std::optional<nlohmann::json>& id() const { return _state->id; }

 private:
  void send(nlohmann::json message) const;
  struct State {
    std::optional<nlohmann::json> id;
    Send send;
  };
  std::shared_ptr<State> _state;
};

}  // namespace nimbo
