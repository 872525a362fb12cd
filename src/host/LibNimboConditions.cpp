// libnimbo-conditions.so: what ConditionsPart.h declares.

#include <gio/gio.h>

#include <utility>

#include "host/ConditionsPart.h"

namespace nimbo {

namespace {

class GIOConditions final : public ReportedConditions {
 public:
  explicit GIOConditions(std::function<void()> networkReturned)
      : _networkReturned(std::move(networkReturned)),
        _network(g_network_monitor_get_default()),
        _power(g_power_profile_monitor_dup_default()) {
    const auto changed = +[](GNetworkMonitor*, gboolean isAvailable, gpointer self) {
      if (isAvailable) static_cast<GIOConditions*>(self)->_networkReturned();
    };
    _handler = g_signal_connect(_network, "network-changed", reinterpret_cast<GCallback>(changed), this);
  }
  ~GIOConditions() override {
    g_signal_handler_disconnect(_network, _handler);
    g_object_unref(_power);
  }
  GIOConditions(const GIOConditions&) = delete;
  GIOConditions& operator=(const GIOConditions&) = delete;

  bool areScarce() override {
    return g_network_monitor_get_network_metered(_network) || g_power_profile_monitor_get_power_saver_enabled(_power);
  }

 private:
  std::function<void()> _networkReturned;
  GNetworkMonitor* _network;     // GLib's own
  GPowerProfileMonitor* _power;  // a reference
  unsigned long _handler = 0;
};

class Conditions final : public ConditionsPart {
  std::unique_ptr<ReportedConditions> listen(std::function<void()> networkReturned) override {
    return std::make_unique<GIOConditions>(std::move(networkReturned));
  }
};

}  // namespace

}  // namespace nimbo

extern "C" nimbo::ConditionsPart* nimbo_conditions() {
  static nimbo::Conditions part;
  return &part;
}
