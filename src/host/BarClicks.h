#pragma once

#include <functional>
#include <memory>
#include <string>
#include <string_view>

#include "desktop/system/GLibRunLoop.h"

namespace nimbo {

/// Reads the click events that a bar of i3bar's protocol writes: an endless array, an event a line. What is no event on
/// our block is passed over, however much it is, and little is read at a time. Main thread only.
class BarClicks {
 public:
  /// `clicked` hears the button: 1 left, 2 middle, 3 right, and others; at most one a second, since each may start a
  /// program. `descriptor` stays the caller's and outlives this.
  BarClicks(GLibRunLoop& runLoop, int descriptor, std::function<void(int button)> clicked);
  ~BarClicks();

 private:
  void listen();
  void read();
  /// Reads on after so many seconds.
  void rest(TimeInterval seconds);

  GLibRunLoop& _runLoop;
  int _descriptor;
  std::function<void(int)> _clicked;
  std::string _line;        // what has come of the next one
  bool _isTooLong = false;  // the rest of the line is passed over
  GSourceHandle _readable;  // while it is read
  std::shared_ptr<Timer> _rest;
};

}  // namespace nimbo
