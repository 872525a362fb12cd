#include "host/MachineConditions.h"

#include <gio/gio.h>

namespace nimbo {

MachineConditions::~MachineConditions() {
  if (_network) g_signal_handler_disconnect(_network, _handler);
  if (_power) g_object_unref(_power);
}

bool MachineConditions::areScarce() {
  if (!_network) {
    _network = g_network_monitor_get_default();
    _power = g_power_profile_monitor_dup_default();
    const auto changed = +[](GNetworkMonitor*, gboolean isAvailable, gpointer self) {
      if (isAvailable) static_cast<MachineConditions*>(self)->_networkReturned();
    };
    _handler = g_signal_connect(_network, "network-changed", reinterpret_cast<GCallback>(changed), this);
  }
  return g_network_monitor_get_network_metered(_network) || g_power_profile_monitor_get_power_saver_enabled(_power);
}

}  // namespace nimbo
