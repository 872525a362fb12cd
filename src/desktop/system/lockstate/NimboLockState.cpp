#include "desktop/system/lockstate/NimboLockState.h"

#include <systemd/sd-bus.h>

#include <chrono>
#include <memory>

namespace {

using Clock = std::chrono::steady_clock;

struct BusDeleter {
  void operator()(sd_bus* bus) const { sd_bus_close_unref(bus); }
};
struct MessageDeleter {
  void operator()(sd_bus_message* message) const { sd_bus_message_unref(message); }
};

struct Answer {
  bool arrived = false;
  int locked = 0;
};

int takeAnswer(sd_bus_message* message, void* data, sd_bus_error*) {
  auto& answer = *static_cast<Answer*>(data);
  answer.arrived = true;
  if (sd_bus_message_is_method_error(message, nullptr) || sd_bus_message_read(message, "v", "b", &answer.locked) < 0)
    answer.locked = 0;
  return 0;
}

int ask() {
  sd_bus* opened = nullptr;
  if (sd_bus_open_system(&opened) < 0) return 0;
  const std::unique_ptr<sd_bus, BusDeleter> bus(opened);

  sd_bus_message* made = nullptr;
  if (sd_bus_message_new_method_call(bus.get(), &made, "org.freedesktop.login1", "/org/freedesktop/login1/session/auto",
                                     "org.freedesktop.DBus.Properties", "Get") < 0)
    return 0;
  const std::unique_ptr<sd_bus_message, MessageDeleter> message(made);
  Answer answer;
  // Where no login manager runs, none is to be started for this.
  if (sd_bus_message_set_auto_start(made, 0) < 0 ||
      sd_bus_message_append(made, "ss", "org.freedesktop.login1.Session", "LockedHint") < 0 ||
      sd_bus_call_async(bus.get(), nullptr, made, takeAnswer, &answer, 0) < 0)
    return 0;

  // Not sd_bus_call: that waits without bound for a bus that accepts the connection and then says nothing.
  const auto deadline = Clock::now() + std::chrono::milliseconds(500);
  while (!answer.arrived) {
    const int worked = sd_bus_process(bus.get(), nullptr);
    if (worked < 0) return 0;
    if (worked > 0) continue;
    const auto left = std::chrono::duration_cast<std::chrono::microseconds>(deadline - Clock::now()).count();
    if (left <= 0 || sd_bus_wait(bus.get(), static_cast<uint64_t>(left)) < 0) return 0;
  }
  return answer.locked ? 1 : 0;
}

}  // namespace

int nimbo_getDeviceLockState(void) { return ask(); }
