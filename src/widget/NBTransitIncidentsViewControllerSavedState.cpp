// The last rows, kept in the shared settings for the first frame of the next start.

#include "incidents/SharedSettingsStore+Nimbo.h"
#include "platform/Platform.h"
#include "platform/foundation/Log.h"
#include "widget/NBTransitIncidentsViewController.h"

namespace nimbo {

namespace {
constexpr std::string_view kNimboTransitWidgetSavedUIData = "Nimbo.TransitWidget.savedUIData";
}

void NBTransitIncidentsViewController::_saveUIData() {
  const auto state = NBTransitIncidentViewControllerState::initWithLineItemsResult_expanded(
      _dataSource->transitLineItemResult(), _dataSource->isExpanded());
  const auto archived = Platform::current().archive().archivedDataWithRootObject(state, true);
  if (!archived) {
    writeLog(NBTransitWidgetLogFacility, LogLevel::debug,
             "Unable to cache view model to disk because it couldnt be converted to Blob: %{private}@", {state});
    return;
  }
  writeLog(NBTransitWidgetLogFacility, LogLevel::debug,
           "Saving view model to Prefstore (key: %{private}@) : %{private}@", {kNimboTransitWidgetSavedUIData, state});
  if (const ErrorRef error = __nimbo_groupUserDefaults()->setValue_forKey(*archived, kNimboTransitWidgetSavedUIData))
    writeLog(NBTransitWidgetLogFacility, LogLevel::error, "The view model was not saved: %@", {error->reason()});
}

std::shared_ptr<const NBTransitIncidentViewControllerState> NBTransitIncidentsViewController::_loadSavedUIData() {
  const auto settings = __nimbo_groupUserDefaults();
  const auto data = settings->dataForKey(kNimboTransitWidgetSavedUIData);
  if (!data) {
    writeLog(NBTransitWidgetLogFacility, LogLevel::debug, "No view model found in Prefstores (key: %{private}@)",
             {kNimboTransitWidgetSavedUIData});
    return nullptr;
  }
  ErrorRef error;
  auto state = NBTransitIncidentViewControllerState::unarchiveFromData_error(*data, &error);
  if (error) {
    writeLog(NBTransitWidgetLogFacility, LogLevel::debug,
             "Error parsing ViewModel data loaded from Prefstores, removing it (key: %{private}@): %{private}@ - "
             "error: %{private}@",
             {kNimboTransitWidgetSavedUIData, state, error});
    settings->removeValueForKey(kNimboTransitWidgetSavedUIData);
    return nullptr;
  }
  writeLog(NBTransitWidgetLogFacility, LogLevel::debug,
           "View model loaded from Prefstores (key: %{private}@): %{private}@",
           {kNimboTransitWidgetSavedUIData, state});
  return state;
}

}  // namespace nimbo
