#include "process/RemoteHost.h"

#include "process/Parameters.h"
#include "process/Snapshot.h"

namespace nimbo {

using nlohmann::json;

namespace {

/// Domain of the errors that a host reports for an opening.
constexpr const char* kHostErrorDomain = "WidgetHostErrorDomain";

bool isOpened(const json& result) { return result.is_object() && result.value("opened", json(false)) == json(true); }

ErrorRef hostError(const json& result, const std::optional<JSONRPCError>& failure) {
  if (failure) return Error::errorWithDomain_code_reason(kHostErrorDomain, failure->code, failure->message);
  if (isOpened(result)) return nullptr;
  const bool saysWhy = result.is_object() && result.contains("error") && result["error"].is_string();
  return Error::errorWithDomain_code_reason(kHostErrorDomain, 0,
                                            saysWhy ? result["error"] : "the host did not open it");
}

}  // namespace

Size RemoteHost::maximumSizeForDisplayMode(WidgetDisplayMode mode) const {
  const auto size = _maximumSizes.find(mode);
  return size == _maximumSizes.end() ? Size{} : size->second;
}

void RemoteHost::setLargestAvailableDisplayMode(WidgetDisplayMode mode) {
  if (_contentObserver) _contentObserver();
  if (mode == _largestAvailableDisplayMode) return;
  _largestAvailableDisplayMode = mode;
  _connection.notify("largestAvailableDisplayModeDidChange", {{"mode", nameOfDisplayMode(mode)}});
}

void RemoteHost::preferredContentSizeDidChange(Size size) {
  if (_preferredSizeObserver) _preferredSizeObserver(size);
  _connection.notify("preferredContentSizeDidChange", {{"size", {size.width, size.height}}});
}

void RemoteHost::openURL(const URL& url, std::function<void(bool)> completion) {
  _connection.call("openURL", {{"url", url.absoluteString()}},
                   [completion = std::move(completion)](const json& result, const auto& failure) {
                     completion(!failure && isOpened(result));
                   });
}

std::shared_ptr<UserActivity> RemoteHost::createUserActivity(const std::string& activityType) {
  return activityType.empty() ? nullptr : std::make_shared<UserActivity>(activityType);
}

void RemoteHost::openUserActivity(const std::shared_ptr<const UserActivity>& activity,
                                  const ApplicationRecordRef& application, bool requireUnlockPrompt,
                                  Completion completion) {
  const json params = {{"activityType", activity->activityType()},
                       {"userInfo", userInfoJSON(activity->userInfo().get())},
                       {"application", application ? json(application->identifier()) : json()},
                       {"requireUnlockPrompt", requireUnlockPrompt}};
  _connection.call("openUserActivity", params,
                   [this, completion = std::move(completion)](const json& result, const auto& failure) {
                     // Such as when there are too many incidents to hand over: the tap would seem to do nothing.
                     if (failure)
                       _connection.notify("notice", {{"message", "Cannot open it: " + failure->message + "."}});
                     if (completion) completion(!failure && isOpened(result), hostError(result, failure));
                   });
}

}  // namespace nimbo
