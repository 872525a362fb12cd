// libnimbo-notices.so: what NoticesPart.h declares.

#include <utility>

#include "host/notices/Bus.h"
#include "host/notices/NoticeBoard.h"
#include "host/notices/NoticesPart.h"
#include "host/notices/Wire.h"

namespace nimbo {

namespace {

/// Seconds: longer than the sender itself takes, which the bus may have to start.
constexpr TimeInterval kHandOverPatience = 28;

bool isError(sd_bus_message* answer, const char* name) {
  return answer && sd_bus_error_has_name(sd_bus_message_get_error(answer), name);
}

class BusHandOver final : public NoticeHandOver {
 public:
  explicit BusHandOver(RunLoop& runLoop) : _runLoop(runLoop) {}

  void post(const std::vector<Notice>& notices, NoticeCompletion completion) override {
    if (ErrorRef problem = NoticeBoard::problemOf(notices); problem || notices.empty()) return completion(problem);
    if (ErrorRef error = connect()) return completion(error);
    if (_board) return _board->post(notices, std::move(completion));
    auto call = _bus->newCall(kNoticesName, kNoticesObject, kNoticesInterface, "Post");
    appendNotices(call.get(), notices);
    const auto answered = answeredWithin(_runLoop, kHandOverPatience, std::move(completion));
    _bus->call(call, [this, notices, answered](sd_bus_message* answer) {
      if (!isError(answer, SD_BUS_ERROR_SERVICE_UNKNOWN)) return answered(errorIn(answer));
      // Not installed: what is shown from here stays here. Another post may have found that out before.
      if (!_board) _board = std::make_unique<NoticeBoard>(_runLoop, *_bus, NoticeBoard::Events());
      _board->post(notices, answered);
    });
  }

  void close(const std::vector<std::string>& keys, NoticeCompletion completion) override {
    if (ErrorRef problem = NoticeBoard::problemOfKeys(keys); problem || keys.empty()) return completion(problem);
    if (ErrorRef error = connect()) return completion(error);
    if (_board) return _board->close(keys, std::move(completion));
    auto call = _bus->newCall(kNoticesName, kNoticesObject, kNoticesInterface, "Close");
    // A sender that does not run shows nothing.
    busResult(sd_bus_message_set_auto_start(call.get(), 0));
    appendKeys(call.get(), keys);
    const auto answered = answeredWithin(_runLoop, kHandOverPatience, std::move(completion));
    _bus->call(call, [this, keys, answered](sd_bus_message* answer) {
      if (!isError(answer, SD_BUS_ERROR_SERVICE_UNKNOWN) && !isError(answer, SD_BUS_ERROR_NAME_HAS_NO_OWNER))
        return answered(errorIn(answer));
      if (_board) return _board->close(keys, answered);  // a post that was asked before has found it not installed
      answered(nullptr);
    });
  }

 private:
  /// Null with a bus.
  ErrorRef connect() {
    if (_bus && _bus->isOpen()) return nullptr;
    _board.reset();
    auto bus = Bus::open();
    if (!bus) return bus.error();
    _bus = std::move(*bus);
    return nullptr;
  }

  static ErrorRef errorIn(sd_bus_message* answer) {
    if (const sd_bus_error* error = answer ? sd_bus_message_get_error(answer) : nullptr)
      if (const auto code = codeOfBusName(error->name))
        return Error::errorWithDomain_code_reason(std::string(kNoticeErrorDomain), static_cast<std::int64_t>(*code),
                                                  error->message ? error->message : error->name);
    return errorOfAnswer(answer, NoticeError::noService);
  }

  RunLoop& _runLoop;
  std::unique_ptr<Bus> _bus;
  std::unique_ptr<NoticeBoard> _board;  // where nimbo-transit-notices is not installed
};

class Notices final : public NoticesPart {
  std::unique_ptr<NoticeHandOver> makeHandOver(RunLoop& runLoop) override {
    return std::make_unique<BusHandOver>(runLoop);
  }
};

}  // namespace

}  // namespace nimbo

extern "C" nimbo::NoticesPart* nimbo_notices() {
  static nimbo::Notices part;
  return &part;
}
