#pragma once

#include <functional>
#include <memory>
#include <string>

#include "platform/foundation/Boxed.h"
#include "platform/foundation/Error.h"

namespace nimbo {

/// What one application hands to another: a type and details by key.
class UserActivity final : public Object {
 public:
  explicit UserActivity(std::string activityType) : _activityType(std::move(activityType)) {}

  const std::string& activityType() const { return _activityType; }
  /// Null until set.
  const std::shared_ptr<const BoxedDictionary>& userInfo() const { return _userInfo; }
  void setUserInfo(std::shared_ptr<const BoxedDictionary> userInfo) { _userInfo = std::move(userInfo); }

  std::string_view className() const override { return "UserActivity"; }

 private:
  std::string _activityType;
  std::shared_ptr<const BoxedDictionary> _userInfo;
};

/// What the system knows of an installed program.
class BundleRecord : public Object {
 public:
  explicit BundleRecord(std::string identifier) : _identifier(std::move(identifier)) {}
  const std::string& identifier() const { return _identifier; }
  std::string_view className() const override { return "BundleRecord"; }

 private:
  std::string _identifier;
};

using BundleRecordRef = std::shared_ptr<const BundleRecord>;

class ApplicationRecord final : public BundleRecord {
 public:
  using BundleRecord::BundleRecord;
  std::string_view className() const override { return "ApplicationRecord"; }
};

using ApplicationRecordRef = std::shared_ptr<const ApplicationRecord>;

/// A program that lives inside another one.
class ExtensionRecord final : public BundleRecord {
 public:
  ExtensionRecord(std::string identifier, BundleRecordRef containingBundle)
      : BundleRecord(std::move(identifier)), _containingBundle(std::move(containingBundle)) {}
  /// The program that contains the extension, or null.
  const BundleRecordRef& containingBundle() const { return _containingBundle; }
  std::string_view className() const override { return "ExtensionRecord"; }

 private:
  BundleRecordRef _containingBundle;
};

/// Opens activities in other applications. Main thread only.
class ActivityLauncher {
 public:
  using Completion = std::function<void(bool opened, const ErrorRef& error)>;

  virtual ~ActivityLauncher() = default;

  /// A new activity, or null when the system refuses the type.
  virtual std::shared_ptr<UserActivity> createUserActivity(const std::string& activityType) = 0;

  /// The record of the running program: an application, an extension, another kind, or null.
  virtual BundleRecordRef bundleRecordOfCurrentProcess() = 0;

  /// Opens the activity in `application`, or where the system sees fit when that is null. Calls `completion`, when
  /// there is one, once on the main thread.
  virtual void openUserActivity(const std::shared_ptr<const UserActivity>& activity,
                                const ApplicationRecordRef& application, bool requireUnlockPrompt,
                                Completion completion) = 0;
};

}  // namespace nimbo
