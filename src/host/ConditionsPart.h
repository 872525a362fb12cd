#pragma once

#include <functional>
#include <memory>

namespace nimbo {

/// The desktop's word on network and power.
class ReportedConditions {
 public:
  virtual ~ReportedConditions() = default;
  /// Whether the network is metered or power is saved.
  virtual bool areScarce() = 0;
};

/// What libnimbo-conditions does, the part with GIO (desktop/system/LatePart.h). Main thread only.
class ConditionsPart {
 public:
  virtual ~ConditionsPart() = default;
  /// `networkReturned` is called when the network changes to one that is there, as long as the answer lives.
  virtual std::unique_ptr<ReportedConditions> listen(std::function<void()> networkReturned) = 0;
};

}  // namespace nimbo
