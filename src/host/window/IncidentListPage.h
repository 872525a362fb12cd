#pragma once

#include "host/window/Page.h"
#include "host/window/PageContext.h"

namespace nimbo {

/// A list of incidents, over all lines.
class IncidentListPage final : public Page {
 public:
  IncidentListPage(const PageContext& context, const TransitIncidents& incidents);
};

}  // namespace nimbo
