#pragma once

#include <vector>

#include "platform/ui/ViewController.h"
#include "platform/ui/WidgetHost.h"

namespace nimbo {

/// A host that a test sets and reads.
class WidgetHostDouble final : public WidgetHost {
 public:
  WidgetDisplayMode activeDisplayMode() const override { return activeMode; }
  Size maximumSizeForDisplayMode(WidgetDisplayMode mode) const override {
    return mode == WidgetDisplayMode::Compact ? compactMaximum : expandedMaximum;
  }
  void setLargestAvailableDisplayMode(WidgetDisplayMode mode) override { largestMode = mode; }
  WidgetDisplayMode largestAvailableDisplayMode() const override { return largestMode; }
  void openURL(const URL& url, std::function<void(bool opened)> completion) override {
    openedURLs.push_back(url);
    completion(opens);
  }
  void preferredContentSizeDidChange(Size size) override { preferredSizes.push_back(size); }

  WidgetDisplayMode activeMode = WidgetDisplayMode::Compact;
  WidgetDisplayMode largestMode = WidgetDisplayMode::Expanded;
  Size compactMaximum{359, 110};
  Size expandedMaximum{359, 616};
  bool opens = true;  ///< what `openURL` reports
  std::vector<URL> openedURLs;
  std::vector<Size> preferredSizes;
};

/// A controller that does nothing.
class ViewControllerDouble final : public ViewController {
 public:
  explicit ViewControllerDouble(WidgetHost* host) : ViewController("", "", host) {}
  std::string_view className() const override { return "ViewControllerDouble"; }
};

}  // namespace nimbo
