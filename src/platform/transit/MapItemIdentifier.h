#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>

#include "platform/foundation/Object.h"
#include "platform/transit/TransitArtwork.h"

namespace nimbo {

/// How a line is found in the data that an agency publishes, also after the agency renumbered its routes.
struct TransitLineLocator {
  std::string feed;       ///< name of the feed as the user set it up
  std::string agencyID;   ///< agency_id of the static feed; may be empty in a feed of one agency
  std::string routeID;    ///< route_id of the static feed
  std::string shortName;  ///< route_short_name, may be empty
  TransitMode mode = TransitMode::unknown;

  bool operator==(const TransitLineLocator&) const = default;
};

/// Identifies a map item to the service: its number, and where it was found. Equal when the numbers are.
class MapItemIdentifier final : public Object {
 public:
  explicit MapItemIdentifier(std::uint64_t muid, std::optional<TransitLineLocator> locator = {})
      : _muid(muid), _locator(std::move(locator)) {}

  std::uint64_t muid() const { return _muid; }
  /// Absent for an identifier that is only a number.
  const std::optional<TransitLineLocator>& locator() const { return _locator; }

  std::string_view className() const override { return "MapItemIdentifier"; }
  bool isEqual(const Object* other) const override {
    const auto* identifier = instanceOf<MapItemIdentifier>(other);
    return identifier && identifier->_muid == _muid;
  }
  std::uint64_t hash() const override { return _muid; }
  std::string description() const override { return std::to_string(_muid); }

 private:
  std::uint64_t _muid;
  std::optional<TransitLineLocator> _locator;
};

using MapItemIdentifierRef = std::shared_ptr<const MapItemIdentifier>;

}  // namespace nimbo
