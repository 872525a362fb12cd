#pragma once

#include <cstddef>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "host/notices/Bus.h"
#include "host/notices/DesktopNotifications.h"
#include "host/notices/Notice.h"
#include "host/notices/NoticeError.h"
#include "platform/RunLoop.h"

namespace nimbo {

/// What was told under each key, and what of it stands on the desktop. Main thread only.
///
/// What stands when the notification service ends is counted as told and gone: desktops show nothing anew after that
/// either, and nothing is told twice. A service that does not answer in time may still show what it was given: until it
/// answers or ends, nothing more is asked of it under that key, and who posts gets the error.
class NoticeBoard {
 public:
  /// At most so many posted and closed at once, under so many keys in all, and so many questions about one of them
  /// while the service is silent.
  static constexpr std::size_t kMostPosted = 50, kMostClosed = 10'000, kMostKept = 200, kMostWaiting = 50;
  /// Seconds in which posts and closings are answered.
  static constexpr TimeInterval kPatience = 20;

  struct Events {
    /// A click on a notice that opens something, with the desktop's token for that (XDG Activation), or an empty one.
    /// Null: clicks are not taken.
    std::function<void(const std::string& address, const std::string& token)> open;
    /// Something may have ended; `isIdle` tells.
    std::function<void()> changed;
  };

  /// The bus and the run loop outlive the board.
  NoticeBoard(RunLoop& runLoop, Bus& bus, Events events);

  /// As `NoticeSender::post` and `close`, but that the answer may come before the call returns, and within `kPatience`.
  void post(const std::vector<Notice>& notices, NoticeCompletion completion);
  void close(const std::vector<std::string>& keys, NoticeCompletion completion);

  /// Whether nothing stands, and nothing is asked of the notification service.
  bool isIdle() const;

  /// What is wrong with notices that somebody posts; null where nothing is.
  static ErrorRef problemOf(const std::vector<Notice>& notices);
  /// The same of keys that somebody closes.
  static ErrorRef problemOfKeys(const std::vector<std::string>& keys);

 private:
  using Reference = DesktopNotifications::Reference;
  struct Entry {
    std::optional<Notice> wanted;  ///< absent: it is to go
    std::optional<Notice> told;    ///< the last that was shown, whether it stands or not
    Reference standing;            ///< without a number: nothing stands
    bool isAsked = false;          ///< the service has not answered yet
    std::vector<NoticeCompletion> waiting;
    std::size_t age = 0;  ///< grows with each post
  };
  using Entries = std::map<std::string, Entry, std::less<>>;

  NoticeCompletion shared(std::size_t answers, NoticeCompletion completion);
  bool makeRoom();
  void want(const std::string& key, std::optional<Notice> notice, const NoticeCompletion& answered);
  void settle(const std::string& key);
  void show(const std::string& key, Entry& entry);
  void answer(const std::string& key, const ErrorRef& error);
  Entry* entryOf(const Reference& reference);
  void forget(const std::function<bool(const Reference&)>& which);

  RunLoop& _runLoop;
  Events _events;
  DesktopNotifications _desktop;
  Entries _entries;
  std::size_t _posts = 0;
};

}  // namespace nimbo
