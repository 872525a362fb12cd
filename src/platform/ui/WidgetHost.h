#pragma once

#include <functional>
#include <limits>

#include "platform/foundation/Geometry.h"
#include "platform/foundation/Presentation.h"
#include "platform/foundation/URL.h"

namespace nimbo {

class VisualEffect;

/// The program that shows the widget, as the widget sees it. Main thread only.
class WidgetHost {
 public:
  virtual ~WidgetHost() = default;

  virtual WidgetDisplayMode activeDisplayMode() const = 0;
  /// The most room that a mode gives, in points.
  virtual Size maximumSizeForDisplayMode(WidgetDisplayMode mode) const = 0;
  /// Compact keeps the host from offering to expand the widget. Expanded until set.
  virtual void setLargestAvailableDisplayMode(WidgetDisplayMode mode) = 0;
  virtual WidgetDisplayMode largestAvailableDisplayMode() const = 0;
  /// Asks the host to open a URL; `completion` hears once, on the main thread, whether it was opened.
  virtual void openURL(const URL& url, std::function<void(bool opened)> completion) = 0;
  /// The host heard that the widget wants another size, in points.
  virtual void preferredContentSizeDidChange(Size size) = 0;
};

}  // namespace nimbo
