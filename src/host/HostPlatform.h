#pragma once

#include "desktop/DesktopPlatform.h"
#include "host/Command.h"

namespace nimbo {

/// The platform of a host apart from the widget process: for feeds, favourites and settings. In force while
/// it lives. A command line opens no activities.
class HostPlatform final : private ActivityLauncher {
 public:
  /// `locale` is a BCP 47 tag or POSIX name; empty: the environment's.
  explicit HostPlatform(const CommandContext& context, std::string locale = {})
      : _platform({.paths = context.paths,
                   .locale = std::move(locale),
                   .runLoop = context.runLoop,
                   .activityLauncher = *this,
                   .notice = [tell = context.tell](const ErrorRef& notice) { tell(notice->reason()); }}) {}

  DesktopPlatform* operator->() { return &_platform; }

 private:
  std::shared_ptr<UserActivity> createUserActivity(const std::string&) override { return nullptr; }
  BundleRecordRef bundleRecordOfCurrentProcess() override { return nullptr; }
  void openUserActivity(const std::shared_ptr<const UserActivity>&, const ApplicationRecordRef&, bool,
                        Completion completion) override {
    if (completion) completion(false, nullptr);
  }

  DesktopPlatform _platform;
};

}  // namespace nimbo
