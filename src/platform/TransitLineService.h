#pragma once

#include <functional>
#include <memory>
#include <vector>

#include "platform/foundation/Error.h"
#include "platform/transit/MapItemIdentifier.h"
#include "platform/transit/TransitLine.h"

namespace nimbo {

/// Answers for lines: what they are now, with their incidents.
class TransitLineService {
 public:
  /// Exactly one of the two is set: an error, or the items found, in the order of the identifiers.
  using Handler = std::function<void(const TransitLineItems& items, const ErrorRef& error)>;

  virtual ~TransitLineService() = default;

  /// One lookup for all `identifiers`. Calls `handler` once, on the main queue, never before this returns; not at all
  /// when the service goes away first. Any thread. A line whose source has no fresh answer makes the lookup fail; a
  /// line that its source does not know any more is left out.
  virtual void lookup(const std::vector<MapItemIdentifierRef>& identifiers, Handler handler) = 0;
};

}  // namespace nimbo
