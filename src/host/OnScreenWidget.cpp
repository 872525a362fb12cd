#include "host/OnScreenWidget.h"

#include <algorithm>

#include "desktop/store/RefreshSetting.h"
#include "host/HostPlatform.h"
#include "host/ProgressLine.h"
#include "platform/SystemServices.h"
#include "platform/ui/Font.h"

namespace nimbo {

namespace {

std::vector<std::string> arguments(const CommandContext& context, const WidgetPresentation& presentation) {
  std::vector<std::string> result = context.widgetArguments;
  if (presentation.virtualTime) result.insert(result.end(), {"--virtual-time", *presentation.virtualTime});
  return result;
}

}  // namespace

double WidgetPresentation::rowHeightForTextSize(ContentSizeCategory category) {
  return kDefaultRowHeight * std::max(textScaleForCategory(category), 1.0);
}

protocol::DisplayModes displayModesOf(const WidgetPresentation& presentation) {
  return {{presentation.width, presentation.compactHeight}, {presentation.width, presentation.expandedHeight}};
}

protocol::InitializeParams initializationOf(const WidgetPresentation& presentation) {
  const std::string application(kHostApplicationIdentifier);
  return {
      .locale = presentation.locale,
      .textSize = presentation.textSize,
      .scale = presentation.scale,
      .appearance = presentation.appearance,
      .displayModes = displayModesOf(presentation),
      .activeDisplayMode = WidgetDisplayMode::Compact,
      .bundle = protocol::Bundle{.kind = std::string(protocol::Bundle::kExtension),
                                 .identifier = application + ".TransitWidget",
                                 .containing = std::make_shared<protocol::Bundle>(protocol::Bundle{
                                     .kind = std::string(protocol::Bundle::kApplication), .identifier = application})}};
}

TimeInterval sharedAge(const CommandContext& context) {
  return refreshSecondsOf(*HostPlatform(context)->sharedSettings().groupStore()) / 2;
}

std::optional<std::string> failureOfUpdate(WidgetClient& client, std::optional<TimeInterval> maxAge) {
  while (true) {
    const protocol::UpdateResult answer = [&client, maxAge] {
      const DownloadProgress progress(client);
      return client.call(protocol::kPerformUpdate, {maxAge});
    }();
    if (answer.updateResult != WidgetUpdateResult::Failed) return std::nullopt;
    const std::string reason = answer.reason.value_or("the update failed");
    // The download has a limit of its own.
    if (!answer.isDownloading) return reason;
    printMessage(reason);
  }
}

OnScreenWidget::OnScreenWidget(const CommandContext& context, const WidgetPresentation& presentation,
                               const PictureMemory* pictures)
    : _client(context.runLoop, arguments(context, presentation), pictures) {
  _client.setNoticeHandler(context.tell);
  _client.call(protocol::kInitialize, initializationOf(presentation));
  for (const auto& step : {protocol::kLoadView, protocol::kViewWillAppear, protocol::kViewDidAppear})
    _client.call(step);
}

std::optional<std::string> OnScreenWidget::update(std::optional<TimeInterval> maxAge) {
  return failureOfUpdate(_client, maxAge);
}

void OnScreenWidget::expand() {
  if (_client.call(protocol::kSnapshot, {.rows = false}).largestAvailableDisplayMode == WidgetDisplayMode::Expanded)
    _client.call(protocol::kSetActiveDisplayMode, {.mode = WidgetDisplayMode::Expanded});
}

void OnScreenWidget::close() {
  _client.call(protocol::kViewWillDisappear);
  for (const auto& step : {protocol::kViewDidDisappear, protocol::kShutdown}) _client.call(step);
}

}  // namespace nimbo
