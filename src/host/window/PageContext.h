#pragma once

#include <map>
#include <string>

#include "desktop/gtfs/FeedLibrary.h"
#include "host/Command.h"
#include "host/HostPlatform.h"
#include "host/window/DesktopPreferences.h"
#include "host/window/Navigator.h"
#include "host/window/Workers.h"
#include "platform/foundation/Date.h"

namespace nimbo {

/// What every page has at hand; all of it outlives the pages.
struct PageContext {
  const CommandContext& command;
  HostPlatform& platform;
  const FeedLibrary& library;
  DesktopPreferences& preferences;
  Workers& workers;
  Navigator& navigator;
  /// When publishers made their alerts, by the names of the feeds, as the widget said last.
  std::map<std::string, Date>& asOf;
};

}  // namespace nimbo
