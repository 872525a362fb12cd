#pragma once

#include <memory>
#include <optional>
#include <string>

#include "handoff/NBOpenable.h"
#include "platform/SystemServices.h"
#include "platform/transit/TransitLine.h"

namespace nimbo {

/// Domain of an activity that the system does not create, with the code 0, and of one whose payload cannot be made.
inline constexpr std::string_view kNBUserActivityErrorDomain = "NBUserActivityErrorDomain";
inline constexpr std::int64_t kNBUserActivityErrorNoPayload = 1;

/// Key, in the user info of an error of the code 0, of the activity data that failed.
inline constexpr std::string_view kNBUserActivityErrorMissingActivityKey = "NBUserActivityErrorMissingActivityKey";

/// A hand-off to the map application: an activity type and its details, tagged with the session that widget and
/// application share.
class NBUserActivityData final : public NBOpenable {
 public:
  /// Prepares the shared session and tags `userInfo` with it.
  static std::shared_ptr<const NBUserActivityData> initWithActivityType_userInfo(
      std::optional<std::string> activityType, const std::shared_ptr<const BoxedDictionary>& userInfo);

  const std::optional<std::string>& activityType() const { return _activityType; }
  /// As tagged, not as given; may be null. An `NBUserActivityPayload` in it becomes bytes when it is opened.
  const std::shared_ptr<const BoxedDictionary>& userInfo() const { return _userInfo; }

  /// Creates the activity anew and gives it to the launcher, for the application that contains this program. The
  /// context plays no part.
  void openInContext_completionHandler(Object* context, Completion completion) const override;

  /// Both fields absent or equal.
  bool isEqualToUserActivityData(const NBUserActivityData& other) const;

  std::string_view className() const override { return "NBUserActivityData"; }
  bool isEqual(const Object* other) const override;
  std::uint64_t hash() const override;

 private:
  NBUserActivityData(std::optional<std::string> activityType, std::shared_ptr<const BoxedDictionary> userInfo)
      : _activityType(std::move(activityType)), _userInfo(std::move(userInfo)) {}

  std::optional<std::string> _activityType;
  std::shared_ptr<const BoxedDictionary> _userInfo;
};

using NBUserActivityDataRef = std::shared_ptr<const NBUserActivityData>;

/// Opens the map application at this line, with its incidents; neither is null.
NBUserActivityDataRef activityDataForLineItem(const TransitLineItemRef& lineItem);

/// Opens the map application at the list of these incidents, in this order; none is null.
NBUserActivityDataRef activityDataForIncidents(const TransitIncidents& incidents);

}  // namespace nimbo
