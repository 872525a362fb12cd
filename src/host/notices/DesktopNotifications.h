#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "host/notices/Bus.h"
#include "host/notices/Notice.h"
#include "host/notices/NoticeError.h"

namespace nimbo {

/// The desktop's notification service, which the bus starts where it knows how to. Main thread only.
/// Source: Desktop Notifications Specification 1.2 of freedesktop.org, whose sections the code names.
class DesktopNotifications {
 public:
  /// One notification. Numbers are a service's own, and begin anew with another one.
  struct Reference {
    std::string service;  ///< unique name on the bus
    std::uint32_t id = 0;
    bool operator==(const Reference&) const = default;
  };
  struct Events {
    /// It stands no more, for whatever reason.
    std::function<void(const Reference&)> closed;
    /// It was clicked; with the token of XDG Activation that the desktop gave for what opens now, or an empty one.
    std::function<void(const Reference&, const std::string& token)> clicked;
    /// The service left the bus, and nothing of it stands any more.
    std::function<void(const std::string& service)> left;
  };

  /// The bus outlives this.
  DesktopNotifications(Bus& bus, Events events);

  /// Shows a notice, in the place of `replaced` where that has a number. Answers with what stands then, as late as the
  /// service does. Throws std::system_error for texts that are no UTF-8.
  void show(const Notice& notice, bool takesClicks, const Reference& replaced,
            std::function<void(const Outcome<Reference>&)> done);
  /// Takes one away. Answers when it stands no more.
  void close(const Reference& reference, std::function<void()> done);

 private:
  /// What the service can do ("GetCapabilities").
  struct Abilities {
    bool actions = false, body = false, bodyMarkup = false;
  };

  void withAbilities(NoticeCompletion ready);
  void takeAbilities(sd_bus_message* answer);
  BusMessageHandle callToShow(const Notice& notice, bool takesClicks, const Reference& replaced) const;
  void takeSignal(sd_bus_message* signal);

  Bus& _bus;
  Events _events;
  std::optional<Abilities> _abilities;
  std::vector<NoticeCompletion> _waiting;  // for abilities
  Reference _tokenOf;
  std::string _token;
};

/// The error in an answer of the bus, null with none. Null as an answer is an error too.
ErrorRef errorOfAnswer(sd_bus_message* answer, NoticeError unknownService);

}  // namespace nimbo
