#pragma once

#include <functional>
#include <memory>

#include "host/WatchedWidget.h"
#include "platform/RunLoop.h"
#include "platform/SystemServices.h"
#include "protocol/Messages.h"

namespace nimbo {

/// When a host asks by `performUpdate` for what its widget shows: at once when it comes on screen, then again and again
/// as often as the user has it, until it leaves the screen. Each time is spread by chance, so that not everybody asks
/// at once, and counts from when the server answered, whichever process it was that asked: of several hosts one asks,
/// and the others take that answer. What failed is tried again after a wait that doubles each time. Main thread only.
class RefreshRule {
 public:
  using Ask = std::function<void(TimeInterval maxAge)>;

  /// `ask` sends the request with its `maxAge`, half of the time from one to the next; its answer goes to `answered`.
  /// `spares` says whether the machine wants less of it at the moment. The loop and the random numbers outlive this.
  RefreshRule(RunLoop& runLoop, RandomSource& random, std::function<bool()> spares, Ask ask);
  ~RefreshRule();

  /// A widget that is started anew has left the screen before.
  void setOnScreen(bool isOnScreen);
  /// Asks now, for what has changed; after the answer that is waited for, which may not know of it.
  void askNow();
  /// What failed for want of a network is worth another attempt.
  void networkReturned();
  /// An update has ended, the user's own ones too.
  void answered(const protocol::UpdateResult& result);

  /// Seconds from an update that failed to the next.
  static constexpr TimeInterval kFirstRetry = 30, kLongestRetry = 1800;
  /// So many times as long are the waits on a metered network and while power is saved. By default that makes five
  /// minutes: a fifth of the bytes and of the wake-ups of the radio, and three attempts in the quarter of an hour for
  /// which alerts count.
  static constexpr double kSparingFactor = 5;
  /// Share of a wait by which it is longer or shorter by chance.
  static constexpr double kSpread = 1.0 / 6;

 private:
  void askIn(TimeInterval seconds);
  void ask();
  void cancel();

  RunLoop& _runLoop;
  RandomSource& _random;
  std::function<bool()> _spares;
  Ask _ask;
  TimeInterval _period = protocol::UpdateResult().refreshSeconds;  // from one to the next, by the last answer
  Backoff _retries{kFirstRetry, kLongestRetry};
  std::shared_ptr<Timer> _next;  // null while an answer is waited for, and off the screen
  bool _isOnScreen = false;
  bool _hasFailed = false;
  bool _asksAgain = false;  // once the answer has come
};

}  // namespace nimbo
