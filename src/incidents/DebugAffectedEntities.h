#pragma once

#include <memory>

#include "platform/transit/TransitIncident.h"

namespace nimbo {

/// The line that a made-up incident affects, whole.
class DebugAffectedEntities final : public TransitIncidentAffectedEntity {
 public:
  static std::shared_ptr<const DebugAffectedEntities> initWithMuid(std::uint64_t muid) {
    return std::make_shared<const DebugAffectedEntities>(muid);
  }
  explicit DebugAffectedEntities(std::uint64_t muid) : _muid(muid) {}

  std::uint64_t muid() const override { return _muid; }
  bool hasNextStopIDs() const override { return false; }
  std::optional<std::vector<std::uint64_t>> nextStopIDs() const override { return std::nullopt; }

  std::string_view className() const override { return "DebugAffectedEntities"; }

 private:
  std::uint64_t _muid;
};

}  // namespace nimbo
