#pragma once

#include <functional>
#include <optional>
#include <string>

#include "desktop/system/GLibRunLoop.h"

namespace nimbo {

/// Writes lines to a bar that may be slow, stand still or go: nothing waits for it, and of the lines that it has not
/// begun to take the last one alone is kept. Main thread only.
class BarOutput {
 public:
  /// `ended` hears, in a call of its own, that nobody reads any more (0), or the errno for which nothing can be
  /// written. `descriptor` stays the caller's; it is never made non-blocking, since others may share it.
  BarOutput(GLibRunLoop& runLoop, int descriptor, std::function<void(int failure)> ended);

  /// Has a line written, its end with it, unless it is the same as the one before.
  void show(std::string line);
  /// Has text written that is kept whatever follows it. Before the first line.
  void begin(std::string text);

 private:
  void write();
  void writeWhenItCan();

  GLibRunLoop& _runLoop;
  int _descriptor;
  std::function<void(int)> _ended;
  std::string _last;                 // what was asked for last
  std::string _underWay;             // the rest of what the bar has begun to take
  std::optional<std::string> _next;  // what it takes then
  GSourceHandle _gone;
  GSourceHandle _writable;  // while something is to be written
};

}  // namespace nimbo
