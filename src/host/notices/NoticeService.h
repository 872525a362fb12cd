#pragma once

#include <functional>
#include <memory>
#include <set>
#include <string>

#include "host/notices/Bus.h"
#include "host/notices/NoticeBoard.h"
#include "platform/RunLoop.h"

namespace nimbo {

/// What nimbo-transit-notices does: it takes notices from other programs on the bus (Wire.h), opens what is clicked,
/// and ends when it has been of no use for a while. It is of use while a notice stands, and while a program is on the
/// bus that has posted: what that posts again, and the user has dismissed, is to be known. Main thread only.
class NoticeService {
 public:
  /// Seconds of no use after which it ends.
  static constexpr TimeInterval kLinger = 10;

  struct Events {
    /// What went wrong, for the log.
    std::function<void(const std::string& problem)> tell;
    /// There is nothing more to do. Told once.
    std::function<void()> ended;
  };

  /// Asks for the name on the bus. The bus and the run loop outlive the service.
  NoticeService(RunLoop& runLoop, Bus& bus, Events events);
  ~NoticeService();
  NoticeService(const NoticeService&) = delete;
  NoticeService& operator=(const NoticeService&) = delete;

 private:
  static const sd_bus_vtable kMethods[];

  int post(sd_bus_message* message);
  int close(sd_bus_message* message);
  NoticeCompletion replyTo(sd_bus_message* message);
  bool isOfUse() const { return !_board.isIdle() || !_posters.empty(); }
  void considerEnd();
  void requestName();
  void releaseName();
  void open(const std::string& address, const std::string& token);

  RunLoop& _runLoop;
  Bus& _bus;
  Events _events;
  NoticeBoard _board;
  BusSlotHandle _object;
  std::set<std::string, std::less<>> _posters;  // by their unique names
  std::shared_ptr<Timer> _linger;
  std::size_t _unanswered = 0;
};

}  // namespace nimbo
