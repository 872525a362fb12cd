#include "host/notices/DesktopNotifications.h"

#include <algorithm>
#include <memory>
#include <string_view>
#include <utility>

namespace nimbo {

namespace {

constexpr const char* kService = "org.freedesktop.Notifications";
constexpr const char* kObject = "/org/freedesktop/Notifications";
constexpr const char* kInterface = "org.freedesktop.Notifications";
constexpr const char* kSignals =
    "type='signal',sender='org.freedesktop.Notifications',path='/org/freedesktop/Notifications',"
    "interface='org.freedesktop.Notifications'";
constexpr std::string_view kBus = "org.freedesktop.DBus";
constexpr const char* kOwnerChanges =
    "type='signal',sender='org.freedesktop.DBus',path='/org/freedesktop/DBus',interface='org.freedesktop.DBus',"
    "member='NameOwnerChanged',arg0='org.freedesktop.Notifications'";

/// The key of the action that a click on the notification itself is ("Actions").
constexpr const char* kClick = "default";

std::string senderOf(sd_bus_message* message) {
  const char* sender = sd_bus_message_get_sender(message);
  return sender ? sender : "";
}

std::string escapedForMarkup(const std::string& text) {
  const std::unique_ptr<char, decltype(&g_free)> escaped(g_markup_escape_text(text.c_str(), -1), &g_free);
  return escaped.get();
}

/// The level of the hint "urgency" ("Urgency Levels"). What replaces a notification pops up anew on some desktops,
/// which keep low urgency for what must not; what is critical stands on the screen still.
std::uint8_t urgencyOf(const Notice& notice) {
  if (notice.silent && notice.urgency != Notice::Urgency::critical) return 0;
  return static_cast<std::uint8_t>(notice.urgency);
}

ErrorRef nonsense(const char* member) {
  return noticeError(NoticeError::refused, std::string("nonsense is the answer to ") + member);
}

}  // namespace

ErrorRef errorOfAnswer(sd_bus_message* answer, NoticeError unknownService) {
  if (!answer) return noticeError(NoticeError::noBus);
  const sd_bus_error* error = sd_bus_message_get_error(answer);
  if (!error) return nullptr;
  if (sd_bus_error_has_name(error, SD_BUS_ERROR_SERVICE_UNKNOWN)) return noticeError(unknownService);
  const std::string detail = std::string(error->name) + (error->message ? std::string(" ") + error->message : "");
  const bool isSilent = sd_bus_error_has_names(error, SD_BUS_ERROR_NO_REPLY, SD_BUS_ERROR_TIMEOUT);
  return noticeError(isSilent ? NoticeError::noAnswer : NoticeError::refused, detail);
}

DesktopNotifications::DesktopNotifications(Bus& bus, Events events) : _bus(bus), _events(std::move(events)) {
  _bus.listen(kSignals, [this](sd_bus_message* signal) { takeSignal(signal); });
  _bus.listen(kOwnerChanges, [this](sd_bus_message* signal) {
    const char *name = nullptr, *before = nullptr, *after = nullptr;
    if (senderOf(signal) != kBus || sd_bus_message_read(signal, "sss", &name, &before, &after) < 0) return;
    _abilities.reset();
    if (*before) _events.left(before);
  });
}

void DesktopNotifications::takeSignal(sd_bus_message* signal) {
  // Whose it is the receiver of the event compares: only the service that gave a number may speak of it.
  Reference reference{senderOf(signal)};
  const char* text = nullptr;
  std::uint32_t reason = 0;
  if (sd_bus_message_is_signal(signal, kInterface, "NotificationClosed") > 0) {
    if (sd_bus_message_read(signal, "uu", &reference.id, &reason) >= 0) _events.closed(reference);
  } else if (sd_bus_message_is_signal(signal, kInterface, "ActivationToken") > 0) {
    if (sd_bus_message_read(signal, "us", &reference.id, &text) < 0) return;
    _tokenOf = reference;
    _token = text;
  } else if (sd_bus_message_is_signal(signal, kInterface, "ActionInvoked") > 0) {
    if (sd_bus_message_read(signal, "us", &reference.id, &text) < 0 || std::string_view(text) != kClick) return;
    _events.clicked(reference, _tokenOf == reference ? std::exchange(_token, {}) : std::string());
  }
}

void DesktopNotifications::withAbilities(NoticeCompletion ready) {
  if (_abilities) return ready(nullptr);
  _waiting.push_back(std::move(ready));
  if (_waiting.size() > 1) return;
  _bus.call(_bus.newCall(kService, kObject, kInterface, "GetCapabilities"),
            [this](sd_bus_message* answer) { takeAbilities(answer); });
}

void DesktopNotifications::takeAbilities(sd_bus_message* answer) {
  ErrorRef error = errorOfAnswer(answer, NoticeError::noService);
  if (!error && sd_bus_message_enter_container(answer, 'a', "s") < 0) error = nonsense("GetCapabilities");
  if (!error) {
    Abilities abilities;
    for (const char* name = nullptr; sd_bus_message_read(answer, "s", &name) > 0;) {
      if (std::string_view(name) == "actions") abilities.actions = true;
      if (std::string_view(name) == "body") abilities.body = true;
      if (std::string_view(name) == "body-markup") abilities.bodyMarkup = true;
    }
    _abilities = abilities;
  }
  for (const auto& ready : std::exchange(_waiting, {})) ready(error);
}

BusMessageHandle DesktopNotifications::callToShow(const Notice& notice, bool takesClicks,
                                                  const Reference& replaced) const {
  auto call = _bus.newCall(kService, kObject, kInterface, "Notify");
  std::string title = notice.title, body = notice.body;
  if (!_abilities->body && !body.empty()) title += " – " + std::exchange(body, {});
  std::ranges::replace(title, '\n', ' ');
  if (_abilities->bodyMarkup) body = escapedForMarkup(body);
  sd_bus_message* const message = call.get();
  // Program, what it replaces, icon (both as in the desktop entry), summary, body.
  busResult(sd_bus_message_append(message, "susss", "Nimbo Transit", replaced.id, "org.nimbo.Transit", title.c_str(),
                                  body.c_str()));
  if (takesClicks && _abilities->actions) {
    busResult(sd_bus_message_append(message, "as", 2, kClick, ""));
  } else {
    busResult(sd_bus_message_append(message, "as", 0));
  }
  // "Hints", and a category of one's own ("Categories"); the desktop chooses how long it shows (-1).
  busResult(sd_bus_message_append(message, "a{sv}i", 4, "urgency", "y", urgencyOf(notice), "desktop-entry", "s",
                                  "org.nimbo.Transit", "category", "s", "x-nimbo.incident", "suppress-sound", "b",
                                  static_cast<int>(notice.silent), -1));
  return call;
}

void DesktopNotifications::show(const Notice& notice, bool takesClicks, const Reference& replaced,
                                std::function<void(const Outcome<Reference>&)> done) {
  withAbilities([this, notice, takesClicks, replaced, done = std::move(done)](const ErrorRef& error) {
    if (error) return done(error);
    _bus.call(callToShow(notice, takesClicks, replaced), [done](sd_bus_message* answer) {
      if (ErrorRef failure = errorOfAnswer(answer, NoticeError::noService)) return done(failure);
      Reference reference{senderOf(answer)};
      if (sd_bus_message_read(answer, "u", &reference.id) < 0 || reference.id == 0) return done(nonsense("Notify"));
      done(reference);
    });
  });
}

void DesktopNotifications::close(const Reference& reference, std::function<void()> done) {
  auto call = _bus.newCall(reference.service.c_str(), kObject, kInterface, "CloseNotification");
  busResult(sd_bus_message_append(call.get(), "u", reference.id));
  // An error says that it stood no more.
  _bus.call(call, [done = std::move(done)](sd_bus_message*) { done(); });
}

}  // namespace nimbo
