#pragma once

#include <memory>
#include <optional>

#include "desktop/DesktopPlatform.h"
#include "desktop/rpc/JSONRPCConnection.h"
#include "desktop/system/Paths.h"
#include "platform/VirtualTime.h"
#include "process/Parameters.h"
#include "process/RemoteHost.h"
#include "widget/NBTransitIncidentsViewController.h"

namespace nimbo {

/// The widget process: answers its host's requests with the widget's controller. The methods are those of
/// docs/protocol.md. Main thread only.
class WidgetProcess {
 public:
  struct Options {
    Paths paths;
    /// The date at which time stands still until it is advanced; absent: the machine's clock.
    std::optional<Date> virtualTime;
  };

  /// Speaks over the descriptors, which stay open as long as this lives.
  WidgetProcess(Options options, int input, int output);
  ~WidgetProcess();

  /// Serves until `shutdown`, or until the host is gone. Returns the exit status.
  int run();

 private:
  /// Where the view is in its life; requests that do not fit get "invalid state".
  enum class Stage { created, hidden, appearing, visible, disappearing };

  using Method = nlohmann::json (WidgetProcess::*)(const Parameters& params);

  void addMethod(const char* name, Method method);
  /// A method that needs the loaded view.
  void addViewMethod(const char* name, Method method);
  void requireStage(std::initializer_list<Stage> stages, const char* method) const;

  nlohmann::json initialize(const Parameters& params);
  nlohmann::json loadView(const Parameters& params);
  nlohmann::json viewWillAppear(const Parameters& params);
  nlohmann::json viewDidAppear(const Parameters& params);
  nlohmann::json viewWillDisappear(const Parameters& params);
  nlohmann::json viewDidDisappear(const Parameters& params);
  nlohmann::json didReceiveMemoryWarning(const Parameters& params);
  nlohmann::json setActiveDisplayMode(const Parameters& params);
  nlohmann::json transitionToSize(const Parameters& params);
  nlohmann::json setTextSize(const Parameters& params);
  nlohmann::json selectRow(const Parameters& params);
  nlohmann::json highlightRow(const Parameters& params);
  nlohmann::json snapshot(const Parameters& params);
  nlohmann::json render(const Parameters& params);
  nlohmann::json setAppearance(const Parameters& params);
  nlohmann::json setScale(const Parameters& params);
  nlohmann::json advanceTime(const Parameters& params);
  static nlohmann::json decode(const nlohmann::json& params);
  nlohmann::json shutdown(const Parameters& params);
  void performUpdate(const JSONRPCResponder& responder);

  IndexPath existingRow(const Parameters& params) const;
  /// Tells the controller of the host's mode, unless it knows.
  void takeDisplayMode(WidgetDisplayMode mode);
  void resizeView(Size size);
  /// Sends the host what its user must hear. Any thread.
  void tellNotice(const ErrorRef& notice);
  /// Tells the host, once until it looks or renders, that what the widget shows has changed.
  void announceFrame();

  Options _options;
  std::unique_ptr<VirtualTime> _virtualTime;
  Date _sentTo;  // of virtual time, whose timers fire microseconds after their dates
  GLibRunLoop _runLoop;
  JSONRPCConnection _connection;
  RemoteHost _host;
  std::unique_ptr<DesktopPlatform> _platform;  // null until initialized
  std::shared_ptr<NBTransitIncidentsViewController> _controller;
  Stage _stage = Stage::created;
  bool _hostChoseMode = false;
  bool _frameAnnounced = false;
};

}  // namespace nimbo
