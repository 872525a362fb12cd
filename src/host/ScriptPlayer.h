#pragma once

#include <deque>
#include <istream>
#include <ostream>
#include <string>

#include "host/WidgetClient.h"

namespace nimbo {

/// Plays the lines of a file of host events to a widget process and prints each line that comes back. A request waits
/// for the answers of those before it, but `performUpdate` requests that follow each other are sent together. What the
/// widget wants to open is answered with "opened". Empty lines and lines that begin with "#" are left out; lines that
/// are no JSON are sent as they are.
class ScriptPlayer {
 public:
  ScriptPlayer(WidgetClient& client, std::ostream& output);

  /// Returns when the last answer has come, or when the process has ended because the script said so. Throws
  /// WidgetClientFailure when it ends or stays silent before.
  void play(std::istream& script);

 private:
  void waitForAnswers();

  WidgetClient& _client;
  std::ostream& _output;
  std::size_t _waitingFor = 0;  // answers still to come
};

}  // namespace nimbo
