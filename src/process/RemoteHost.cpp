#include "process/RemoteHost.h"

#include "process/HandoffDecoder.h"
#include "process/Snapshot.h"

namespace nimbo {

using nlohmann::json;

namespace {

/// Domain of the errors that a host reports for an opening.
constexpr const char* kHostErrorDomain = "WidgetHostErrorDomain";

/// What the host answered to an opening; whatever is no such answer opened nothing.
protocol::Opened openedOf(const json& result, const std::optional<JSONRPCError>& failure) {
  try {
    if (!failure) return protocol::read<protocol::Opened>(result);
  } catch (const protocol::Malformed&) {
  }
  return {};
}

ErrorRef hostError(const protocol::Opened& answer, const std::optional<JSONRPCError>& failure) {
  if (failure) return Error::errorWithDomain_code_reason(kHostErrorDomain, failure->code, failure->message);
  if (answer.opened) return nullptr;
  return Error::errorWithDomain_code_reason(kHostErrorDomain, 0, answer.error.value_or("the host did not open it"));
}

/// Why nobody would take what is handed over; null when all of it is within bounds.
ErrorRef problemOfHandoff(const BoxedDictionary* userInfo) {
  if (!userInfo) return nullptr;
  for (const auto& [key, value] : userInfo->entries())
    if (const auto* data = dynamic_cast<const BoxedData*>(value.get()))
      if (const auto handoff = decodeHandoff(data->value()); !handoff) return handoff.error();
  return nullptr;
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
  notify(_connection, protocol::kLargestAvailableDisplayModeDidChange, {mode});
}

void RemoteHost::preferredContentSizeDidChange(Size size) {
  if (_preferredSizeObserver) _preferredSizeObserver(size);
  notify(_connection, protocol::kPreferredContentSizeDidChange, {size});
}

void RemoteHost::openURL(const URL& url, std::function<void(bool)> completion) {
  _connection.call(protocol::kOpenURL.name, protocol::write(protocol::OpenURLParams{url.absoluteString()}),
                   [completion = std::move(completion)](const json& result, const auto& failure) {
                     completion(openedOf(result, failure).opened);
                   });
}

std::shared_ptr<UserActivity> RemoteHost::createUserActivity(const std::string& activityType) {
  return activityType.empty() ? nullptr : std::make_shared<UserActivity>(activityType);
}

void RemoteHost::openUserActivity(const std::shared_ptr<const UserActivity>& activity,
                                  const ApplicationRecordRef& application, bool requireUnlockPrompt,
                                  Completion completion) {
  // Such as when there are too many incidents to hand over: the tap would seem to do nothing.
  const auto fail = [this](const std::string& why) {
    notify(_connection, protocol::kNotice, {"Cannot open it: " + why + "."});
  };
  if (const auto error = problemOfHandoff(activity->userInfo().get())) {
    fail(error->reason());
    if (completion) completion(false, error);
    return;
  }
  protocol::OpenUserActivityParams params{.activityType = activity->activityType(),
                                          .userInfo = writtenUserInfo(activity->userInfo().get()),
                                          .requireUnlockPrompt = requireUnlockPrompt};
  if (application) params.application = application->identifier();
  _connection.call(protocol::kOpenUserActivity.name, protocol::write(params),
                   [fail, completion = std::move(completion)](const json& result, const auto& failure) {
                     if (failure) fail(failure->message);
                     const protocol::Opened answer = openedOf(result, failure);
                     if (completion) completion(answer.opened, hostError(answer, failure));
                   });
}

}  // namespace nimbo
