#include "handoff/NBUserActivityData.h"

#include <algorithm>

#include "handoff/ApplicationRecord+NimboExtras.h"
#include "handoff/Bytes+NimboExtra.h"
#include "handoff/NBUserActivityPayload.h"
#include "handoff/NimboActivity.h"
#include "platform/Platform.h"
#include "platform/UserSession.h"
#include "platform/foundation/Hash.h"
#include "platform/foundation/Log.h"
#include "platform/wire/StoredTransitIncident.h"
#include "util/NimboMap.h"

namespace nimbo {

NBUserActivityDataRef NBUserActivityData::initWithActivityType_userInfo(
    std::optional<std::string> activityType, const std::shared_ptr<const BoxedDictionary>& userInfo) {
  UserSession::prepareSharedSession(true, false);
  return NBUserActivityDataRef(
      new NBUserActivityData(std::move(activityType), UserSession::sharedSessionUserInfoForPunchoutUserInfo(userInfo)));
}

namespace {

/// The user info with bytes in the place of payloads; absent, and logged, when they cannot be made.
std::optional<std::shared_ptr<const BoxedDictionary>> readyUserInfo(
    const std::shared_ptr<const BoxedDictionary>& userInfo) {
  if (!userInfo) return userInfo;
  BoxedDictionary::Entries entries = userInfo->entries();
  for (auto& [key, value] : entries) {
    const auto* payload = dynamic_cast<const NBUserActivityPayload*>(value.get());
    if (!payload) continue;
    auto bytes = payload->bytes();
    if (!bytes) {
      writeLog(NBTransitWidgetLogFacility, LogLevel::error, "The payload of a hand-off cannot be made: %@", {key});
      return std::nullopt;
    }
    value = box(*std::move(bytes));
  }
  return std::make_shared<const BoxedDictionary>(std::move(entries));
}

}  // namespace

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
  const auto userInfo = readyUserInfo(_userInfo);
  if (!userInfo) {
    if (completion)
      completion(false, Error::errorWithDomain_code_reason(std::string(kNBUserActivityErrorDomain),
                                                           kNBUserActivityErrorNoPayload,
                                                           "What the row opens cannot be handed over."));
    return;
  }
  activity->setUserInfo(*userInfo);
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

namespace {

Bytes recordOf(const TransitLineItemRef& line) {
  NimboActivity activity;
  activity.setLineItem(StoredTransitLineItem::initWithLineItem(line));
  const auto displayOptions = std::make_shared<MapDisplayOptions>();
  displayOptions->setMapType(kMapTypeTransit);
  activity.setDisplayOptions(displayOptions);
  return activity.data();
}

class LinePayload final : public NBUserActivityPayload {
 public:
  explicit LinePayload(TransitLineItemRef line) : _line(std::move(line)) {}

  std::optional<Bytes> bytes() const override { return bzip2CompressedData(recordOf(_line)); }
  bool isEqual(const Object* other) const override {
    const auto* payload = instanceOf<LinePayload>(other);
    return payload && StoredTransitLineItem::areAlike(*payload->_line, *_line);
  }
  std::uint64_t hash() const override { return _line->muid(); }

 private:
  TransitLineItemRef _line;
};

class IncidentsPayload final : public NBUserActivityPayload {
 public:
  explicit IncidentsPayload(TransitIncidents incidents) : _incidents(std::move(incidents)) {}

  std::optional<Bytes> bytes() const override {
    const auto stored = NimboMap(_incidents, [](const TransitIncidentRef& incident, std::size_t) {
      return StoredTransitIncident::initWithIncident(incident);
    });
    auto archived = Platform::current().archive().archivedDataWithRootObject(BoxedArray::of(stored), true);
    return archived ? std::optional(std::move(*archived)) : std::nullopt;
  }
  bool isEqual(const Object* other) const override {
    const auto* payload = instanceOf<IncidentsPayload>(other);
    return payload && std::ranges::equal(payload->_incidents, _incidents, [](const auto& a, const auto& b) {
             return StoredTransitIncident::areAlike(*a, *b);
           });
  }
  std::uint64_t hash() const override { return _incidents.size(); }

 private:
  TransitIncidents _incidents;
};

NBUserActivityDataRef activityData(const std::string& activityType, std::string_view key,
                                   std::shared_ptr<const NBUserActivityPayload> payload) {
  BoxedDictionary::Entries userInfo;
  userInfo.emplace(key, std::move(payload));
  return NBUserActivityData::initWithActivityType_userInfo(
      activityType, std::make_shared<const BoxedDictionary>(std::move(userInfo)));
}

}  // namespace

NBUserActivityDataRef activityDataForLineItem(const TransitLineItemRef& lineItem) {
  return activityData(kNimboTransitWidgetIncidentActivityType, kNimboTransitWidgetIncidentActivityUserInfoKey,
                      std::make_shared<const LinePayload>(lineItem));
}

NBUserActivityDataRef activityDataForIncidents(const TransitIncidents& incidents) {
  return activityData(kNimboTransitWidgetIncidentSummaryActivityType,
                      kNimboTransitWidgetIncidentSummaryActivityUserInfoKey,
                      std::make_shared<const IncidentsPayload>(incidents));
}

}  // namespace nimbo
