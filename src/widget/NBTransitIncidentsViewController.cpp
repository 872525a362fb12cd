#include "widget/NBTransitIncidentsViewController.h"

#include "incidents/NBTransitIncidentFetcher.h"
#include "platform/Platform.h"
#include "platform/SystemServices.h"
#include "platform/foundation/Log.h"
#include "platform/ui/Environment.h"
#include "ui/ArtworkCache+Nimbo.h"

namespace nimbo {

namespace {

/// Seconds between fetches while visible.
constexpr TimeInterval kRefreshInterval = 1800;

WidgetUpdateResult updateResultForResult(const Result& result) {
  return result.isSuccess() ? WidgetUpdateResult::NewData : WidgetUpdateResult::Failed;
}

}  // namespace

std::shared_ptr<NBTransitIncidentsViewController> NBTransitIncidentsViewController::initWithNibName_bundle(
    std::string nibName, std::string bundle, WidgetHost* widgetHost) {
  const std::shared_ptr<NBTransitIncidentsViewController> controller(
      new NBTransitIncidentsViewController(std::move(nibName), std::move(bundle), widgetHost));
  controller->_analyticsDelegate =
      NBTransitIncidentsAnalyticsDelegate::initWithTransitIncidentsViewController(controller);
  return controller;
}

NBTransitIncidentsViewController::~NBTransitIncidentsViewController() {
  if (_updater) _updater->invalidate();
  for (auto* source : {&_systemMemoryPressureWarningSource, &_systemMemoryPressureCriticalSource,
                       &_processMemoryPressureWarningSource, &_processMemoryPressureCriticalSource})
    if (*source) (*source)->cancel();
}

std::shared_ptr<NBTransitIncidentsViewController> NBTransitIncidentsViewController::self() {
  return std::static_pointer_cast<NBTransitIncidentsViewController>(shared_from_this());
}

const std::shared_ptr<ArtworkCache>& NBTransitIncidentsViewController::artworkCache() {
  if (!_artworkCache) _artworkCache = memoryConstrainedImageViewCache();
  return _artworkCache;
}

// MARK: the view's life

void NBTransitIncidentsViewController::viewDidLoad() {
  ViewController::viewDidLoad();
  _startListeningToMemoryPressureEvents();
  _createSubviews();
}

void NBTransitIncidentsViewController::_createSubviews() {
  _tableView = TableView::initWithFrame_style(view()->layoutMarginsFrame(), TableViewStyle::plain);
  _tableView->setSeparatorEffect(VisualEffect::widgetTertiaryVibrancyEffect());
  const auto savedState = _loadSavedUIData();
  _dataSource =
      NBTransitIncidentDataSource::initWithTransitLineItemsResult_expanded_artworkCache_maxNumberOfRows_availableWidth(
          savedState ? savedState->lineItemsResult() : nullptr, savedState && savedState->expanded(), artworkCache(),
          _maxNumberOfRowsFromAvailableWidgetSize(), _availablWidth());
  _dataSource->configureTableView(*_tableView);
  _dataSource->setDelegate(self());
  view()->addSubview(_tableView);
}

void NBTransitIncidentsViewController::viewWillLayoutSubviews() {
  ViewController::viewWillLayoutSubviews();
  _tableView->setFrame(view()->layoutMarginsFrame());
}

void NBTransitIncidentsViewController::viewWillAppear(bool animated) {
  ViewController::viewWillAppear(animated);
  _visible = true;
  _createUpdaterForTransitLineItemsIfVisible();
  _contentSizeCategoryDidChange();
  const std::weak_ptr<NBTransitIncidentsViewController> weak = self();
  Environment::current().observeContentSizeCategory(shared_from_this(), [weak] {
    if (const auto controller = weak.lock()) controller->_contentSizeCategoryDidChange();
  });
  updateLargestAvailableDisplayMode();
  _fetchUpdatesWithCompletitionHandler(nullptr);
}

void NBTransitIncidentsViewController::viewDidAppear(bool animated) {
  ViewController::viewDidAppear(animated);
  _analyticsDelegate->startSessionIfNeeded();
}

void NBTransitIncidentsViewController::viewWillDisappear(bool animated) {
  _saveUIData();
  Environment::current().removeObserver(this);
  setUpdater(nullptr);
  _visible = false;
  ViewController::viewWillDisappear(animated);
}

void NBTransitIncidentsViewController::viewDidDisappear(bool animated) {
  _analyticsDelegate->recordCloseSessionSwiping();
  ViewController::viewDidDisappear(animated);
}

void NBTransitIncidentsViewController::didReceiveMemoryWarning() {
  ViewController::didReceiveMemoryWarning();
  artworkCache()->purge();
}

void NBTransitIncidentsViewController::_startListeningToMemoryPressureEvents() {
  static constexpr LogFacility kLog{kHostSuggestionsLogSubsystem, NBTransitWidgetLogFacility.category};
  const auto queue =
      std::make_shared<SerialQueue>(std::string(kHostApplicationIdentifier) + ".TransitWidget.memoryPresure");
  const auto makeSource = [&](MemoryPressureKind kind, std::string_view name) {
    return Platform::current().memoryPressure().makeSource(
        kind, queue,
        [&signposts = Platform::current().signposts(), name] { signposts.event(kLog, name, " enableTelemetry=YES "); });
  };
  _systemMemoryPressureWarningSource = makeSource(MemoryPressureKind::systemWarning, "SystemMemoryPressureWarning");
  _systemMemoryPressureCriticalSource = makeSource(MemoryPressureKind::systemCritical, "SystemMemoryPressureCritical");
  _processMemoryPressureWarningSource = makeSource(MemoryPressureKind::processWarning, "ProcessMemoryPressureWarning");
  _processMemoryPressureCriticalSource =
      makeSource(MemoryPressureKind::processCritical, "ProcessMemoryPressureCritical");
  for (auto* source : {&_systemMemoryPressureWarningSource, &_systemMemoryPressureCriticalSource,
                       &_processMemoryPressureWarningSource, &_processMemoryPressureCriticalSource})
    (*source)->activate();
}

// MARK: updates

void NBTransitIncidentsViewController::widgetPerformUpdateWithCompletionHandler(UpdateHandler handler) {
  _fetchUpdatesWithCompletitionHandler(std::move(handler));
}

void NBTransitIncidentsViewController::_fetchUpdatesWithCompletitionHandler(UpdateHandler handler) {
  assertMainQueue();
  if (_request) {
    if (!handler) return;  // the running fetch updates the widget when it ends
    _request->addHandler(
        [handler = std::move(handler)](const ResultRef& result) { handler(updateResultForResult(*result)); });
    return;
  }
  const auto fetcher = std::make_shared<NBTransitIncidentFetcher>();
  const std::weak_ptr<NBTransitIncidentsViewController> weak = self();
  _request = fetcher->fetchFavoriteLinesTransitIncidentsWithCompletionHandler(
      [weak, handler = std::move(handler)](const ResultRef& result) {
        const auto controller = weak.lock();
        if (controller) controller->setTransitLineItemResult(result);
        if (handler) handler(updateResultForResult(*result));
        if (controller) controller->_request = nullptr;
      });
}

void NBTransitIncidentsViewController::setTransitLineItemResult(ResultRef result) {
  _transitLineItemResult = std::move(result);
  _createUpdaterForTransitLineItemsIfVisible();
  if (_dataSource)
    _dataSource->updateTransitLineItemResult_captureAnalytics(_transitLineItemResult, _analyticsDelegate);
}

void NBTransitIncidentsViewController::_createUpdaterForTransitLineItemsIfVisible() {
  if (!_visible) return setUpdater(nullptr);
  if (!_transitLineItemResult) return;
  _transitLineItemResult->withValue_orError(
      [this](const ObjectRef& value) {
        const auto& array = static_cast<const BoxedArray&>(*value);
        setUpdater(NBTransitIncidentUpdater::initWithTransitLineItems_refreshInterval(
            array.elementsOfClass<TransitLineItem>(), kRefreshInterval));
        _updater->setObserver(self());
      },
      [this](const ErrorRef&) { setUpdater(nullptr); });
}

void NBTransitIncidentsViewController::setUpdater(std::shared_ptr<NBTransitIncidentUpdater> updater) {
  if (updater == _updater) return;
  if (_updater) _updater->invalidate();
  _updater = std::move(updater);
}

void NBTransitIncidentsViewController::transitIncidentUpdater_dateExpired(NBTransitIncidentUpdater&, Date) {
  if (_visible) _dataSource->recalculateDataSourceItemsWithAnalytics(_analyticsDelegate);
}

void NBTransitIncidentsViewController::transitIncidentUpdaterNeedsRefresh(NBTransitIncidentUpdater&) {
  if (_visible) _fetchUpdatesWithCompletitionHandler(nullptr);
}

// MARK: opening

void NBTransitIncidentsViewController::dataSource_didSelectOpenableItem_atIndexPath(
    NBTransitIncidentDataSource&, const std::shared_ptr<const NBOpenable>& openable, IndexPath indexPath) {
  openable->openInContext_completionHandler(this,
                                            [analytics = _analyticsDelegate, indexPath](bool opened, const ErrorRef&) {
                                              if (opened) analytics->recordOpenItemAtIndexPath(indexPath);
                                            });
}

}  // namespace nimbo
