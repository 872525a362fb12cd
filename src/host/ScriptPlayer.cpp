#include "host/ScriptPlayer.h"

#include "host/TerminalText.h"

namespace nimbo {

using nlohmann::json;

namespace {

/// What the widget reads in a line; discarded where it finds no JSON.
json messageOf(const std::string& line) {
  return line.find('\0') == std::string::npos ? json::parse(line, nullptr, false) : json(json::value_t::discarded);
}

/// A line that is answered: a request, or something that is no message at all.
bool isAnswered(const json& message) {
  if (!message.is_object()) return true;
  const bool isAnswer = message.contains("result") || message.contains("error");
  const bool isNotification = message.contains("method") && !message.contains("id");
  return !isAnswer && !isNotification;
}

bool hasMethod(const json& message, const char* method) {
  return message.is_object() && message.value("method", json()) == method;
}

}  // namespace

ScriptPlayer::ScriptPlayer(WidgetClient& client, std::ostream& output) : _client(client), _output(output) {
  client.setOpenHandler([](const WidgetClient::Opening&) { return true; });
  client.connection().setLineObserver([this](std::string_view line) {
    _output << printableJSON(line) << "\n" << std::flush;
    const json message = json::parse(line, nullptr, false);
    const bool isAnswer = message.is_object() && !message.contains("method");
    if (isAnswer && _waitingFor > 0) --_waitingFor;
  });
}

void ScriptPlayer::waitForAnswers() {
  _client.waitUntil([this] { return _waitingFor == 0; });
}

void ScriptPlayer::play(std::istream& script) {
  bool lastWasUpdate = false;
  for (std::string line; std::getline(script, line);) {
    const std::size_t begin = line.find_first_not_of(" \t\r");
    if (begin == std::string::npos || line[begin] == '#') continue;
    const json message = messageOf(line);
    const bool isUpdate = hasMethod(message, protocol::kPerformUpdate.name);
    if (!(isUpdate && lastWasUpdate)) waitForAnswers();
    if (isAnswered(message)) ++_waitingFor;
    lastWasUpdate = isUpdate;
    _client.connection().sendLine(line);
    if (!hasMethod(message, protocol::kShutdown.name)) continue;
    waitForAnswers();
    return;
  }
  waitForAnswers();
}

}  // namespace nimbo
