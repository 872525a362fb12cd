#include "items/NBTransitIncidentDataSourceErrorBuilder.h"

#include "platform/Platform.h"

namespace nimbo {

std::shared_ptr<NBTransitIncidentDataSourceErrorBuilder> NBTransitIncidentDataSourceErrorBuilder::initWithError(
    ErrorRef error) {
  return std::make_shared<NBTransitIncidentDataSourceErrorBuilder>(std::move(error));
}

const NBTransitListItemRef& NBTransitIncidentDataSourceErrorBuilder::listItem() {
  if (!_listItem) _listItem = NBTransitListItem::initWithSummaryItem_expandedItems(_buildErrorItem(), NBTransitItems{});
  return _listItem;
}

NBTransitItemRef NBTransitIncidentDataSourceErrorBuilder::_buildErrorItem() {
  return NBTransitItem::initWithPrimaryText_secondaryText_artwork_artworkHidden_openable(
      LocalizedString("TransitWidgetLoadingError_Title"), _errorMessage(), nullptr, true, nullptr);
}

std::optional<std::string> NBTransitIncidentDataSourceErrorBuilder::_errorMessage() {
  switch (Platform::current().network().diagnose()) {
    case NetworkFailure::unknown:
    case NetworkFailure::other:
      return LocalizedString("TransitWidgetLoadingError_Unknown");
    case NetworkFailure::airplaneMode:
      return LocalizedString("TransitWidgetLoadingError_AirplaneMode");
    case NetworkFailure::cellularDataDisabled:
      return LocalizedString("TransitWidgetLoadingError_CellDataDisabled");
    case NetworkFailure::noInternet:
      return LocalizedString("TransitWidgetLoadingError_No_Internet");
  }
  return std::nullopt;
}

}  // namespace nimbo
