#include "desktop/rpc/JSONRPCConnection.h"

#include <poll.h>
#include <unistd.h>

#include <cerrno>

namespace nimbo {

using nlohmann::json;

namespace {

/// A text for the other end: bad UTF-8 inside a message is replaced rather than thrown on.
std::string lineOf(const json& message) { return message.dump(-1, ' ', false, json::error_handler_t::replace) + "\n"; }

JSONRPCError tooLong(const std::string& what) {
  return {JSONRPCError::kInternalError,
          "the " + what + " is longer than " + std::to_string(JSONRPCConnection::kMaximumLine) + " bytes"};
}

bool waitWritable(int fd, int milliseconds) {
  pollfd ready{fd, POLLOUT, 0};
  return ::poll(&ready, 1, milliseconds) != 0;
}

bool isID(const json& id) { return id.is_string() || id.is_number() || id.is_null(); }

}  // namespace

JSONRPCConnection::JSONRPCConnection(GLibRunLoop& runLoop, int input, int output)
    : _runLoop(runLoop), _input(input), _output(output) {}

void JSONRPCConnection::setHandler(std::string method, RequestHandler handler) {
  _handlers.insert_or_assign(std::move(method), std::move(handler));
}

void JSONRPCConnection::start() {
  _watch = _runLoop.watchReadable(_input, [this] { readAvailable(); });
}

void JSONRPCConnection::readAvailable() {
  const std::weak_ptr<bool> alive = _alive;
  char chunk[64 * 1024];
  const ssize_t count = ::read(_input, chunk, sizeof chunk);
  if (count < 0 && (errno == EINTR || errno == EAGAIN)) return;
  if (count <= 0) return close();
  _buffer.append(chunk, static_cast<std::size_t>(count));
  std::size_t begin = 0;
  for (std::size_t end; (end = _buffer.find('\n', begin)) != std::string::npos; begin = end + 1) {
    if (std::exchange(_skippingLine, false)) continue;
    handleLine(std::string_view(_buffer).substr(begin, end - begin));
    if (alive.expired() || !_open) return;
  }
  _buffer.erase(0, begin);
  if (_skippingLine) {
    _buffer.clear();
  } else if (_buffer.size() > kMaximumLine) {
    _skippingLine = true;
    _buffer.clear();
    refuse(nullptr, JSONRPCError::kInvalidRequest, "a line is longer than " + std::to_string(kMaximumLine) + " bytes");
  }
}

void JSONRPCConnection::handleLine(std::string_view line) {
  if (line.ends_with('\r')) line.remove_suffix(1);
  if (line.find_first_not_of(" \t") == std::string_view::npos) return;
  const std::weak_ptr<bool> alive = _alive;
  if (_lineObserver) _lineObserver(line);
  if (alive.expired()) return;
  // A parser callback bounds the depth: the tree of a deeply nested line would be destroyed recursively.
  constexpr int kMaximumDepth = 64;
  bool tooDeep = false;
  const auto bounded = [&tooDeep](int depth, json::parse_event_t, json&) {
    tooDeep = tooDeep || depth > kMaximumDepth;
    return depth <= kMaximumDepth;
  };
  const json message = json::parse(line, bounded, false);
  // A NUL byte is the end of the text to the parser.
  if (message.is_discarded() || line.find('\0') != std::string_view::npos)
    return refuse(nullptr, JSONRPCError::kParseError, "the line is not JSON");
  if (tooDeep) return refuse(nullptr, JSONRPCError::kInvalidRequest, "the message is nested too deeply");
  handleMessage(message);
}

void JSONRPCConnection::handleMessage(const json& message) {
  const bool isObject = message.is_object() && message.value("jsonrpc", json()) == "2.0";
  const bool isAnswer =
      isObject && !message.contains("method") && (message.contains("result") || message.contains("error"));
  if (isAnswer) return handleAnswer(message);
  if (isObject && message.contains("method") && message["method"].is_string() &&
      (!message.contains("id") || isID(message["id"])) &&
      (!message.contains("params") || message["params"].is_object()))
    return handleRequest(message);
  const bool hasID = message.is_object() && message.contains("id") && isID(message["id"]);
  refuse(hasID ? message["id"] : json(nullptr), JSONRPCError::kInvalidRequest,
         "a request is one object with \"jsonrpc\": \"2.0\", \"method\", and, if any, \"params\" as an object");
}

void JSONRPCConnection::refuse(const json& id, int code, std::string problem) {
  if (_malformed) return _malformed(problem);
  JSONRPCResponder(id, [this](const json& answer) { send(answer); }).fail({code, std::move(problem)});
}

void JSONRPCConnection::handleAnswer(const json& message) {
  const json id = message.value("id", json());
  if (!id.is_number_integer()) return;
  const auto pending = _pending.find(id.get<std::int64_t>());
  if (pending == _pending.end()) return;
  const Completion completion = std::move(pending->second);
  _pending.erase(pending);
  if (!message.contains("error")) return completion(message["result"], std::nullopt);
  JSONRPCError error{JSONRPCError::kInternalError, "the other end reported an error without saying which"};
  const json& reported = message["error"];
  if (reported.is_object() && reported.contains("message") && reported["message"].is_string())
    error.message = reported["message"];
  if (reported.is_object() && reported.contains("code") && reported["code"].is_number_integer())
    error.code = reported["code"];
  completion(nullptr, error);
}

void JSONRPCConnection::handleRequest(const json& message) {
  std::optional<json> id;
  if (message.contains("id")) id = message["id"];
  const std::weak_ptr<bool> alive = _alive;
  const JSONRPCResponder responder(std::move(id), [this, alive](const json& answer) {
    if (!alive.expired()) send(answer);
  });
  const auto handler = _handlers.find(message["method"].get_ref<const std::string&>());
  if (handler == _handlers.end())
    return responder.fail(
        {JSONRPCError::kMethodNotFound, "no method \"" + message["method"].get<std::string>() + "\""});
  try {
    handler->second(message.contains("params") ? message["params"] : json::object(), responder);
  } catch (const JSONRPCFailure& failure) {
    responder.fail(failure.error);
  } catch (const std::exception& exception) {
    responder.fail({JSONRPCError::kInternalError, exception.what()});
  }
}

void JSONRPCConnection::notify(std::string_view method, const json& params) {
  send({{"jsonrpc", "2.0"}, {"method", method}, {"params", params}});
}

std::int64_t JSONRPCConnection::call(std::string_view method, const json& params, Completion completion) {
  const std::int64_t id = _nextID++;
  if (!_open) {
    completion(nullptr, JSONRPCError{JSONRPCError::kConnectionClosed, "the connection is closed"});
    return id;
  }
  const std::string line = lineOf({{"jsonrpc", "2.0"}, {"id", id}, {"method", method}, {"params", params}});
  if (line.size() > kMaximumLine) {
    completion(nullptr, tooLong("request"));
    return id;
  }
  _pending.emplace(id, std::move(completion));
  sendLine(line);
  return id;
}

void JSONRPCConnection::send(const json& message) {
  std::string line = lineOf(message);
  // The other end would pass over the line, and wait for ever.
  if (line.size() > kMaximumLine && message.contains("result")) {
    const JSONRPCError error = tooLong("answer");
    line = lineOf(
        {{"jsonrpc", "2.0"}, {"id", message["id"]}, {"error", {{"code", error.code}, {"message", error.message}}}});
  }
  sendLine(line);
}

void JSONRPCConnection::sendLine(std::string_view line) {
  constexpr int kPatienceMilliseconds = 1000;
  std::string terminated;
  if (!line.ends_with('\n')) line = terminated = std::string(line) + "\n";
  while (_open && !line.empty()) {
    const ssize_t count = ::write(_output, line.data(), line.size());
    if (count >= 0) {
      line.remove_prefix(static_cast<std::size_t>(count));
    } else if (errno == EINTR || (errno == EAGAIN && waitWritable(_output, kPatienceMilliseconds))) {
      continue;
    } else {
      // Closing here would destroy what is being used by the callers above: the reading side notices next.
      _open = false;
      const std::weak_ptr<bool> alive = _alive;
      _runLoop.dispatchAsync([this, alive] {
        if (alive.expired()) return;
        _open = true;
        close();
      });
    }
  }
}

void JSONRPCConnection::close() {
  if (!_open) return;
  _open = false;
  _watch.reset();
  const std::weak_ptr<bool> alive = _alive;
  for (auto pending = std::exchange(_pending, {}); auto& [id, completion] : pending)
    completion(nullptr, JSONRPCError{JSONRPCError::kConnectionClosed, "the connection was closed"});
  if (!alive.expired() && _closed) std::exchange(_closed, nullptr)();
}

}  // namespace nimbo
