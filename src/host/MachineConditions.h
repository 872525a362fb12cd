#pragma once

#include <functional>

typedef struct _GNetworkMonitor GNetworkMonitor;
typedef struct _GPowerProfileMonitor GPowerProfileMonitor;

namespace nimbo {

/// What the desktop says of network and power. Asks nobody before the first question, since that takes memory and
/// time; where nobody knows, the network is there and costs nothing, and no power is saved. Main thread only.
class MachineConditions {
 public:
  /// `networkReturned` is called when the network changes to one that is there, from the first question on.
  explicit MachineConditions(std::function<void()> networkReturned) : _networkReturned(std::move(networkReturned)) {}
  ~MachineConditions();
  MachineConditions(const MachineConditions&) = delete;
  MachineConditions& operator=(const MachineConditions&) = delete;

  /// Whether the network is metered or power is saved.
  bool areScarce();

 private:
  std::function<void()> _networkReturned;
  GNetworkMonitor* _network = nullptr;     // GLib's own
  GPowerProfileMonitor* _power = nullptr;  // a reference
  unsigned long _handler = 0;
};

}  // namespace nimbo
