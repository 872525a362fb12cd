#include "handoff/NBUserActivityData.h"

#include <algorithm>
#include <functional>
#include <map>

#include "handoff/ApplicationRecord+NimboExtras.h"
#include "handoff/Bytes+NimboExtra.h"
#include "handoff/NimboActivity.h"
#include "platform/Platform.h"
#include "platform/UserSession.h"
#include "platform/foundation/Hash.h"
#include "platform/wire/StoredTransitIncident.h"
#include "util/NimboMap.h"

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

namespace {

/// The payloads of objects that are alive. A line has a row for each of its incidents, and all rows are made anew
/// whenever an incident starts or ends; compressing takes a hundred times what the rest of a row takes.
class PayloadCache {
 public:
  /// What `make` answered for these very objects, or answers now; null when it answers no bytes.
  ObjectRef payloadFor(const std::vector<ObjectRef>& objects, const std::function<std::optional<Bytes>()>& make) {
    Key key(objects.begin(), objects.end());
    if (const auto known = _payloads.find(key); known != _payloads.end()) return known->second;
    std::optional<Bytes> bytes = make();
    if (!bytes) return nullptr;
    std::erase_if(_payloads, [](const auto& entry) {
      return std::ranges::any_of(entry.first, [](const auto& object) { return object.expired(); });
    });
    return _payloads.emplace(std::move(key), box(*std::move(bytes))).first->second;
  }

 private:
  using Key = std::vector<std::weak_ptr<const Object>>;
  struct IsBefore {
    bool operator()(const Key& a, const Key& b) const {
      return std::ranges::lexicographical_compare(a, b, std::owner_less<>());
    }
  };
  std::map<Key, ObjectRef, IsBefore> _payloads;
};

NBUserActivityDataRef activityData(const std::string& activityType, std::string_view key,
                                   const std::vector<ObjectRef>& objects,
                                   const std::function<std::optional<Bytes>()>& makePayload) {
  const auto cache = Platform::current().singleton<PayloadCache>([] { return std::make_shared<PayloadCache>(); });
  ObjectRef payload = cache->payloadFor(objects, makePayload);
  if (!payload) return nullptr;
  BoxedDictionary::Entries userInfo;
  userInfo.emplace(key, std::move(payload));
  return NBUserActivityData::initWithActivityType_userInfo(
      activityType, std::make_shared<const BoxedDictionary>(std::move(userInfo)));
}

}  // namespace

NBUserActivityDataRef activityDataForLineItem(const TransitLineItemRef& lineItem) {
  return activityData(kNimboTransitWidgetIncidentActivityType, kNimboTransitWidgetIncidentActivityUserInfoKey,
                      {lineItem}, [&] {
                        NimboActivity activity;
                        activity.setLineItem(StoredTransitLineItem::initWithLineItem(lineItem));
                        const auto displayOptions = std::make_shared<MapDisplayOptions>();
                        displayOptions->setMapType(kMapTypeTransit);
                        activity.setDisplayOptions(displayOptions);
                        return bzip2CompressedData(activity.data());
                      });
}

NBUserActivityDataRef activityDataForIncidents(const TransitIncidents& incidents) {
  return activityData(
      kNimboTransitWidgetIncidentSummaryActivityType, kNimboTransitWidgetIncidentSummaryActivityUserInfoKey,
      std::vector<ObjectRef>(incidents.begin(), incidents.end()), [&] {
        const auto stored = NimboMap(incidents, [](const TransitIncidentRef& incident, std::size_t) {
          return StoredTransitIncident::initWithIncident(incident);
        });
        auto archived = Platform::current().archive().archivedDataWithRootObject(BoxedArray::of(stored), true);
        return archived ? std::optional(std::move(*archived)) : std::nullopt;
      });
}

}  // namespace nimbo
