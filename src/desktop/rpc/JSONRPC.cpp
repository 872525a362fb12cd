#include "desktop/rpc/JSONRPC.h"

namespace nimbo {

using nlohmann::json;

JSONRPCResponder::JSONRPCResponder(std::optional<json> id, Send send)
    : _state(std::make_shared<State>(State{std::move(id), std::move(send)})) {}

void JSONRPCResponder::answer(const json& result) const { send({{"result", result}}); }

void JSONRPCResponder::fail(const JSONRPCError& error) const {
  send({{"error", {{"code", error.code}, {"message", error.message}}}});
}

void JSONRPCResponder::send(json message) const {
  if (!_state->id) return;
  message["jsonrpc"] = "2.0";
  message["id"] = *std::exchange(_state->id, std::nullopt);
  _state->send(message);
}

}  // namespace nimbo
