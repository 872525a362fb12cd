#pragma once

#include <map>
#include <memory>

#include "desktop/rpc/JSONRPCConnection.h"
#include "platform/UserActivity.h"
#include "platform/ui/WidgetHost.h"
#include "protocol/Coding.h"
#include "protocol/Methods.h"

namespace nimbo {

/// Tells the host something.
template <class Params>
void notify(JSONRPCConnection& connection, const protocol::Notification<Params>& notification, const Params& params) {
  connection.notify(notification.name, protocol::write(params));
}

/// The host at the other end of the connection, as the widget sees it: its modes and sizes, and what it opens. Main
/// thread only; the connection outlives it.
class RemoteHost final : public WidgetHost, public ActivityLauncher {
 public:
  explicit RemoteHost(JSONRPCConnection& connection) : _connection(connection) {}

  void setActiveDisplayMode(WidgetDisplayMode mode) { _activeDisplayMode = mode; }
  void setMaximumSize(WidgetDisplayMode mode, Size size) { _maximumSizes[mode] = size; }
  void setMaximumSizes(const protocol::DisplayModes& sizes) {
    _maximumSizes = {{WidgetDisplayMode::Compact, sizes.compact}, {WidgetDisplayMode::Expanded, sizes.expanded}};
  }
  void setBundleRecord(BundleRecordRef record) { _bundleRecord = std::move(record); }
  /// Hears each new preferred size, before the host does.
  void setPreferredSizeObserver(std::function<void(Size)> observer) { _preferredSizeObserver = std::move(observer); }
  /// Hears of each change of the rows: with each the widget says anew what its largest mode is.
  void setContentObserver(std::function<void()> observer) { _contentObserver = std::move(observer); }

  WidgetDisplayMode activeDisplayMode() const override { return _activeDisplayMode; }
  /// 0 by 0 for a mode of which the host said nothing.
  Size maximumSizeForDisplayMode(WidgetDisplayMode mode) const override;
  void setLargestAvailableDisplayMode(WidgetDisplayMode mode) override;
  WidgetDisplayMode largestAvailableDisplayMode() const override { return _largestAvailableDisplayMode; }
  void openURL(const URL& url, std::function<void(bool opened)> completion) override;
  void preferredContentSizeDidChange(Size size) override;

  std::shared_ptr<UserActivity> createUserActivity(const std::string& activityType) override;
  BundleRecordRef bundleRecordOfCurrentProcess() override { return _bundleRecord; }
  void openUserActivity(const std::shared_ptr<const UserActivity>& activity, const ApplicationRecordRef& application,
                        bool requireUnlockPrompt, Completion completion) override;

 private:
  JSONRPCConnection& _connection;
  WidgetDisplayMode _activeDisplayMode = WidgetDisplayMode::Compact;
  WidgetDisplayMode _largestAvailableDisplayMode = WidgetDisplayMode::Expanded;
  std::map<WidgetDisplayMode, Size> _maximumSizes;
  BundleRecordRef _bundleRecord;
  std::function<void(Size)> _preferredSizeObserver;
  std::function<void()> _contentObserver;
};

}  // namespace nimbo
