#pragma once

#include <glib.h>
#include <systemd/sd-bus.h>

#include <functional>
#include <list>
#include <memory>
#include <vector>

#include "platform/foundation/Outcome.h"

namespace nimbo {

struct BusReleaser {
  void operator()(sd_bus* bus) const { sd_bus_close_unref(bus); }
  void operator()(sd_bus_message* message) const { sd_bus_message_unref(message); }
  void operator()(sd_bus_slot* slot) const { sd_bus_slot_unref(slot); }
};
using BusHandle = std::unique_ptr<sd_bus, BusReleaser>;
using BusMessageHandle = std::unique_ptr<sd_bus_message, BusReleaser>;
using BusSlotHandle = std::unique_ptr<sd_bus_slot, BusReleaser>;

/// Throws std::system_error for the negative number with which functions of sd-bus tell a failure: of memory, or of the
/// caller.
int busResult(int result);

/// A connection to the user's session bus, which GLib's default main context serves; nothing waits for the bus. What
/// callbacks throw is logged. Main thread only; not to be destroyed by its own callbacks.
class Bus {
 public:
  /// Null: the connection has ended without an answer.
  using Answer = std::function<void(sd_bus_message* answer)>;
  using Listener = std::function<void(sd_bus_message* signal)>;

  /// Connects; an error of `NoticeError` where there is no bus.
  static Outcome<std::unique_ptr<Bus>> open();
  ~Bus();
  Bus(const Bus&) = delete;
  Bus& operator=(const Bus&) = delete;

  /// For what has no name here.
  sd_bus* get() const { return _bus.get(); }
  /// False once the bus has gone: nothing comes of this any more.
  bool isOpen() const { return _source != nullptr; }
  /// Told once, when the bus has gone.
  void onEnd(std::function<void()> ended) { _ended = std::move(ended); }

  BusMessageHandle newCall(const char* destination, const char* path, const char* interface, const char* member) const;
  /// Sends; the answer may be an error, and may be very late. Never before the call returns.
  void call(const BusMessageHandle& message, Answer answer);
  /// Hears signals that match a rule, from whoever sends them: the bus delivers to a receiver that is named in the
  /// message what no rule asked for.
  void listen(const char* rule, Listener listener);

 private:
  struct Source;
  struct Call {
    Bus* bus;
    Answer answer;
    BusSlotHandle slot;
  };
  using Calls = std::list<Call>;

  explicit Bus(BusHandle bus);
  bool prepare(int* timeout);
  bool isReady() const;
  void work();
  void end();
  static int takeAnswer(sd_bus_message* message, void* call, sd_bus_error*);

  BusHandle _bus;
  GSource* _source = nullptr;
  void* _descriptor = nullptr;  // of the source
  int _fd = -1;
  std::function<void()> _ended;
  Calls _calls;
  std::list<Listener> _listeners;
  std::vector<BusSlotHandle> _listening;
};

}  // namespace nimbo
