#include "host/OnScreenWidget.h"

#include <algorithm>

#include "platform/HostApplication.h"
#include "platform/ui/TextStyles.h"

namespace nimbo {

using nlohmann::json;

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

json displayModesOf(const WidgetPresentation& presentation) {
  return {{"compact", {presentation.width, presentation.compactHeight}},
          {"expanded", {presentation.width, presentation.expandedHeight}}};
}

json initializationOf(const WidgetPresentation& presentation) {
  const std::string application(kHostApplicationIdentifier);
  json params = {{"textSize", presentation.textSize},
                 {"scale", presentation.scale},
                 {"appearance", presentation.appearance},
                 {"displayModes", displayModesOf(presentation)},
                 {"activeDisplayMode", "compact"},
                 {"bundle",
                  {{"kind", "extension"},
                   {"identifier", application + ".TransitWidget"},
                   {"containing", {{"kind", "application"}, {"identifier", application}}}}}};
  if (presentation.locale) params["locale"] = *presentation.locale;
  return params;
}

std::optional<std::string> failureOfUpdate(const json& answer) {
  if (answer.value("updateResult", "") != "failed") return std::nullopt;
  return answer.value("reason", "the update failed");
}

OnScreenWidget::OnScreenWidget(const CommandContext& context, const WidgetPresentation& presentation)
    : _client(context.runLoop, arguments(context, presentation)) {
  _client.setNoticeHandler(context.tell);
  _client.call("initialize", initializationOf(presentation));
  for (const char* step : {"loadView", "viewWillAppear", "viewDidAppear"}) _client.call(step);
}

std::optional<std::string> OnScreenWidget::update() { return failureOfUpdate(_client.call("performUpdate")); }

void OnScreenWidget::expand() {
  if (_client.call("snapshot").value("largestAvailableDisplayMode", "") == "expanded")
    _client.call("setActiveDisplayMode", {{"mode", "expanded"}});
}

void OnScreenWidget::close() {
  for (const char* step : {"viewWillDisappear", "viewDidDisappear", "shutdown"}) _client.call(step);
}

}  // namespace nimbo
