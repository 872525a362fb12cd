#pragma once

#include <optional>
#include <string>
#include <vector>

#include "items/NBTransitItemDataSourceBuilder.h"
#include "platform/AnalyticsPipeline.h"
#include "platform/foundation/Error.h"

namespace nimbo {

/// Makes the one row of a failed fetch, which names the device's network condition as the likely reason.
class NBTransitIncidentDataSourceErrorBuilder final : public NBTransitItemDataSourceBuilder {
 public:
  static std::shared_ptr<NBTransitIncidentDataSourceErrorBuilder> initWithError(ErrorRef error);
  explicit NBTransitIncidentDataSourceErrorBuilder(ErrorRef error) : _error(std::move(error)) {}

  const NBTransitListItemRef& listItem() override;

  /// What the fetch failed with. Plays no part in the texts.
  const ErrorRef& error() const { return _error; }
  void setError(ErrorRef error) { _error = std::move(error); }

  int analyticsResultType() const { return 0; }
  std::optional<std::vector<TransitIncidentAnalyticsItem>> analyticsTransitIncidentItems() const {
    return std::nullopt;
  }

  std::string_view className() const override { return "NBTransitIncidentDataSourceErrorBuilder"; }

 private:
  static NBTransitItemRef _buildErrorItem();
  static std::optional<std::string> _errorMessage();

  NBTransitListItemRef _listItem;
  ErrorRef _error;
};

}  // namespace nimbo
