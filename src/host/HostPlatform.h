#pragma once

#include "desktop/DesktopPlatform.h"
#include "host/Commands.h"

namespace nimbo {

/// The platform of a host apart from the widget process: for feeds, favourites and settings. In force while
/// it lives. A command line opens no activities.
class HostPlatform final : private ActivityLauncher {
 public:
  /// `locale` is a BCP 47 tag or POSIX name; empty: the environment's. `notice` is told on any thread that a damaged
  /// state database was set aside; null: the context's `tell` is.
  explicit HostPlatform(const CommandContext& context, std::string locale = {}, StateDatabase::Notice notice = {})
      : _platform(
            {.paths = context.paths,
             .locale = std::move(locale),
             .runLoop = context.runLoop,
             .activityLauncher = *this,
             .notice = notice ? std::move(notice) : StateDatabase::Notice([tell = context.tell](const ErrorRef& error) {
               tell(error->reason());
             })}) {}

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
