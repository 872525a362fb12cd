#pragma once

#include <memory>
#include <optional>
#include <unordered_map>

#include "platform/AnalyticsPipeline.h"
#include "platform/transit/TransitLine.h"
#include "platform/ui/TableView.h"
#include "platform/ui/WidgetHost.h"

namespace nimbo {

class ViewController;

/// The line that an incident is shown for, by the identity of the incident object.
using TransitIncidentToLineMap = std::unordered_map<TransitIncidentRef, TransitLineItemRef>;

/// Records a session for each appearance of the widget, from its appearing until a row is opened or it disappears, and
/// gives the record to the analytics pipeline then. Main thread only.
class NBTransitIncidentsAnalyticsDelegate final : public Object {
 public:
  /// The controller is held weakly: its host tells the active display mode, compact where there is none.
  static std::shared_ptr<NBTransitIncidentsAnalyticsDelegate> initWithTransitIncidentsViewController(
      std::weak_ptr<ViewController> controller);
  explicit NBTransitIncidentsAnalyticsDelegate(std::weak_ptr<ViewController> controller)
      : _transitIncidentsViewController(std::move(controller)) {}

  /// Starts a session; one that runs keeps its start and begins its record anew.
  void startSessionIfNeeded();
  /// The widget has disappeared: ends the session.
  void recordCloseSessionSwiping();
  /// The host has changed the display mode. Nothing is recorded without a session.
  void recordWidgetChangeDisplayMode(WidgetDisplayMode mode);
  /// A build shows these incidents, each once, of these lines. Adds to what the session has shown before.
  void recordInfoForLines_incidentDisplayed_incidentsToLineMapping(const TransitLineItems& lines,
                                                                   const TransitIncidents& incidents,
                                                                   const TransitIncidentToLineMap& incidentsToLine);
  /// A row was opened: ends the session. The user action is captured without a session too.
  void recordOpenItemAtIndexPath(IndexPath indexPath);

  /// Null when the controller is gone.
  std::shared_ptr<ViewController> transitIncidentsViewController() const {
    return _transitIncidentsViewController.lock();
  }
  void setTransitIncidentsViewController(std::weak_ptr<ViewController> controller) {
    _transitIncidentsViewController = std::move(controller);
  }

  std::string_view className() const override { return "NBTransitIncidentsAnalyticsDelegate"; }

 private:
  static int _messageTypeForIncidentCount(std::size_t count);
  void _closeSessionWithEndState(int endState);
  bool isExpanded() const;

  std::optional<Date> _sessionStartDate;                       // absent: no session runs
  std::optional<TransitWidgetAnalyticsRecord> _analyticsData;  // present while a session runs
  std::weak_ptr<ViewController> _transitIncidentsViewController;
};

}  // namespace nimbo
