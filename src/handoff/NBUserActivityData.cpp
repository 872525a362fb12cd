#include "handoff/NBUserActivityData.h"

#include "handoff/ApplicationRecord+NimboExtras.h"
#include "platform/Platform.h"
#include "platform/UserSession.h"
#include "platform/foundation/Hash.h"

namespace nimbo {

NBUserActivityDataRef NBUserActivityData::initWithActivityType_userInfo(
    std::optional<std::string> activityType, const std::shared_ptr<const BoxedDictionary>& userInfo) {
  UserSession::prepareSharedSession(true, false);
  return NBUserActivityDataRef(
      new NBUserActivityData(std::move(activityType), UserSession::sharedSessionUserInfoForPunchoutUserInfo(userInfo)));
}

void NBUserActivityData::openInContext_completionHandler(Object*, Completion completion) const {
  ActivityLauncher& launcher = Platform::current().activityLauncher();
  const std::shared_ptr<UserActivity> activity = _activityType ? launcher.createUserActivity(*_activityType) : nullptr;
  if (!activity) {
    if (completion)
      completion(false, Error::errorWithDomain_code_userInfo(
                            std::string(kNBUserActivityErrorDomain), 0,
                            {{std::string(kNBUserActivityErrorMissingActivityKey), shared_from_this()}}));
    return;
  }
  activity->setUserInfo(_userInfo);
  ErrorRef error;
  const ApplicationRecordRef application = _nimbo_containingApplicationProxy(&error);
  if (error) {
    if (completion) completion(false, error);
    return;
  }
  launcher.openUserActivity(activity, application, true, std::move(completion));
}

bool NBUserActivityData::isEqualToUserActivityData(const NBUserActivityData& other) const {
  return _activityType == other._activityType && absentOrEqual(_userInfo, other._userInfo);
}

bool NBUserActivityData::isEqual(const Object* other) const {
  const auto* data = instanceOf<NBUserActivityData>(other);
  return data && isEqualToUserActivityData(*data);
}

std::uint64_t NBUserActivityData::hash() const {
  return (_activityType ? hashOfBytes(*_activityType) : 0) ^ hashOf(_userInfo);
}

}  // namespace nimbo
