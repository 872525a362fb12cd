#pragma once

#include "host/window/Page.h"
#include "host/window/PageContext.h"

namespace nimbo {

/// A line: its shield, its agency, and what happens on it.
class LinePage final : public Page {
 public:
  LinePage(const PageContext& context, const TransitLineItemRef& line);
};

}  // namespace nimbo
