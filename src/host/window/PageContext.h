#pragma once

#include <functional>
#include <map>
#include <string>

#include "desktop/gtfs/feeds/FeedConfiguration.h"
#include "host/Commands.h"
#include "host/HostPlatform.h"
#include "host/WidgetHostProcess.h"
#include "host/window/DesktopPreferences.h"
#include "host/window/IncidentImages.h"
#include "host/window/OpenRequest.h"
#include "platform/foundation/Date.h"
#include "protocol/Lines.h"

namespace nimbo {

/// Goes to other places on behalf of a page.
class Navigator {
 public:
  virtual ~Navigator() = default;
  /// Shows a place: in front of the pages there are, or by going back to it.
  virtual void open(const OpenRequest& request) = 0;
  /// Tells the user of something that went wrong, in words that he can act on.
  virtual void tell(const std::string& message) = 0;
  /// Tells the user of something that he did, and takes it back when he wishes so.
  virtual void tell(const std::string& message, std::function<void()> undo) = 0;
  /// Notes that the user has seen the incidents of these numbers, those among them that are new. Where that cannot be
  /// kept he is told so if he asked for it.
  virtual void markSeen(const std::vector<std::string>& ids, bool isAsked) = 0;
};

/// What every page has at hand; all of it outlives the pages.
struct PageContext {
  const CommandContext& command;
  HostPlatform& platform;
  DesktopPreferences& preferences;
  Navigator& navigator;
  /// When publishers made their alerts, by the names of the feeds, as the widget said last.
  std::map<std::string, Date>& asOf;
  /// What is known of the favourite lines, as the widget said last.
  protocol::Lines& lines;
  /// Whom to ask about feeds. The widget screen's; null until that is made.
  WidgetHostProcess* process = nullptr;
  /// Whom to ask for images, in the same way.
  IncidentImages* images = nullptr;

  FeedConfiguration feeds() const { return FeedConfiguration(command.paths.config); }
};

}  // namespace nimbo
