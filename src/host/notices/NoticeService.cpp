#include "host/notices/NoticeService.h"

#include <cstdint>
#include <string_view>
#include <utility>

#include "desktop/system/WindowProgram.h"
#include "host/notices/Wire.h"
#include "platform/SerialQueue.h"

namespace nimbo {

namespace {

/// Posts that wait for the notification service at once.
constexpr std::size_t kMostUnanswered = 100;

/// Source: the Desktop Entry Specification of freedesktop.org, "D-Bus Activation".
constexpr const char* kWindowName = "org.nimbo.Transit";
constexpr const char* kWindowObject = "/org/nimbo/Transit";
constexpr const char* kApplication = "org.freedesktop.Application";

/// Source: the D-Bus Specification of freedesktop.org, "Message Bus Messages".
constexpr const char* kBusName = "org.freedesktop.DBus";
constexpr const char* kBusObject = "/org/freedesktop/DBus";
constexpr const char* kLeaving =
    "type='signal',sender='org.freedesktop.DBus',path='/org/freedesktop/DBus',interface='org.freedesktop.DBus',"
    "member='NameOwnerChanged',arg2=''";

}  // namespace

const sd_bus_vtable NoticeService::kMethods[] = {SD_BUS_VTABLE_START(0),
                                                 SD_BUS_METHOD(
                                                     "Post", kNoticesSignature, "",
                                                     [](sd_bus_message* message, void* self, sd_bus_error*) {
                                                       return static_cast<NoticeService*>(self)->post(message);
                                                     },
                                                     SD_BUS_VTABLE_UNPRIVILEGED),
                                                 SD_BUS_METHOD(
                                                     "Close", "as", "",
                                                     [](sd_bus_message* message, void* self, sd_bus_error*) {
                                                       return static_cast<NoticeService*>(self)->close(message);
                                                     },
                                                     SD_BUS_VTABLE_UNPRIVILEGED),
                                                 SD_BUS_VTABLE_END};

NoticeService::NoticeService(RunLoop& runLoop, Bus& bus, Events events)
    : _runLoop(runLoop),
      _bus(bus),
      _events(std::move(events)),
      _board(runLoop, bus,
             {[this](const std::string& address, const std::string& token) { open(address, token); },
              [this] { considerEnd(); }}) {
  sd_bus_slot* object = nullptr;
  busResult(sd_bus_add_object_vtable(_bus.get(), &object, kNoticesObject, kNoticesInterface, kMethods, this));
  _object.reset(object);
  _bus.listen(kLeaving, [this](sd_bus_message* signal) {
    const char* name = nullptr;
    // Whoever else says so, the bus knows better.
    if (std::string_view(sd_bus_message_get_sender(signal)) == kBusName &&
        sd_bus_message_read(signal, "s", &name) >= 0 && _posters.erase(name) > 0)
      considerEnd();
  });
  requestName();
  considerEnd();
}

NoticeService::~NoticeService() {
  if (_linger) _linger->invalidate();
}

void NoticeService::requestName() {
  constexpr std::uint32_t kDoNotQueue = 4, kExists = 3;
  auto call = _bus.newCall(kBusName, kBusObject, kBusName, "RequestName");
  busResult(sd_bus_message_append(call.get(), "su", kNoticesName, kDoNotQueue));
  _bus.call(call, [this](sd_bus_message* answer) {
    std::uint32_t result = kExists;
    if (answer) sd_bus_message_read(answer, "u", &result);
    // With notices that stand it goes on under another one's nose, until they do not.
    if (result != kExists || isOfUse()) return;
    _events.tell(std::string("There is another ") + kNoticesName + " already.");
    _events.ended();
  });
}

void NoticeService::considerEnd() {
  if (isOfUse()) {
    if (_linger) std::exchange(_linger, nullptr)->invalidate();
  } else if (!_linger) {
    // Repeats, since the other kind of timer waits longer when the clock is set back.
    _linger = _runLoop.scheduleTimer(kLinger, true, [this](Timer& timer) {
      timer.invalidate();
      _linger = nullptr;
      releaseName();
    });
  }
}

/// Without the name first: what is posted from then on goes to the next one that the bus starts, and is not lost.
void NoticeService::releaseName() {
  auto call = _bus.newCall(kBusName, kBusObject, kBusName, "ReleaseName");
  busResult(sd_bus_message_append(call.get(), "s", kNoticesName));
  _bus.call(call, [this](sd_bus_message*) {
    if (isOfUse()) return requestName();
    _events.ended();
  });
}

NoticeCompletion NoticeService::replyTo(sd_bus_message* message) {
  ++_unanswered;
  return [this, call = std::shared_ptr<sd_bus_message>(sd_bus_message_ref(message), sd_bus_message_unref)](
             const ErrorRef& error) {
    --_unanswered;
    if (error) _events.tell(error->reason());
    // A program that has left hears no answer.
    if (error)
      sd_bus_reply_method_errorf(call.get(), busNameOfError(*error).c_str(), "%s", error->reason().c_str());
    else
      sd_bus_reply_method_return(call.get(), nullptr);
  };
}

int NoticeService::post(sd_bus_message* message) {
  runGuarded("post", [&] {
    const auto reply = replyTo(message);
    const auto notices = readNotices(message, NoticeBoard::kMostPosted);
    if (!notices || _unanswered > kMostUnanswered)
      return reply(noticeError(NoticeError::unfit, "more than 50 at once, or of an unknown urgency"));
    _posters.insert(sd_bus_message_get_sender(message));
    _board.post(*notices, reply);
    considerEnd();
  });
  return 1;
}

int NoticeService::close(sd_bus_message* message) {
  runGuarded("close", [&] {
    const auto reply = replyTo(message);
    const auto keys = readKeys(message, NoticeBoard::kMostClosed);
    if (!keys || _unanswered > kMostUnanswered) return reply(noticeError(NoticeError::unfit, "more than 10,000 keys"));
    _board.close(*keys, reply);
  });
  return 1;
}

void NoticeService::open(const std::string& address, const std::string& token) {
  auto call = _bus.newCall(kWindowName, kWindowObject, kApplication, "Open");
  sd_bus_message* const message = call.get();
  busResult(sd_bus_message_append(message, "as", 1, address.c_str()));
  // The window's toolkit knows the token by the one name on Wayland, by the other on X11.
  if (token.empty())
    busResult(sd_bus_message_append(message, "a{sv}", 0));
  else
    busResult(sd_bus_message_append(message, "a{sv}", 2, "activation-token", "s", token.c_str(), "desktop-startup-id",
                                    "s", token.c_str()));
  _bus.call(call, [this, address, token](sd_bus_message* answer) {
    const sd_bus_error* error = answer ? sd_bus_message_get_error(answer) : nullptr;
    if (!error) return;
    const bool isUnknown = sd_bus_error_has_name(error, SD_BUS_ERROR_SERVICE_UNKNOWN);
    const std::string problem =
        isUnknown ? startWindow({"--", address}, token) : std::string("cannot open the window: ") + error->name;
    if (!problem.empty()) _events.tell(problem);
  });
}

}  // namespace nimbo
