#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <string>

#include "analytics/NBTransitIncidentsAnalyticsDelegate.h"
#include "incidents/NBTransitIncidentFetcher.h"
#include "incidents/NBTransitIncidentUpdater.h"
#include "incidents/Result.h"
#include "platform/MemoryPressure.h"
#include "platform/artwork/ArtworkCache.h"
#include "platform/ui/TableView.h"
#include "platform/ui/ViewController.h"
#include "platform/ui/WidgetHost.h"
#include "ui/NBTransitIncidentDataSource.h"
#include "widget/NBTransitIncidentViewControllerState.h"

namespace nimbo {

/// The widget's principal object: follows the view's life and the host's requests, fetches, shows the rows, opens what
/// is tapped, and keeps the last rows for the next start. Main thread only.
class NBTransitIncidentsViewController final : public ViewController,
                                               public NBTransitIncidentUpdaterObserver,
                                               public NBTransitIncidentDataSourceDelegate {
 public:
  using UpdateHandler = std::function<void(WidgetUpdateResult)>;

  /// The host may be null; it outlives the controller.
  static std::shared_ptr<NBTransitIncidentsViewController> initWithNibName_bundle(std::string nibName,
                                                                                  std::string bundle,
                                                                                  WidgetHost* widgetHost);
  ~NBTransitIncidentsViewController() override;

  void viewDidLoad() override;
  void viewWillLayoutSubviews() override;
  void viewWillAppear(bool animated) override;
  void viewDidAppear(bool animated) override;
  void viewWillDisappear(bool animated) override;
  void viewDidDisappear(bool animated) override;
  void didReceiveMemoryWarning() override;
  void viewWillTransitionToSize_withTransitionCoordinator(Size size, TransitionCoordinator* coordinator) override;

  /// Fetches, or joins the fetch that runs. The handler hears once, when that fetch ends: NewData or Failed.
  void widgetPerformUpdateWithCompletionHandler(UpdateHandler handler);
  /// The maximum size is not used: the host's own answers are.
  void widgetActiveDisplayModeDidChange_withMaximumSize(WidgetDisplayMode mode, Size maximumSize);

  void transitIncidentUpdater_dateExpired(NBTransitIncidentUpdater& updater, Date date) override;
  void transitIncidentUpdaterNeedsRefresh(NBTransitIncidentUpdater& updater) override;
  void dataSourceDidUpdateContent(NBTransitIncidentDataSource& dataSource) override;
  void dataSource_didSelectOpenableItem_atIndexPath(NBTransitIncidentDataSource& dataSource,
                                                    const std::shared_ptr<const NBOpenable>& openable,
                                                    IndexPath indexPath) override;

  bool isVisible() const { return _visible; }
  /// Null until the view is loaded, as is the table model.
  const std::shared_ptr<TableView>& tableView() const { return _tableView; }
  const std::shared_ptr<NBTransitIncidentDataSource>& dataSource() const { return _dataSource; }
  /// Null while not visible, before the first fetch and after a failed one.
  const std::shared_ptr<NBTransitIncidentUpdater>& updater() const { return _updater; }
  /// The fetch that runs, or null.
  const std::shared_ptr<NBTransitIncidentFetcherRequest>& request() const { return _request; }
  /// The outcome of the last fetch that ended, or null.
  const ResultRef& transitLineItemResult() const { return _transitLineItemResult; }
  const std::shared_ptr<NBTransitIncidentsAnalyticsDelegate>& analyticsDelegate() const { return _analyticsDelegate; }
  const std::shared_ptr<ArtworkCache>& artworkCache();

  std::string_view className() const override { return "NBTransitIncidentsViewController"; }

 private:
  using ViewController::ViewController;

  std::shared_ptr<NBTransitIncidentsViewController> self();
  void _createSubviews();
  void _fetchUpdatesWithCompletitionHandler(UpdateHandler handler);
  void setTransitLineItemResult(ResultRef result);
  void _createUpdaterForTransitLineItemsIfVisible();
  void setUpdater(std::shared_ptr<NBTransitIncidentUpdater> updater);
  void _startListeningToMemoryPressureEvents();

  void _contentSizeCategoryDidChange();
  std::uint64_t _maxNumberOfRowsFromAvailableWidgetSize() const;
  double _availablWidth();
  void updateLargestAvailableDisplayMode();

  void _saveUIData();
  std::shared_ptr<const NBTransitIncidentViewControllerState> _loadSavedUIData();

  bool _visible = false;
  std::unique_ptr<MemoryPressureSource> _systemMemoryPressureWarningSource;
  std::unique_ptr<MemoryPressureSource> _systemMemoryPressureCriticalSource;
  std::unique_ptr<MemoryPressureSource> _processMemoryPressureCriticalSource;
  std::unique_ptr<MemoryPressureSource> _processMemoryPressureWarningSource;
  std::shared_ptr<TableView> _tableView;
  std::shared_ptr<NBTransitIncidentDataSource> _dataSource;
  std::shared_ptr<NBTransitIncidentUpdater> _updater;
  std::shared_ptr<ArtworkCache> _artworkCache;
  std::shared_ptr<NBTransitIncidentFetcherRequest> _request;
  ResultRef _transitLineItemResult;
  std::shared_ptr<NBTransitIncidentsAnalyticsDelegate> _analyticsDelegate;
};

}  // namespace nimbo
