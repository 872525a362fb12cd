#pragma once

#include "host/window/Page.h"
#include "host/window/PageContext.h"

namespace nimbo {

/// A line: its shield, its agency, and what happens on it.
class LinePage final : public Page {
 public:
  LinePage(const PageContext& context, const TransitLineItemRef& line);
};

/// A list of incidents, over all lines.
class IncidentListPage final : public Page {
 public:
  IncidentListPage(const PageContext& context, const TransitIncidents& incidents);
};

}  // namespace nimbo
