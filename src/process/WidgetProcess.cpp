#include "process/WidgetProcess.h"

#include <algorithm>
#include <limits>
#include <utility>

#include "desktop/drawing/DrawingPart.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/static/LineItems.h"
#include "desktop/rpc/Base64.h"
#include "desktop/store/RefreshSetting.h"
#include "desktop/system/SmallMemory.h"
#include "platform/foundation/Log.h"
#include "platform/foundation/Version.h"
#include "platform/ui/Color.h"
#include "process/HandoffDecoder.h"
#include "process/HostLogSink.h"
#include "process/LineReports.h"
#include "process/PictureOutput.h"
#include "process/Snapshot.h"
#include "protocol/Coding.h"

namespace nimbo {

using nlohmann::json;

namespace {

constexpr int kProtocolVersion = 1;

/// Setting: when the fetch ended that the saved rows are of.
constexpr std::string_view kSavedRowsDateKey = "Nimbo.TransitWidget.savedUIDate";

/// Seconds after which lines are kept again though they run as before: a disk that sleeps is woken seldom.
constexpr TimeInterval kKeepLinesAgain = 600;

bool isDownloading(const Error& error) {
  return error.domain() == kTransitLineServiceErrorDomain &&
         error.code() == static_cast<std::int64_t>(TransitLineServiceError::downloading);
}

/// Room at both sides of the rows, in points.
constexpr Insets kLayoutMargins{0, 16, 0, 16};

BundleRecordRef bundleRecord(const protocol::Bundle& bundle) {
  if (bundle.kind == protocol::Bundle::kApplication)
    return std::make_shared<const ApplicationRecord>(bundle.identifier);
  if (bundle.kind == protocol::Bundle::kExtension)
    return std::make_shared<const ExtensionRecord>(bundle.identifier,
                                                   bundle.containing ? bundleRecord(*bundle.containing) : nullptr);
  return std::make_shared<const BundleRecord>(bundle.identifier);
}

template <class Params>
Params paramsOf(const json& params) {
  try {
    return protocol::read<Params>(params);
  } catch (const protocol::Malformed& malformed) {
    throw JSONRPCFailure(JSONRPCError::kInvalidParams, std::string("parameter ") + malformed.what());
  }
}

}  // namespace

WidgetProcess::WidgetProcess(Options options, int input, int output)
    : _options(std::move(options)),
      _virtualTime(_options.virtualTime ? std::make_unique<VirtualTime>(*_options.virtualTime) : nullptr),
      _sentTo(_options.virtualTime.value_or(Date())),
      _runLoop(_virtualTime.get()),
      _connection(_runLoop, input, output),
      _host(_connection) {
  addMethod(protocol::kInitialize, &WidgetProcess::initialize);
  addMethod(protocol::kLoadView, &WidgetProcess::loadView);
  addMethod(protocol::kShutdown, &WidgetProcess::shutdown);
  addMethod(protocol::kDecode, &WidgetProcess::decode);
  addFeedMethod(protocol::kFindLines, &FeedRequests::findLines);
  addFeedMethod(protocol::kDescribeLines, &FeedRequests::describeLines);
  addFeedMethod(protocol::kCheckFeed, &FeedRequests::checkFeed);
  addFeedMethod(protocol::kImage, &FeedRequests::image);
  addMethod(protocol::kCancel, &WidgetProcess::cancel);
  addMethod(protocol::kLines, &WidgetProcess::lines);
  addMethod(protocol::kMarkSeen, &WidgetProcess::markSeen);
  addMethod(protocol::kDownloads, &WidgetProcess::downloads);
  addViewMethod(protocol::kViewWillAppear, &WidgetProcess::viewWillAppear);
  addViewMethod(protocol::kViewDidAppear, &WidgetProcess::viewDidAppear);
  addViewMethod(protocol::kViewWillDisappear, &WidgetProcess::viewWillDisappear);
  addViewMethod(protocol::kViewDidDisappear, &WidgetProcess::viewDidDisappear);
  addViewMethod(protocol::kDidReceiveMemoryWarning, &WidgetProcess::didReceiveMemoryWarning);
  addViewMethod(protocol::kSetActiveDisplayMode, &WidgetProcess::setActiveDisplayMode);
  addViewMethod(protocol::kTransitionToSize, &WidgetProcess::transitionToSize);
  addViewMethod(protocol::kSetTextSize, &WidgetProcess::setTextSize);
  addViewMethod(protocol::kSelectRow, &WidgetProcess::selectRow);
  addViewMethod(protocol::kHighlightRow, &WidgetProcess::highlightRow);
  addViewMethod(protocol::kSnapshot, &WidgetProcess::snapshot);
  addViewMethod(protocol::kRender, &WidgetProcess::render);
  addViewMethod(protocol::kSetAppearance, &WidgetProcess::setAppearance);
  addViewMethod(protocol::kSetScale, &WidgetProcess::setScale);
  if (_virtualTime) addMethod(protocol::kAdvanceTime, &WidgetProcess::advanceTime);
  _connection.setHandler(protocol::kPerformUpdate.name, [this](const json& params, const JSONRPCResponder& responder) {
    performUpdate(paramsOf<protocol::UpdateParams>(params), responder);
  });
  _connection.setClosedHandler([this] { _runLoop.quit(); });
  _host.setPreferredSizeObserver([this](Size size) { resizeView(size); });
  _host.setContentObserver([this] { announceFrame(); });
}

WidgetProcess::~WidgetProcess() = default;

int WidgetProcess::run() {
  _connection.start();
  _runLoop.run();
  return 0;
}

template <class Params, class Result>
void WidgetProcess::addMethod(const protocol::Method<Params, Result>& method,
                              Result (WidgetProcess::*answer)(const Params&)) {
  _connection.setHandler(method.name, [this, answer](const json& params, const JSONRPCResponder& responder) {
    responder.answer(protocol::write((this->*answer)(paramsOf<Params>(params))));
  });
}

template <class Params, class Result>
void WidgetProcess::addViewMethod(const protocol::Method<Params, Result>& method,
                                  Result (WidgetProcess::*answer)(const Params&)) {
  _connection.setHandler(
      method.name, [this, name = method.name, answer](const json& params, const JSONRPCResponder& responder) {
        if (!_controller || !_controller->isViewLoaded())
          throw JSONRPCFailure(JSONRPCError::kInvalidState, std::string(name) + " needs \"loadView\" first");
        responder.answer(protocol::write((this->*answer)(paramsOf<Params>(params))));
      });
}

template <class Params, class Result>
void WidgetProcess::addFeedMethod(const protocol::Method<Params, Result>& method,
                                  void (FeedRequests::*start)(const Params&, const JSONRPCResponder&)) {
  _connection.setHandler(method.name, [this, start](const json& params, const JSONRPCResponder& responder) {
    const Params read = paramsOf<Params>(params);
    if (!_platform) makePlatform({});
    (_feedRequests.get()->*start)(read, responder);
  });
}

void WidgetProcess::requireStage(std::initializer_list<Stage> stages, const char* method) const {
  if (std::find(stages.begin(), stages.end(), _stage) != stages.end()) return;
  static constexpr const char* kNames[] = {"not loaded", "hidden", "about to appear", "on screen",
                                           "about to disappear"};
  throw JSONRPCFailure(JSONRPCError::kInvalidState,
                       std::string(method) + " does not fit: the view is " + kNames[static_cast<std::size_t>(_stage)]);
}

void WidgetProcess::makePlatform(const std::string& locale) {
  auto logSink = std::make_unique<HostLogSink>(makeLogSink(LogOptions::fromEnvironment()), _runLoop,
                                               [this](const std::string& category, const std::string& text) {
                                                 notify(_connection, protocol::kLog,
                                                        {.level = "error", .category = category, .message = text});
                                               });
  _platform = std::make_unique<WidgetPlatform>(
      DesktopPlatform::Options{.paths = _options.paths,
                               .locale = locale,
                               .runLoop = _runLoop,
                               .virtualTime = _virtualTime.get(),
                               .activityLauncher = _host,
                               .logSink = std::move(logSink),
                               .notice = [this](const ErrorRef& notice) { tellNotice(notice); }});
  _feedRequests = std::make_unique<FeedRequests>(_platform->transitLines(), _runLoop, _connection, _options.pictures);
}

protocol::Initialized WidgetProcess::initialize(const protocol::InitializeParams& params) {
  if (_controller) throw JSONRPCFailure(JSONRPCError::kInvalidState, "initialize was called already");
  // What was asked for before was read without the host's locale.
  _feedRequests.reset();
  _platform.reset();
  makePlatform(params.locale.value_or(""));
  // When the lines were looked up is told, also where they run as before.
  _platform->transitLines().setAnswerObserver([this] {
    keepLines();
    notify(_connection, protocol::kUpdated, {});
    const std::set<std::string> early = std::exchange(_seenEarly, {});
    if (const ErrorRef failure = early.empty() ? nullptr : keepSeen(early)) tellNotice(failure);
  });
  Environment& environment = Environment::current();
  environment.setContentSizeCategory(params.textSize);
  environment.setScreenScale(params.scale);
  environment.setAppearance(params.appearance);
  _hostChoseMode = params.activeDisplayMode.has_value();
  _host.setActiveDisplayMode(params.activeDisplayMode.value_or(WidgetDisplayMode::Compact));
  if (params.bundle) _host.setBundleRecord(bundleRecord(*params.bundle));
  if (params.displayModes) _host.setMaximumSizes(*params.displayModes);
  _controller =
      NBTransitIncidentsViewController::initWithNibName_bundle("", "", params.displayModes ? &_host : nullptr);
  return {"nimbo-transit-widget", kVersion, kProtocolVersion};
}

protocol::Nothing WidgetProcess::loadView(const Nothing&) {
  if (!_controller) throw JSONRPCFailure(JSONRPCError::kInvalidState, "loadView needs \"initialize\" first");
  requireStage({Stage::created}, protocol::kLoadView.name);
  _controller->view()->setLayoutMargins(kLayoutMargins);
  if (_controller->widgetHost()) {
    const NBTransitIncidentDataSource& rows = *_controller->dataSource();
    // The rows of the last time may have been left in the other mode.
    if (_hostChoseMode)
      takeDisplayMode(_host.activeDisplayMode());
    else
      _host.setActiveDisplayMode(rows.isExpanded() ? WidgetDisplayMode::Expanded : WidgetDisplayMode::Compact);
    _controller->setPreferredContentSize(rows.preferredContentSizeForExpanded_maxSize(
        rows.isExpanded(), _host.maximumSizeForDisplayMode(_host.activeDisplayMode())));
  }
  _stage = Stage::hidden;
  return {};
}

protocol::Nothing WidgetProcess::viewWillAppear(const Nothing&) {
  requireStage({Stage::hidden}, protocol::kViewWillAppear.name);
  _stage = Stage::appearing;
  _sources = std::make_unique<SourceWatch>(_runLoop, _options.paths, _platform->favoritesEditor(),
                                           _platform->sharedSettings().groupStore(),
                                           [this] { notify(_connection, protocol::kChanged, {}); });
  _controller->viewWillAppear(false);
  return {};
}

protocol::Nothing WidgetProcess::viewDidAppear(const Nothing&) {
  requireStage({Stage::appearing, Stage::visible}, protocol::kViewDidAppear.name);
  _stage = Stage::visible;
  _controller->viewDidAppear(false);
  return {};
}

protocol::Kept WidgetProcess::viewWillDisappear(const Nothing&) {
  requireStage({Stage::appearing, Stage::visible}, protocol::kViewWillDisappear.name);
  _stage = Stage::disappearing;
  _sources.reset();
  _controller->viewWillDisappear(false);
  SQLiteSharedSettings& settings = _platform->sharedSettings();
  if (const ErrorRef failure = settings.lastFailure()) return {failure->reason()};
  // Rows that show an error are of no date.
  bool hasFailed = false;
  if (const ResultRef& result = _controller->transitLineItemResult())
    result->withValue_orError([](const ObjectRef&) {}, [&](const ErrorRef&) { hasFailed = true; });
  if (hasFailed)
    settings.groupStore()->removeValueForKey(kSavedRowsDateKey);
  else if (const auto updated = updatedAt())
    settings.groupStore()->setValue_forKey(isoTextOfDate(*updated), kSavedRowsDateKey);
  return {};
}

std::optional<Date> WidgetProcess::updatedAt() const {
  // While no fetch has ended, the rows are those of the last time.
  if (_controller->transitLineItemResult()) return _platform->transitLines().updatedAt();
  const auto kept = _platform->sharedSettings().groupStore()->stringForKey(kSavedRowsDateKey);
  return kept ? dateFromISOText(*kept) : std::nullopt;
}

protocol::Nothing WidgetProcess::viewDidDisappear(const Nothing&) {
  requireStage({Stage::disappearing}, protocol::kViewDidDisappear.name);
  _stage = Stage::hidden;
  _controller->viewDidDisappear(false);
  return {};
}

protocol::Nothing WidgetProcess::didReceiveMemoryWarning(const Nothing&) {
  _controller->didReceiveMemoryWarning();
  return {};
}

void WidgetProcess::performUpdate(const protocol::UpdateParams& params, const JSONRPCResponder& responder,
                                  bool isSecond) {
  if (!_controller) throw JSONRPCFailure(JSONRPCError::kInvalidState, "performUpdate needs \"initialize\" first");
  GTFSTransitLineService& lines = _platform->transitLines();
  if (params.maxAge)
    lines.shareNext(*params.maxAge);
  else
    lines.askServersNext(true);
  _controller->widgetPerformUpdateWithCompletionHandler(
      [this, &lines, params, responder, isSecond](WidgetUpdateResult result) {
        if (!params.maxAge) lines.askServersNext(false);
        if (!params.maxAge && !isSecond && lines.tookShared())
          return _runLoop.dispatchAsync([this, params, responder] { performUpdate(params, responder, true); });
        protocol::UpdateResult answer{.updateResult = result,
                                      .refreshSeconds = refreshSecondsOf(*_platform->sharedSettings().groupStore())};
        if (const auto youngest = lines.youngestAnswer()) answer.age = std::max(-intervalFromNow(*youngest), 0.0);
        _controller->transitLineItemResult()->withValue_orError([](const ObjectRef&) {},
                                                                [&](const ErrorRef& error) {
                                                                  answer.reason = error->reason();
                                                                  if (isDownloading(*error))
                                                                    answer.isDownloading = true;
                                                                });
        responder.answer(protocol::write(answer));
      });
}

protocol::Nothing WidgetProcess::setActiveDisplayMode(const protocol::ActiveDisplayModeParams& params) {
  if (params.maximumSize) _host.setMaximumSize(params.mode, *params.maximumSize);
  takeDisplayMode(params.mode);
  return {};
}

void WidgetProcess::takeDisplayMode(WidgetDisplayMode mode) {
  const bool isKnown = mode == _host.activeDisplayMode() &&
                       _controller->dataSource()->isExpanded() == (mode == WidgetDisplayMode::Expanded);
  _host.setActiveDisplayMode(mode);
  if (!isKnown)
    _controller->widgetActiveDisplayModeDidChange_withMaximumSize(mode, _host.maximumSizeForDisplayMode(mode));
}

protocol::Nothing WidgetProcess::transitionToSize(const protocol::TransitionParams& params) {
  if (params.displayModes) _host.setMaximumSizes(*params.displayModes);
  _controller->viewWillTransitionToSize_withTransitionCoordinator(params.size, nullptr);
  resizeView(params.size);
  return {};
}

protocol::Nothing WidgetProcess::setTextSize(const protocol::TextSizeParams& params) {
  Environment::current().setContentSizeCategory(params.category);
  announceFrame();
  return {};
}

IndexPath WidgetProcess::existingRow(std::uint32_t section, std::uint32_t row) const {
  const IndexPath indexPath{section, row};
  if (indexPath.section != 0 || indexPath.row >= _controller->tableView()->numberOfRows())
    throw JSONRPCFailure(JSONRPCError::kInvalidParams, "there is no row " + std::to_string(indexPath.row) +
                                                           " in section " + std::to_string(indexPath.section));
  return indexPath;
}

protocol::Selected WidgetProcess::selectRow(const protocol::RowParams& params) {
  return {_controller->tableView()->selectRowAtIndexPath(existingRow(params.section, params.row))};
}

protocol::Highlighted WidgetProcess::highlightRow(const protocol::HighlightParams& params) {
  const IndexPath indexPath = existingRow(params.section, params.row);
  TableView& tableView = *_controller->tableView();
  if (params.highlighted)
    tableView.highlightRowAtIndexPath(indexPath);
  else if (tableView.highlightedRow() == indexPath)
    tableView.highlightRowAtIndexPath(std::nullopt);
  announceFrame();
  return {tableView.highlightedRow() == indexPath};
}

protocol::Snapshot WidgetProcess::snapshot(const protocol::SnapshotParams& params) {
  _frameAnnounced = false;
  protocol::Snapshot snapshot = snapshotOf(*_controller, params.rows);
  if (snapshot.error)
    for (auto& [line, title] : _platform->transitLines().knownIncidents())
      snapshot.knownIncidents.push_back({line, title});
  for (const auto& identifier : _platform->transitLines().goneLines())
    snapshot.goneLines.push_back(writtenNameOfLine(*identifier));
  snapshot.asOf = _platform->transitLines().asOf();
  snapshot.updated = updatedAt();
  return snapshot;
}

protocol::Lines WidgetProcess::lines(const protocol::LinesParams& params) {
  if (!_controller) throw JSONRPCFailure(JSONRPCError::kInvalidState, "lines needs \"initialize\" first");
  // What was seen cannot be read: everything is new, and whoever writes hears why.
  const auto seen = SeenIncidents(_platform->database()).list();
  return lineReports(_platform->favoritesEditor(), _platform->transitLines(), seen ? *seen : SeenForms(), params.texts);
}

protocol::Kept WidgetProcess::markSeen(const protocol::MarkSeenParams& params) {
  if (!_controller) throw JSONRPCFailure(JSONRPCError::kInvalidState, "markSeen needs \"initialize\" first");
  if (!_platform->transitLines().askedAt()) {
    _seenEarly.insert(params.ids.begin(), params.ids.end());
    _controller->widgetPerformUpdateWithCompletionHandler([](WidgetUpdateResult) {});
    return {};
  }
  const ErrorRef failure = keepSeen({params.ids.begin(), params.ids.end()});
  return {failure ? std::optional(failure->reason()) : std::nullopt};
}

ErrorRef WidgetProcess::keepSeen(const std::set<std::string>& ids) {
  const SeenIncidents incidents(_platform->database());
  const auto seen = incidents.list();
  if (!seen) return seen.error();
  std::vector<IncidentForm> kept;
  const Date now = currentDate();
  bool isChange = false;
  for (auto& [muid, form] : incidentForms(_platform->transitLines())) {
    const bool wasSeen = seen->have(form, now);
    if (!wasSeen && !ids.contains(std::to_string(muid))) continue;
    isChange = isChange || !wasSeen;
    kept.push_back(std::move(form));
  }
  if (!isChange) return nullptr;
  // What was seen before is kept in its present form, and for as long as it is there.
  if (ErrorRef failure = incidents.keep(kept, now)) return failure;
  notify(_connection, protocol::kUpdated, {});
  return nullptr;
}

void WidgetProcess::keepLines() {
  if (_virtualTime) return;  // true of another date
  // After an answer that is no other one the lines are the same objects.
  std::vector<TransitLineItemRef> items;
  for (const auto& verdict : _platform->transitLines().verdicts()) items.push_back(verdict.item);
  const Date now = currentDate();
  const TimeInterval age = intervalBetween(_keptLinesAt, now);
  const bool isDue = age < 0 || age >= kKeepLinesAgain;
  if (items == _keptLines && !isDue) return;
  _keptLines = std::move(items);
  protocol::Lines lines = lineReports(_platform->favoritesEditor(), _platform->transitLines(), SeenForms(), false);
  for (protocol::LineReport& line : lines.lines) {
    line.shield.reset();
    for (auto* list : {&line.incidents, &line.planned})
      for (protocol::LineIncident& incident : *list)
        for (std::string* word : {&incident.id, &incident.effect, &incident.cause}) word->clear();
  }
  // Answers that were there are as old as the oldest of them.
  const auto updated = _platform->transitLines().tookShared() ? lines.updated : now;
  lines.updated = lines.asked = std::nullopt;
  // The same where an incident has other words, which are not kept.
  const std::size_t states = std::hash<json>()(protocol::write(lines));
  if (states == _keptStates && !isDue) return;
  lines.updated = updated;
  const std::string text = protocol::write(lines).dump(-1, ' ', false, json::error_handler_t::replace);
  _keptStates = states;
  _keptLinesAt = now;
  if (const ErrorRef error = _platform->sharedSettings().groupStore()->setValue_forKey(text, protocol::kSavedLinesKey))
    writeLog({kDefaultLogSubsystem, "WidgetProcess"}, LogLevel::error, "The states of the lines are not kept: %@",
             {error->reason()});
}

protocol::Downloads WidgetProcess::downloads(const Nothing&) {
  protocol::Downloads result;
  if (_platform)
    for (const auto& download : _platform->transitLines().library().downloads().underWay())
      result.downloads.push_back({download.feed, download.received, download.length});
  return result;
}

protocol::Rendered WidgetProcess::render(const protocol::RenderParams& params) {
  if (params.surface || params.path)
    throw JSONRPCFailure(JSONRPCError::kInvalidParams,
                         std::string("parameter \"") + (params.path ? "path" : "surface") +
                             "\" is not taken any more: the widget draws into the memory that it was started with "
                             "(--pictures), and the host writes files");
  if (_options.pictures < 0)
    throw JSONRPCFailure(JSONRPCError::kDrawingFailed,
                         "there is no memory to draw into: start the widget with --pictures DESCRIPTOR");
  _frameAnnounced = false;
  View& view = *_controller->view();
  view.layoutIfNeeded();
  const Environment& environment = Environment::current();
  const auto draw = [&view](Painter& painter) { view.draw(painter); };
  const auto picture = drawingPart().render(draw, view.bounds().size(), environment.screenScale(),
                                            colorOf(SystemColor::background, environment.appearance()));
  ErrorRef error = picture.error();
  if (!error)
    error = writePicture(**picture, _options.pictures, params.offset.value_or(0),
                         params.capacity.value_or(std::numeric_limits<std::uint64_t>::max()));
  if (error) throw JSONRPCFailure(JSONRPCError::kDrawingFailed, error->reason());
  const Picture& drawn = **picture;
  return {drawn.pixelWidth(), drawn.pixelHeight(), drawn.stride(), drawn.scale()};
}

protocol::Nothing WidgetProcess::setAppearance(const protocol::AppearanceParams& params) {
  Environment::current().setAppearance(params.appearance);
  announceFrame();
  return {};
}

protocol::Nothing WidgetProcess::setScale(const protocol::ScaleParams& params) {
  Environment::current().setScreenScale(params.scale);
  _controller->view()->setNeedsLayout();
  announceFrame();
  return {};
}

void WidgetProcess::tellNotice(const ErrorRef& notice) {
  _runLoop.dispatchAsync([this, notice] { notify(_connection, protocol::kNotice, {notice->reason()}); });
}

void WidgetProcess::announceFrame() {
  if (std::exchange(_frameAnnounced, true)) return;
  notify(_connection, protocol::kFrame, {});
  giveBackHeapSoon(_runLoop, _givesBack);
}

protocol::Advanced WidgetProcess::advanceTime(const protocol::AdvanceParams& params) {
  if (!_controller) throw JSONRPCFailure(JSONRPCError::kInvalidState, "advanceTime needs \"initialize\" first");
  _virtualTime->advance(params.seconds);
  _sentTo = dateByAdding(_sentTo, params.seconds);
  return {_sentTo};
}

protocol::Handoff WidgetProcess::decode(const protocol::DecodeParams& params) {
  const auto bytes = bytesFromBase64(params.bytes);
  if (!bytes) throw JSONRPCFailure(JSONRPCError::kInvalidParams, "parameter \"bytes\" must be Base64");
  const Outcome<protocol::Handoff> handoff = decodeHandoff(*bytes);
  if (!handoff) throw JSONRPCFailure(JSONRPCError::kBrokenPayload, handoff.error()->reason());
  return *handoff;
}

protocol::Nothing WidgetProcess::cancel(const protocol::CancelParams& params) {
  if (_feedRequests) _feedRequests->cancel(params.request);
  return {};
}

protocol::Nothing WidgetProcess::shutdown(const Nothing&) {
  // After the answer is on its way.
  _runLoop.dispatchAsync([this] { _runLoop.quit(); });
  return {};
}

void WidgetProcess::resizeView(Size size) {
  if (!_controller || !_controller->isViewLoaded()) return;
  _controller->view()->setFrame({0, 0, size.width, size.height});
  announceFrame();
}

}  // namespace nimbo
