#include "process/WidgetProcess.h"

#include <algorithm>
#include <map>
#include <utility>

#include "desktop/drawing/DrawingPart.h"
#include "desktop/gtfs/LineNames.h"
#include "desktop/rpc/Base64.h"
#include "platform/ui/SystemColors.h"
#include "process/HandoffDecoder.h"
#include "process/HostLogSink.h"
#include "process/SharedSurface.h"
#include "process/Snapshot.h"
#include "protocol/Coding.h"
#include "protocol/Methods.h"

namespace nimbo {

using nlohmann::json;

namespace {

constexpr int kProtocolVersion = 1;

/// Room at both sides of the rows, in points.
constexpr Insets kLayoutMargins{0, 16, 0, 16};

/// Device pixels for each point.
constexpr double kSmallestScale = 0.25, kLargestScale = 8;

/// The widest span that one `advanceTime` may cross, in seconds: a year.
constexpr double kLongestAdvance = 366.0 * 86400;

BundleRecordRef bundleRecord(const Parameters& params) {
  const std::string kind = params.text("kind");
  const std::string identifier = params.text("identifier");
  if (kind == "application") return std::make_shared<const ApplicationRecord>(identifier);
  if (kind == "extension")
    return std::make_shared<const ExtensionRecord>(
        identifier, params.has("containing") ? bundleRecord(params.object("containing")) : nullptr);
  return std::make_shared<const BundleRecord>(identifier);
}

using MaximumSizes = std::map<WidgetDisplayMode, Size>;

/// The most room of both modes; absent when the host says nothing of it.
std::optional<MaximumSizes> maximumSizes(const Parameters& params) {
  if (!params.has("displayModes")) return std::nullopt;
  const Parameters modes = params.object("displayModes");
  return MaximumSizes{{WidgetDisplayMode::Compact, modes.size("compact")},
                      {WidgetDisplayMode::Expanded, modes.size("expanded")}};
}

}  // namespace

WidgetProcess::WidgetProcess(Options options, int input, int output)
    : _options(std::move(options)),
      _virtualTime(_options.virtualTime ? std::make_unique<VirtualTime>(*_options.virtualTime) : nullptr),
      _runLoop(_virtualTime.get()),
      _connection(_runLoop, input, output),
      _host(_connection) {
  addMethod("initialize", &WidgetProcess::initialize);
  addMethod("loadView", &WidgetProcess::loadView);
  addMethod("shutdown", &WidgetProcess::shutdown);
  addViewMethod("viewWillAppear", &WidgetProcess::viewWillAppear);
  addViewMethod("viewDidAppear", &WidgetProcess::viewDidAppear);
  addViewMethod("viewWillDisappear", &WidgetProcess::viewWillDisappear);
  addViewMethod("viewDidDisappear", &WidgetProcess::viewDidDisappear);
  addViewMethod("didReceiveMemoryWarning", &WidgetProcess::didReceiveMemoryWarning);
  addViewMethod("setActiveDisplayMode", &WidgetProcess::setActiveDisplayMode);
  addViewMethod("transitionToSize", &WidgetProcess::transitionToSize);
  addViewMethod("setTextSize", &WidgetProcess::setTextSize);
  addViewMethod("selectRow", &WidgetProcess::selectRow);
  addViewMethod("highlightRow", &WidgetProcess::highlightRow);
  addViewMethod("snapshot", &WidgetProcess::snapshot);
  addViewMethod("render", &WidgetProcess::render);
  addViewMethod("setAppearance", &WidgetProcess::setAppearance);
  addViewMethod("setScale", &WidgetProcess::setScale);
  _connection.setHandler(protocol::kDecode.name, [](const json& params, const JSONRPCResponder& responder) {
    responder.answer(decode(params));
  });
  if (_virtualTime) addMethod("advanceTime", &WidgetProcess::advanceTime);
  _connection.setHandler("performUpdate",
                         [this](const json&, const JSONRPCResponder& responder) { performUpdate(responder); });
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

void WidgetProcess::addMethod(const char* name, Method method) {
  _connection.setHandler(name, [this, method](const json& params, const JSONRPCResponder& responder) {
    responder.answer((this->*method)(Parameters(params)));
  });
}

void WidgetProcess::addViewMethod(const char* name, Method method) {
  _connection.setHandler(name, [this, name, method](const json& params, const JSONRPCResponder& responder) {
    if (!_controller || !_controller->isViewLoaded())
      throw JSONRPCFailure(JSONRPCError::kInvalidState, std::string(name) + " needs \"loadView\" first");
    responder.answer((this->*method)(Parameters(params)));
  });
}

void WidgetProcess::requireStage(std::initializer_list<Stage> stages, const char* method) const {
  if (std::find(stages.begin(), stages.end(), _stage) != stages.end()) return;
  static constexpr const char* kNames[] = {"not loaded", "hidden", "about to appear", "on screen",
                                           "about to disappear"};
  throw JSONRPCFailure(JSONRPCError::kInvalidState,
                       std::string(method) + " does not fit: the view is " + kNames[static_cast<std::size_t>(_stage)]);
}

json WidgetProcess::initialize(const Parameters& params) {
  if (_platform) throw JSONRPCFailure(JSONRPCError::kInvalidState, "initialize was called already");

  // Everything is read before anything is made: a bad parameter leaves the process as it was.
  const auto locale = params.optionalText("locale");
  const auto textSize = params.has("textSize") ? params.textSize("textSize") : ContentSizeCategory::large;
  const auto scale = params.has("scale") ? params.number("scale", kSmallestScale, kLargestScale) : 1.0;
  const auto appearance = params.has("appearance") ? params.appearance("appearance") : Appearance::light;
  const auto mode =
      params.has("activeDisplayMode") ? params.displayMode("activeDisplayMode") : WidgetDisplayMode::Compact;
  const auto sizes = maximumSizes(params);
  const BundleRecordRef record = params.has("bundle") ? bundleRecord(params.object("bundle")) : nullptr;

  auto logSink = std::make_unique<HostLogSink>(
      makeLogSink(LogOptions::fromEnvironment()), _runLoop,
      [this](const std::string& category, const std::string& text) {
        _connection.notify("log", {{"level", "error"}, {"category", category}, {"message", text}});
      });
  _platform = std::make_unique<DesktopPlatform>(
      DesktopPlatform::Options{.paths = _options.paths,
                               .locale = locale.value_or(""),
                               .runLoop = _runLoop,
                               .virtualTime = _virtualTime.get(),
                               .activityLauncher = _host,
                               .logSink = std::move(logSink),
                               .notice = [this](const ErrorRef& notice) { tellNotice(notice); }});
  Environment& environment = Environment::current();
  environment.setContentSizeCategory(textSize);
  environment.setScreenScale(scale);
  environment.setAppearance(appearance);
  _host.setActiveDisplayMode(mode);
  _host.setBundleRecord(record);
  if (sizes)
    for (const auto& [which, size] : *sizes) _host.setMaximumSize(which, size);
  _controller = NBTransitIncidentsViewController::initWithNibName_bundle("", "", sizes ? &_host : nullptr);
  return {{"name", "nimbo-transit-widget"}, {"version", NIMBO_VERSION}, {"protocol", kProtocolVersion}};
}

json WidgetProcess::loadView(const Parameters&) {
  if (!_controller) throw JSONRPCFailure(JSONRPCError::kInvalidState, "loadView needs \"initialize\" first");
  requireStage({Stage::created}, "loadView");
  _controller->view()->setLayoutMargins(kLayoutMargins);
  if (_controller->widgetHost()) {
    // The rows of the last time may have been left in the other mode.
    const WidgetDisplayMode mode = _host.activeDisplayMode();
    const Size maximumSize = _host.maximumSizeForDisplayMode(mode);
    _controller->widgetActiveDisplayModeDidChange_withMaximumSize(mode, maximumSize);
    const NBTransitIncidentDataSource& rows = *_controller->dataSource();
    resizeView(rows.preferredContentSizeForExpanded_maxSize(rows.isExpanded(), maximumSize));
  }
  _stage = Stage::hidden;
  return json::object();
}

json WidgetProcess::viewWillAppear(const Parameters&) {
  requireStage({Stage::hidden}, "viewWillAppear");
  _stage = Stage::appearing;
  _controller->viewWillAppear(false);
  return json::object();
}

json WidgetProcess::viewDidAppear(const Parameters&) {
  requireStage({Stage::appearing, Stage::visible}, "viewDidAppear");
  _stage = Stage::visible;
  _controller->viewDidAppear(false);
  return json::object();
}

json WidgetProcess::viewWillDisappear(const Parameters&) {
  requireStage({Stage::appearing, Stage::visible}, "viewWillDisappear");
  _stage = Stage::disappearing;
  _controller->viewWillDisappear(false);
  return json::object();
}

json WidgetProcess::viewDidDisappear(const Parameters&) {
  requireStage({Stage::disappearing}, "viewDidDisappear");
  _stage = Stage::hidden;
  _controller->viewDidDisappear(false);
  return json::object();
}

json WidgetProcess::didReceiveMemoryWarning(const Parameters&) {
  _controller->didReceiveMemoryWarning();
  return json::object();
}

void WidgetProcess::performUpdate(const JSONRPCResponder& responder) {
  if (!_controller) throw JSONRPCFailure(JSONRPCError::kInvalidState, "performUpdate needs \"initialize\" first");
  _controller->widgetPerformUpdateWithCompletionHandler([this, responder](WidgetUpdateResult result) {
    static constexpr const char* kNames[] = {"newData", "noData", "failed"};
    json answer = {{"updateResult", kNames[static_cast<std::size_t>(result)]}};
    _controller->transitLineItemResult()->withValue_orError(
        [](const ObjectRef&) {}, [&](const ErrorRef& error) { answer["reason"] = error->reason(); });
    responder.answer(answer);
  });
}

json WidgetProcess::setActiveDisplayMode(const Parameters& params) {
  const WidgetDisplayMode mode = params.displayMode("mode");
  if (params.has("maximumSize")) _host.setMaximumSize(mode, params.size("maximumSize"));
  _host.setActiveDisplayMode(mode);
  _controller->widgetActiveDisplayModeDidChange_withMaximumSize(mode, _host.maximumSizeForDisplayMode(mode));
  return json::object();
}

json WidgetProcess::transitionToSize(const Parameters& params) {
  const Size size = params.size("size");
  if (const auto sizes = maximumSizes(params))
    for (const auto& [mode, maximum] : *sizes) _host.setMaximumSize(mode, maximum);
  _controller->viewWillTransitionToSize_withTransitionCoordinator(size, nullptr);
  resizeView(size);
  return json::object();
}

json WidgetProcess::setTextSize(const Parameters& params) {
  Environment::current().setContentSizeCategory(params.textSize("category"));
  announceFrame();
  return json::object();
}

IndexPath WidgetProcess::existingRow(const Parameters& params) const {
  const IndexPath indexPath = params.indexPath();
  if (indexPath.section != 0 || indexPath.row >= _controller->tableView()->numberOfRows())
    throw JSONRPCFailure(JSONRPCError::kInvalidParams, "there is no row " + std::to_string(indexPath.row) +
                                                           " in section " + std::to_string(indexPath.section));
  return indexPath;
}

json WidgetProcess::selectRow(const Parameters& params) {
  return {{"selected", _controller->tableView()->selectRowAtIndexPath(existingRow(params))}};
}

json WidgetProcess::highlightRow(const Parameters& params) {
  const IndexPath indexPath = existingRow(params);
  const bool highlighted = params.has("highlighted") ? params.flag("highlighted") : true;
  TableView& tableView = *_controller->tableView();
  if (highlighted)
    tableView.highlightRowAtIndexPath(indexPath);
  else if (tableView.highlightedRow() == indexPath)
    tableView.highlightRowAtIndexPath(std::nullopt);
  announceFrame();
  return {{"highlighted", tableView.highlightedRow() == indexPath}};
}

json WidgetProcess::snapshot(const Parameters&) {
  _frameAnnounced = false;
  json snapshot = snapshotJSON(*_controller);
  json& gone = snapshot["goneLines"] = json::array();
  for (const auto& identifier : _platform->transitLines().goneLines()) gone.push_back(writtenNameOfLine(*identifier));
  return snapshot;
}

json WidgetProcess::render(const Parameters& params) {
  const bool toSurface = params.has("surface");
  const std::string path = params.text(toSurface ? "surface" : "path");
  _frameAnnounced = false;
  View& view = *_controller->view();
  view.layoutIfNeeded();
  const Environment& environment = Environment::current();
  const auto draw = [&view](Painter& painter) { view.draw(painter); };
  const auto picture = drawingPart().render(draw, view.bounds().size(), environment.screenScale(),
                                            colorOf(SystemColor::background, environment.appearance()));
  ErrorRef error = picture.error();
  if (!error) error = toSurface ? writeSharedSurface(**picture, path) : (*picture)->writePNG(path);
  if (error) throw JSONRPCFailure(JSONRPCError::kDrawingFailed, error->reason());
  return {{"width", (*picture)->pixelWidth()},
          {"height", (*picture)->pixelHeight()},
          {"stride", (*picture)->stride()},
          {"scale", (*picture)->scale()}};
}

json WidgetProcess::setAppearance(const Parameters& params) {
  Environment::current().setAppearance(params.appearance("appearance"));
  announceFrame();
  return json::object();
}

json WidgetProcess::setScale(const Parameters& params) {
  Environment::current().setScreenScale(params.number("scale", kSmallestScale, kLargestScale));
  _controller->view()->setNeedsLayout();
  announceFrame();
  return json::object();
}

void WidgetProcess::tellNotice(const ErrorRef& notice) {
  _runLoop.dispatchAsync([this, notice] { _connection.notify("notice", {{"message", notice->reason()}}); });
}

void WidgetProcess::announceFrame() {
  if (std::exchange(_frameAnnounced, true)) return;
  _connection.notify("frame", json::object());
}

json WidgetProcess::advanceTime(const Parameters& params) {
  if (!_platform) throw JSONRPCFailure(JSONRPCError::kInvalidState, "advanceTime needs \"initialize\" first");
  _virtualTime->advance(params.number("seconds", 0, kLongestAdvance));
  return {{"now", isoTextOfDate(_virtualTime->now())}};
}

json WidgetProcess::decode(const json& params) {
  const auto bytes = [&] {
    try {
      return bytesFromBase64(protocol::read<protocol::DecodeParams>(params).bytes);
    } catch (const protocol::Malformed& malformed) {
      throw JSONRPCFailure(JSONRPCError::kInvalidParams, std::string("parameter ") + malformed.what());
    }
  }();
  if (!bytes) throw JSONRPCFailure(JSONRPCError::kInvalidParams, "parameter \"bytes\" must be Base64");
  const Outcome<protocol::Handoff> handoff = decodeHandoff(*bytes);
  if (!handoff) throw JSONRPCFailure(JSONRPCError::kBrokenPayload, handoff.error()->reason());
  return protocol::write(*handoff);
}

json WidgetProcess::shutdown(const Parameters&) {
  // After the answer is on its way.
  _runLoop.dispatchAsync([this] { _runLoop.quit(); });
  return json::object();
}

void WidgetProcess::resizeView(Size size) {
  if (!_controller || !_controller->isViewLoaded()) return;
  _controller->view()->setFrame({0, 0, size.width, size.height});
  announceFrame();
}

}  // namespace nimbo
