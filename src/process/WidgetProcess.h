#pragma once

#include <memory>
#include <optional>
#include <set>
#include <string>
#include <vector>

#include "desktop/rpc/JSONRPCConnection.h"
#include "desktop/system/Paths.h"
#include "platform/VirtualTime.h"
#include "process/FeedRequests.h"
#include "process/RemoteHost.h"
#include "process/SourceWatch.h"
#include "process/WidgetPlatform.h"
#include "protocol/Methods.h"
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
    /// The host's memory that pictures are drawn into; -1: it has given none.
    int pictures = -1;
  };

  /// Speaks over the descriptors, which stay open as long as this lives.
  WidgetProcess(Options options, int input, int output);
  ~WidgetProcess();

  /// Serves until `shutdown`, or until the host is gone. Returns the exit status.
  int run();

 private:
  /// Where the view is in its life; requests that do not fit get "invalid state".
  enum class Stage { created, hidden, appearing, visible, disappearing };

  template <class Params, class Result>
  void addMethod(const protocol::Method<Params, Result>& method, Result (WidgetProcess::*answer)(const Params&));
  /// A method that needs the loaded view.
  template <class Params, class Result>
  void addViewMethod(const protocol::Method<Params, Result>& method, Result (WidgetProcess::*answer)(const Params&));
  /// A method whose answer comes when feeds have been read, at any stage.
  template <class Params, class Result>
  void addFeedMethod(const protocol::Method<Params, Result>& method,
                     void (FeedRequests::*start)(const Params&, const JSONRPCResponder&));
  void requireStage(std::initializer_list<Stage> stages, const char* method) const;

  using Nothing = protocol::Nothing;
  protocol::Initialized initialize(const protocol::InitializeParams& params);
  Nothing loadView(const Nothing&);
  Nothing viewWillAppear(const Nothing&);
  Nothing viewDidAppear(const Nothing&);
  protocol::Kept viewWillDisappear(const Nothing&);
  Nothing viewDidDisappear(const Nothing&);
  Nothing didReceiveMemoryWarning(const Nothing&);
  Nothing setActiveDisplayMode(const protocol::ActiveDisplayModeParams& params);
  Nothing transitionToSize(const protocol::TransitionParams& params);
  Nothing setTextSize(const protocol::TextSizeParams& params);
  protocol::Selected selectRow(const protocol::RowParams& params);
  protocol::Highlighted highlightRow(const protocol::HighlightParams& params);
  protocol::Snapshot snapshot(const protocol::SnapshotParams& params);
  protocol::Lines lines(const protocol::LinesParams& params);
  protocol::Kept markSeen(const protocol::MarkSeenParams& params);
  /// Keeps that these incidents, of those that the last fetch found, were seen.
  ErrorRef keepSeen(const std::set<std::string>& ids);
  protocol::Downloads downloads(const Nothing&);
  protocol::Rendered render(const protocol::RenderParams& params);
  Nothing setAppearance(const protocol::AppearanceParams& params);
  Nothing setScale(const protocol::ScaleParams& params);
  protocol::Advanced advanceTime(const protocol::AdvanceParams& params);
  protocol::Handoff decode(const protocol::DecodeParams& params);
  Nothing cancel(const protocol::CancelParams& params);
  Nothing shutdown(const Nothing&);
  /// A second attempt is of one that had joined a fetch for which no server was asked.
  void performUpdate(const protocol::UpdateParams& params, const JSONRPCResponder& responder, bool isSecond = false);

  void makePlatform(const std::string& locale);
  /// When the fetch ended that the rows are of; absent where that is not known.
  std::optional<Date> updatedAt() const;
  /// Throws JSONRPCFailure for a row that is none.
  IndexPath existingRow(std::uint32_t section, std::uint32_t row) const;
  /// Tells the controller of the host's mode, unless it knows.
  void takeDisplayMode(WidgetDisplayMode mode);
  void resizeView(Size size);
  /// Sends the host what its user must hear. Any thread.
  void tellNotice(const ErrorRef& notice);
  /// Keeps what the fetch that has just ended found out of each line, for programs that have no time to fetch.
  void keepLines();
  /// Tells the host, once until it looks or renders, that what the widget shows has changed.
  void announceFrame();

  Options _options;
  std::unique_ptr<VirtualTime> _virtualTime;
  Date _sentTo;  // of virtual time, whose timers fire microseconds after their dates
  GLibRunLoop _runLoop;
  JSONRPCConnection _connection;
  RemoteHost _host;
  std::unique_ptr<WidgetPlatform> _platform;    // null until initialized, or asked for feeds
  std::unique_ptr<FeedRequests> _feedRequests;  // with the platform, on which it works
  std::shared_ptr<NBTransitIncidentsViewController> _controller;
  std::unique_ptr<SourceWatch> _sources;  // while it can be seen
  Stage _stage = Stage::created;
  std::set<std::string> _seenEarly;  // before a fetch told what they are
  bool _hostChoseMode = false;
  bool _frameAnnounced = false;
  std::shared_ptr<Timer> _givesBack;           // null before the first change
  std::vector<TransitLineItemRef> _keptLines;  // of the answer that was kept last
  std::size_t _keptStates = 0;                 // hash of what was written then
  Date _keptLinesAt;
};

}  // namespace nimbo
