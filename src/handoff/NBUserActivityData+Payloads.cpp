#include "handoff/Bytes+NimboExtra.h"
#include "handoff/NBUserActivityData+Payloads.h"
#include "handoff/NimboActivity.h"
#include "platform/MapURLBuilder.h"
#include "platform/Platform.h"
#include "platform/wire/StoredTransitIncident.h"
#include "util/NimboMap.h"

namespace nimbo {

namespace {

/// User-info key of the compressed `NimboActivity`.
constexpr std::string_view kActivityRecordKey = "bs";

NBUserActivityDataRef activityData(const std::string& activityType, std::string_view key,
                                   std::optional<Bytes> payload) {
  if (!payload) return nullptr;
  return NBUserActivityData::initWithActivityType_userInfo(
      activityType,
      std::make_shared<const BoxedDictionary>(BoxedDictionary::Entries{{std::string(key), box(*std::move(payload))}}));
}

}  // namespace

NBUserActivityDataRef activityDataForLineItem(const TransitLineItemRef& lineItem) {
  NimboActivity activity;
  activity.setLineItem(StoredTransitLineItem::initWithLineItem(lineItem));
  const auto displayOptions = std::make_shared<MapDisplayOptions>();
  displayOptions->setMapType(kMapTypeTransit);
  activity.setDisplayOptions(displayOptions);
  return activityData(kNimboTransitWidgetIncidentActivityType, kActivityRecordKey,
                      bzip2CompressedData(activity.data()));
}

NBUserActivityDataRef activityDataForIncidents(const TransitIncidents& incidents) {
  const auto stored = NimboMap(incidents, [](const TransitIncidentRef& incident, std::size_t) {
    return StoredTransitIncident::initWithIncident(incident);
  });
  return activityData(kNimboTransitWidgetIncidentSummaryActivityType,
                      kNimboTransitWidgetIncidentSummaryActivityUserInfoKey,
                      Platform::current().archive().archivedDataWithRootObject(BoxedArray::of(stored), true).bytes);
}

}  // namespace nimbo
