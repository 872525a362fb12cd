#pragma once

#include <functional>
#include <memory>

#include "host/ConditionsPart.h"

namespace nimbo {

/// What the desktop says of network and power. Asks nobody before the first question, since that takes memory and
/// time; where nobody knows, the network is there and costs nothing, and no power is saved. Main thread only.
class MachineConditions {
 public:
  /// `networkReturned` is called when the network changes to one that is there, from the first question on.
  explicit MachineConditions(std::function<void()> networkReturned) : _networkReturned(std::move(networkReturned)) {}

  /// Whether the network is metered or power is saved.
  bool areScarce();

 private:
  std::function<void()> _networkReturned;
  std::unique_ptr<ReportedConditions> _reported;
};

}  // namespace nimbo
