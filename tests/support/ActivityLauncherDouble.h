#pragma once

#include <vector>

#include "platform/RunLoop.h"
#include "platform/UserActivity.h"

namespace nimbo {

/// Records what is opened and answers as the test sets. Main thread.
class ActivityLauncherDouble final : public ActivityLauncher {
 public:
  struct Opened {
    std::shared_ptr<const UserActivity> activity;
    ApplicationRecordRef application;
    bool requireUnlockPrompt;
  };

  explicit ActivityLauncherDouble(RunLoop& loop) : _loop(loop) {}

  std::shared_ptr<UserActivity> createUserActivity(const std::string& activityType) override {
    return refusesToCreate ? nullptr : std::make_shared<UserActivity>(activityType);
  }
  BundleRecordRef bundleRecordOfCurrentProcess() override { return bundleRecord; }
  void openUserActivity(const std::shared_ptr<const UserActivity>& activity, const ApplicationRecordRef& application,
                        bool requireUnlockPrompt, Completion completion) override {
    opened.push_back({activity, application, requireUnlockPrompt});
    if (completion) _loop.dispatchAsync([this, completion] { completion(!error, error); });
  }

  bool refusesToCreate = false;
  BundleRecordRef bundleRecord;
  ErrorRef error;  ///< what opening fails with; null: it succeeds
  std::vector<Opened> opened;

 private:
  RunLoop& _loop;
};

}  // namespace nimbo
