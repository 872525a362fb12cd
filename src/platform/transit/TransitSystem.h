#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>

#include "platform/transit/TransitArtwork.h"

namespace nimbo {

/// The network that a line belongs to: one for each agency. Immutable.
class TransitSystem final : public Object {
 public:
  TransitSystem(std::uint64_t muid, std::optional<std::string> name, TransitArtworkRef artwork)
      : _muid(muid), _name(std::move(name)), _artwork(std::move(artwork)) {}

  std::uint64_t muid() const { return _muid; }
  const std::optional<std::string>& name() const { return _name; }
  /// The symbol of the mode that all lines of the system share; null when they share none.
  const TransitArtworkRef& artwork() const { return _artwork; }

  std::string_view className() const override { return "TransitSystem"; }

 private:
  std::uint64_t _muid;
  std::optional<std::string> _name;
  TransitArtworkRef _artwork;
};

using TransitSystemRef = std::shared_ptr<const TransitSystem>;

}  // namespace nimbo
